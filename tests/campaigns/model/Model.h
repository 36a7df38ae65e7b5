// What the library is documented to do, written a second time and as plainly as possible: maps,
// texts and bare SQLite. It shares no code with the library, and logs nothing.
#ifndef VORNJSONDB_TESTS_CAMPAIGNS_MODEL_MODEL_H
#define VORNJSONDB_TESTS_CAMPAIGNS_MODEL_MODEL_H

#include <string>
#include <vector>

#include <json/json.h>
#include <sqlite3.h>

namespace campaign {

// ---- free functions -----------------------------------------------------------------------------

Json::Value& ModelTypes(const Json::Value& jDefinition, const std::string& strName);
int ModelCopyMember(Json::Value& jIn, const Json::Value& jSubSet, bool blOverwrite);
// The local time zone is an hour ahead of UTC.
int ModelTimeText(long nStamp, std::string& strOut, int nType);

std::string ModelText(const Json::Value& jValue);

// ---- the handle ---------------------------------------------------------------------------------

class Model {
  public:
    Model(sqlite3* pDb, std::string strName, Json::Value jDefinition, std::string strCreate);

    int TableCreate() { return RunSql(m_strCreate, nullptr) < 0 ? -1 : 0; }
    int RunSql(const std::string& strSql, Json::Value* pjRows);

    int Check(const Json::Value& jParam) const;
    int Fill(Json::Value& jParam, bool blStrict) const;

    int Names(std::string& strSql, const Json::Value* pjRecord) const;
    int Values(std::string& strSql, const Json::Value& jRecord) const;
    int Match(const std::string& strField, const Json::Value& jValue, std::string& strOut) const;
    int List(const char* szField, const Json::Value& jList, std::string& strOut) const;
    int Conditions(const Json::Value& jQuery, std::string& strOut, int nMode) const;
    static int Tail(const Json::Value& jQuery, std::string& strOut);

    int RecSave(Json::Value& jRecord, bool blCreate);
    int RecCreate(const Json::Value& jIn, Json::Value& jOut);
    int RecList(const Json::Value& jQuery, Json::Value& jOut);
    int RecGetOne(const Json::Value& jQuery, Json::Value& jOut);
    int RecUpdateByWhere(const Json::Value& jNew, const std::string& strWhere);
    int RecUpdateByFilter(const Json::Value& jQuery, const Json::Value& jNew);
    int RecDelete(const Json::Value& jQuery, bool blAllowAll);
    int RecDeleteByArray(const std::vector<std::string>& vecValues, const char* szKey);
    int RecDeleteByName(const std::string& strValue, const char* szKey);
    static int ToList(const std::vector<std::string>& vecValues, const char* szKey,
                      Json::Value& jOut);

    std::string strErrMsg;

  private:
    const Json::Value& Types() const { return ModelTypes(m_jDefinition, m_strName); }
    std::vector<std::string> Declared() const;
    bool RunOne(sqlite3_stmt* pStatement, Json::Value* pjRows);
    bool ReadRow(sqlite3_stmt* pStatement, Json::Value& jRows) const;
    int Refused();

    sqlite3* m_pDb;
    std::string m_strName;
    Json::Value m_jDefinition;
    std::string m_strCreate;
    std::string m_strSqlError;
};

}  // namespace campaign

#endif  // VORNJSONDB_TESTS_CAMPAIGNS_MODEL_MODEL_H
