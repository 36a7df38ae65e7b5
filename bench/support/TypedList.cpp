#include "TypedList.h"

#include <utility>

#include "Bench.h"

namespace bench {

namespace {

Json::Value TextColumn(sqlite3_stmt* pStatement, int iColumn) {
    const char* pText = reinterpret_cast<const char*>(sqlite3_column_text(pStatement, iColumn));
    return Json::Value(pText, pText + sqlite3_column_bytes(pStatement, iColumn));
}

}  // namespace

TypedList::TypedList() {
    Json::CharReaderBuilder Builder;
    Builder["collectComments"] = false;
    m_pReader.reset(Builder.newCharReader());
}

Json::Value TypedList::Read(sqlite3* pDb, const std::string& strSql) const {
    sqlite3_stmt* pStatement = nullptr;
    Require(sqlite3_prepare_v2(pDb, strSql.c_str(), -1, &pStatement, nullptr) == SQLITE_OK,
            "prepare of the hand-written list");
    Json::Value jArray(Json::arrayValue);
    while (sqlite3_step(pStatement) == SQLITE_ROW) {
        jArray.append(ReadRow(pStatement));
    }
    Require(sqlite3_finalize(pStatement) == SQLITE_OK, "hand-written list");
    return jArray;
}

Json::Value TypedList::ReadRow(sqlite3_stmt* pStatement) const {
    Json::Value jRecord(Json::objectValue);
    jRecord["active"] = sqlite3_column_int(pStatement, 0) == 1;
    jRecord["amount"] = sqlite3_column_int(pStatement, 1);
    jRecord["city"] = TextColumn(pStatement, 2);
    jRecord["id"] = sqlite3_column_int(pStatement, 3);
    jRecord["level"] = sqlite3_column_int(pStatement, 4);
    jRecord["name"] = TextColumn(pStatement, 5);
    jRecord["note"] = TextColumn(pStatement, 6);
    const char* pTags = reinterpret_cast<const char*>(sqlite3_column_text(pStatement, 7));
    const int nTags = sqlite3_column_bytes(pStatement, 7);
    Require(m_pReader->parse(pTags, pTags + nTags, &jRecord["tags"], nullptr), "tags");
    return jRecord;
}

}  // namespace bench
