#include "Records.h"

#include <algorithm>
#include <numeric>
#include <random>

#include "../../tests/support/JsonHelpers.h"
#include "Bench.h"

namespace bench {

namespace {

struct Column {
    std::string strName;
    const char* szType;  // as in the definition
    const char* szSql;   // as in the CREATE statement
};

Table MakeTable(const std::string& strName, const std::vector<Column>& vecColumns) {
    Table One;
    One.strName = strName;
    std::string strMembers;
    std::string strColumns;
    for (const Column& Each : vecColumns) {
        strMembers += Each.strName + ":" + Each.szType + ",";
        strColumns += (strColumns.empty() ? "" : ", ") + Each.strName + " " + Each.szSql;
    }
    One.jDefinition = jsonhelpers::Definition(strName, strMembers);
    One.strSqlCreate = "CREATE TABLE IF NOT EXISTS " + strName + " (" + strColumns + ")";
    return One;
}

std::string Numbered(const char* szPrefix, int nNumber, size_t nDigits = 1) {
    const std::string strNumber = std::to_string(nNumber);
    const size_t nZeros = nDigits > strNumber.length() ? nDigits - strNumber.length() : 0;
    return szPrefix + std::string(nZeros, '0') + strNumber;
}

Json::Value List(int nNumber) {
    Json::Value jList(Json::arrayValue);
    jList.append("steel");
    jList.append(Numbered("batch-", nNumber % 97));
    jList.append(nNumber % 1000);
    return jList;
}

constexpr struct {
    const char* szType;
    const char* szSql;
} kKinds[] = {{"int", "INTEGER"}, {"string", "TEXT"},          {"int", "INTEGER"},
              {"string", "TEXT"}, {"int", "INTEGER"},          {"string", "TEXT"},
              {"bool", "INT"},    {"Json::arrayValue", "TEXT"}};
constexpr int kKindCount = 8;

}  // namespace

std::unique_ptr<VornJsonDbApi> Table::Open(sqlite3* pDb) const {
    return jsonhelpers::NewHandle(pDb, strName, jDefinition, strSqlCreate);
}

Table EightMembers() {
    return MakeTable("part", {{"id", "int", "INTEGER PRIMARY KEY"},
                              {"amount", "int", "INTEGER"},
                              {"level", "int", "INTEGER"},
                              {"name", "string", "TEXT"},
                              {"city", "string", "TEXT"},
                              {"note", "string", "TEXT"},
                              {"active", "bool", "INT"},
                              {"tags", "Json::arrayValue", "TEXT"}});
}

Json::Value EightMemberRecord(int nId) {
    Json::Value jRecord;
    jRecord["id"] = nId;
    jRecord["amount"] = nId * 37 % 100003;
    jRecord["level"] = nId % 11;
    jRecord["name"] = Numbered("hexagon bolt ", nId, 6);
    jRecord["city"] = Numbered("Depot ", nId % 50);
    jRecord["note"] = Numbered("it's on the shelf, third row, box ", nId % 400);
    jRecord["active"] = nId % 3 != 0;
    jRecord["tags"] = List(nId);
    return jRecord;
}

std::vector<Json::Value> EightMemberRecords(int nCount) {
    std::vector<Json::Value> vecRecords;
    vecRecords.reserve(static_cast<size_t>(nCount));
    for (int i = 0; i < nCount; ++i) {
        vecRecords.push_back(EightMemberRecord(i));
    }
    return vecRecords;
}

Table Wide(int nColumns) {
    std::vector<Column> vecColumns;
    for (int i = 0; i < nColumns; ++i) {
        vecColumns.push_back(
            {Numbered("c", i, 3), kKinds[i % kKindCount].szType, kKinds[i % kKindCount].szSql});
    }
    vecColumns.front().szSql = "INTEGER PRIMARY KEY";
    return MakeTable(Numbered("wide", nColumns), vecColumns);
}

Json::Value WideRecord(int nColumns, int nKey) {
    Json::Value jRecord;
    for (int i = 0; i < nColumns; ++i) {
        Json::Value& jOne = jRecord[Numbered("c", i, 3)];
        const std::string strType = kKinds[i % kKindCount].szType;
        if (strType == "int") {
            jOne = i * 37;
        } else if (strType == "string") {
            jOne = Numbered("value of column ", i);
        } else if (strType == "bool") {
            jOne = i % 3 != 0;
        } else {
            jOne = List(i);
        }
    }
    jRecord[WideKey()] = nKey;
    return jRecord;
}

std::string WideKey() {
    return Numbered("c", 0, 3);
}

Table EightTexts() {
    std::vector<Column> vecColumns;
    for (int i = 0; i < 8; ++i) {
        vecColumns.push_back({Numbered("text", i), "string", "TEXT"});
    }
    return MakeTable("texts", vecColumns);
}

std::vector<int> Shuffled(int nCount) {
    std::vector<int> vecNumbers(static_cast<size_t>(nCount));
    std::iota(vecNumbers.begin(), vecNumbers.end(), 0);
    std::shuffle(vecNumbers.begin(), vecNumbers.end(), std::mt19937(20000));
    return vecNumbers;
}

Json::Value ById(int nId) {
    Json::Value jQuery;
    jQuery["id"] = nId;
    return jQuery;
}

}  // namespace bench
