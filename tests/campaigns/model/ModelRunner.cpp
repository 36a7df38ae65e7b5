// The model's handle, statements, and rows that become records.

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <memory>

#include "Model.h"

namespace campaign {

namespace {

constexpr int kAttempts = 500;
constexpr unsigned kPause = 10000;

// The table whose statement ran last.
std::string& CurrentTable() {
    static std::string s_strTable;
    return s_strTable;
}

}  // namespace

// ---- the handle ---------------------------------------------------------------------------------

Model::Model(sqlite3* pDb, const std::string& strName, const Json::Value& jDefinition,
             const std::string& strCreate)
    : m_pDb(pDb), m_strName(strName), m_jDefinition(jDefinition), m_strCreate(strCreate) {
    Host().ShortCheck(pDb == nullptr, "!pDb");
    Host().ShortCheck(strName.empty(), "strName.empty()");
    Host().ShortCheck(jDefinition.empty(), "jTableDef.empty()");
    Host().ShortCheck(strCreate.empty(), "strSqlCreate.empty()");
    Host().Fails(0 > TableCreate(), "0 > tableCreate()");
}

void Model::TellSqlError(const std::string& strSql) const {
    if (!m_strSqlError.empty()) {
        Host().Plain("sql error, err=%s, sql=%s", {m_strSqlError, strSql});
    }
}

int Model::TableCreate() {
    if (RunSql(m_strCreate) >= 0) {
        return 0;
    }
    Host().Located("create table failed, sql=%s", {m_strCreate});
    TellSqlError(m_strCreate);
    return -1;
}

// ---- statements ---------------------------------------------------------------------------------

namespace {

// One statement, as sqlite3_exec steps through it.
int Step(sqlite3_stmt* pStatement, RowCallback callback, void* pArg) {
    while (sqlite3_step(pStatement) == SQLITE_ROW) {
        std::vector<char*> vecNames;
        std::vector<char*> vecValues;
        for (int i = 0; i < sqlite3_column_count(pStatement); ++i) {
            vecNames.push_back(const_cast<char*>(sqlite3_column_name(pStatement, i)));
            vecValues.push_back(reinterpret_cast<char*>(
                const_cast<unsigned char*>(sqlite3_column_text(pStatement, i))));
        }
        if (callback != nullptr && callback(pArg, static_cast<int>(vecNames.size()),
                                            vecValues.data(), vecNames.data()) != 0) {
            sqlite3_finalize(pStatement);
            return SQLITE_ABORT;
        }
    }
    return sqlite3_finalize(pStatement);
}

}  // namespace

Model::Answer Model::Attempt(const std::string& strSql, RowCallback callback, void* pArg) {
    Answer answer;
    testhost::ExecFault fault = {};
    Host().nErrno = 0;
    CurrentTable() = m_strName;
    if (Host().Statement(strSql, fault)) {
        answer.nResult = fault.nResult;
        answer.blText = fault.szError != nullptr;
        answer.strText = answer.blText ? fault.szError : "";
        return answer;
    }
    if (m_pDb == nullptr) {
        answer.nResult = SQLITE_MISUSE;
        return answer;
    }
    const char* szRest = strSql.c_str();
    while (answer.nResult == SQLITE_OK && *szRest != '\0') {
        sqlite3_stmt* pStatement = nullptr;
        answer.nResult = sqlite3_prepare_v2(m_pDb, szRest, -1, &pStatement, &szRest);
        if (pStatement != nullptr) {
            answer.nResult = Step(pStatement, callback, pArg);
        }
    }
    answer.blText = answer.nResult != SQLITE_OK;
    answer.strText =
        answer.nResult == SQLITE_ABORT ? sqlite3_errstr(SQLITE_ABORT) : sqlite3_errmsg(m_pDb);
    return answer;
}

void Model::Release(const Answer& answer) {
    if (answer.blText) {
        Host().Freed();
    }
}

int Model::RunFailed(int nTried, const Answer& answer, const std::string& strSql, int nResult) {
    m_strSqlError = answer.blText ? answer.strText : "Unknow Error!!";
    Host().Plain("i=%d,errno=%d, run sql failed, error=%s, sql=%s",
                 {nTried, Host().nErrno, m_strSqlError, strSql});
    Host().Debug("run sql fail, err=%s", {answer.Text()});
    Release(answer);
    return nResult;
}

int Model::RunSql(const std::string& strSql, RowCallback callback, void* pArg) {
    if (Host().Fails(strSql.empty(), "0 >= strSql.length()")) {
        return RunFailed(0, Answer(), strSql, -1);
    }
    m_strSqlError.clear();
    for (int i = 0;;) {
        const Answer answer = Attempt(strSql, callback, pArg);
        if (answer.nResult == SQLITE_OK) {
            const int nCount = callback == nullptr ? Host().Changes(m_pDb) : 0;
            if (nCount < 0) {
                return RunFailed(i, answer, strSql, nCount);
            }
            Release(answer);
            return nCount;
        }
        // Without a text a failure is never taken for a lock.
        const bool blLocked =
            answer.blText && (answer.strText.find("database is locked") != std::string::npos ||
                              Host().nErrno == EAGAIN);
        if (!blLocked) {
            return RunFailed(i, answer, strSql, -1);
        }
        Host().Debug("retry, i=%d, errno=%d, run sql failed, error=%s, sql=%s",
                     {i, Host().nErrno, answer.Text(), strSql});
        ++i;
        Host().Pause(kPause);
        if (i == kAttempts) {
            return RunFailed(i, answer, strSql, -1);
        }
        Release(answer);
    }
}

// ---- rows ---------------------------------------------------------------------------------------

namespace {

// A number beyond the range sets errno, in a column as well as in JSON.
template <typename Number>
Number Read(const char* szText, Number (*pfnRead)(const char*, char**, int)) {
    errno = Host().nErrno;
    const Number n = pfnRead(szText, nullptr, 10);
    Host().nErrno = errno;
    return n;
}

// Into the member itself, which another column of the same name may have set. What the reader
// leaves of a text that is no JSON, or nested too deep, is the value.
void Parse(const char* szText, Json::Value& jValue) {
    static const std::unique_ptr<Json::CharReader> s_pReader(
        Json::CharReaderBuilder().newCharReader());
    errno = Host().nErrno;
    try {
        s_pReader->parse(szText, szText + std::strlen(szText), &jValue, nullptr);
    } catch (const Json::RuntimeError&) {  // too deep
    }
    Host().nErrno = errno;
}

bool Field(Json::Value& jRecord, const std::string& strName, const char* szText) {
    const Json::Value jNoDefinition;
    const Json::Value& jTypes = ModelTypes(jNoDefinition, CurrentTable());
    if (Host().Fails(!Has(jTypes, strName), "!jType.isMember(strName)")) {
        return false;
    }
    if (szText == nullptr) {
        return true;
    }
    const std::string strType = jTypes[strName]["cpptype"].asString();
    if (strType == "string") {
        jRecord[strName] = szText;
    } else if (strType == "int" || strType == "unsigned int") {
        jRecord[strName] = static_cast<Json::Int>(Read(szText, std::strtol));
    } else if (strType == "long long" || strType == "unsigned long long") {
        jRecord[strName] = static_cast<Json::Int64>(Read(szText, std::strtoll));
    } else if (strType == "Json::Value" || strType == "Json::objectValue" ||
               strType == "Json::arrayValue") {
        Parse(szText, jRecord[strName]);
    } else if (strType == "bool") {
        jRecord[strName] = Read(szText, std::strtol) == 1;
    } else {
        Host().Located("type error, strType=%s", {strType});
        return false;
    }
    return true;
}

bool Record(Json::Value& jRecord, int nColumns, char** aszValues, char** aszNames) {
    if (Host().Fails(aszNames == nullptr || aszValues == nullptr,
                     "NULL == column_name || NULL == column_value")) {
        return false;
    }
    for (int i = 0; i < nColumns; ++i) {
        if (!Host().Fails(aszNames[i] == nullptr, "NULL == column_name[i]") &&
            !Host().Fails(
                !Field(jRecord, aszNames[i], aszValues[i]),
                "0 > (iTmp = DbCallBackFillField(*pjRec, column_name, column_value, i))")) {
            continue;
        }
        if (i > 0) {
            Host().Plain("column_name[%d]=%s", {i, aszNames[i]});
            Host().Plain("column_value[%d]=%s", {i, aszValues[i]});
        }
        return false;
    }
    return true;
}

}  // namespace

int ModelRow(void* pArg, int nColumns, char** aszValues, char** aszNames) {
    auto* const pjRows = static_cast<Json::Value*>(pArg);
    if (Host().Fails(pjRows == nullptr, "!pjRecArray") ||
        Host().Fails(
            !pjRows->isArray() && !pjRows->isNull(),
            "pjRecArray->type() != Json::arrayValue && pjRecArray->type() != Json::nullValue")) {
        return -1;
    }
    Json::Value jRecord(Json::objectValue);
    if (Host().Fails(!Record(jRecord, nColumns, aszValues, aszNames),
                     "0 > DbCallBackFillRec(&jTmp, n_column, column_value, column_name)")) {
        return -1;
    }
    pjRows->append(jRecord);
    return 0;
}

}  // namespace campaign
