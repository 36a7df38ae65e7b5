// What the library is documented to do, written a second time and as plainly as possible: each
// operation step by step, over bare SQLite. It shares no code with the library. What the library
// tells its process, a log line, a statement, a pause, the model tells its own (ModelHost.h).
#ifndef VORNJSONDB_TESTS_CAMPAIGNS_MODEL_MODEL_H
#define VORNJSONDB_TESTS_CAMPAIGNS_MODEL_MODEL_H

#include <string>
#include <vector>

#include <json/json.h>
#include <sqlite3.h>

#include "../../support/JsonHelpers.h"
#include "ModelHost.h"

namespace campaign {

using jsonhelpers::Compact;
using RowCallback = int (*)(void*, int, char**, char**);

// ---- free functions -----------------------------------------------------------------------------

const Json::Value& ModelTypes(const Json::Value& jDefinition, const std::string& strName);
int ModelCopyMember(Json::Value& jIn, const Json::Value& jSubSet, bool blOverwrite);

// The local time zone is an hour ahead of UTC.
int ModelTimeText(long nStamp, std::string& strOut, int nType);
int ModelTimeAfterNow(long nStamp, std::string& strOut, int nType);

// False for anything but an object.
bool Has(const Json::Value& jValue, const std::string& strName);
bool IsObjectOrNull(const Json::Value& jValue);

// The row callback: pArg is an array, or null.
int ModelRow(void* pArg, int nColumns, char** aszValues, char** aszNames);

// ---- the handle ---------------------------------------------------------------------------------

class Model {
  public:
    Model(sqlite3* pDb, const std::string& strName, const Json::Value& jDefinition,
          const std::string& strCreate);

    int TableCreate();
    int RunSql(const std::string& strSql, RowCallback callback = nullptr, void* pArg = nullptr);

    int Check(const Json::Value& jRecord) const;
    int Fill(Json::Value& jRecord, bool blStrict) const;

    int Names(std::string& strSql, const Json::Value* pjRecord) const;
    int Values(std::string& strSql, const Json::Value& jRecord) const;
    int Match(const std::string& strField, const Json::Value& jValue, std::string& strOut) const;
    int List(const char* szField, const Json::Value& jList, std::string& strOut) const;
    int Conditions(const Json::Value& jQuery, std::string& strOut, int nMode) const;
    int Tail(const Json::Value& jQuery, std::string& strOut) const;

    int RecSave(Json::Value& jRecord, bool blCreate);
    int RecCreate(const Json::Value& jIn, Json::Value& jOut);
    int RecList(const Json::Value& jQuery, Json::Value& jOut);
    int RecGetOne(const Json::Value& jQuery, Json::Value& jOut);
    int RecUpdateByWhere(const Json::Value& jNew, const std::string& strWhere);
    int RecUpdateByFilter(const Json::Value& jQuery, const Json::Value& jNew);
    int RecDelete(const Json::Value& jQuery, bool blAllowAll);
    int RecDeleteAll() { return RecDelete(Json::Value(Json::objectValue), true); }
    int RecDeleteByArray(const std::vector<std::string>& vecValues, const char* szKey);
    int RecDeleteByName(const std::string& strValue, const char* szKey);
    int ToList(const std::vector<std::string>& vecValues, const char* szKey,
               Json::Value& jOut) const;

    std::string strErrMsg;

  private:
    struct Answer {
        int nResult = SQLITE_OK;
        bool blText = false;
        std::string strText;
        const char* Text() const { return blText ? strText.c_str() : nullptr; }
    };

    const Json::Value& Types() const { return ModelTypes(m_jDefinition, m_strName); }
    std::vector<std::string> Declared() const;

    Answer Attempt(const std::string& strSql, RowCallback callback, void* pArg);
    static void Release(const Answer& answer);
    int RunFailed(int nTried, const Answer& answer, const std::string& strSql, int nResult);

    bool Save(Json::Value& jRecord, bool blCreate, std::string& strSql);
    bool Select(const Json::Value& jQuery, Json::Value& jOut, std::string& strSql);
    bool UpdateByWhere(const Json::Value& jNew, const std::string& strWhere, std::string& strSql);
    bool UpdateByFilter(const Json::Value& jQuery, const Json::Value& jNew);
    int Delete(const Json::Value& jQuery, bool blAllowAll, std::string& strSql);
    int DeleteByArray(const std::vector<std::string>& vecValues, const char* szKey);
    int DeleteByName(const std::string& strValue, const char* szKey);
    void TellSqlError(const std::string& strSql) const;
    void NoteDuplicate();

    sqlite3* m_pDb;
    std::string m_strName;
    Json::Value m_jDefinition;
    std::string m_strCreate;
    std::string m_strSqlError;
};

}  // namespace campaign

#endif  // VORNJSONDB_TESTS_CAMPAIGNS_MODEL_MODEL_H
