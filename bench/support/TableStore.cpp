#include "TableStore.h"

#include <vector>

#include "Records.h"
#include "SqlCapture.h"

namespace bench {

namespace {

void BindText(sqlite3_stmt* pInsert, int i, const std::string& strText) {
    sqlite3_bind_text(pInsert, i, strText.data(), static_cast<int>(strText.length()),
                      SQLITE_STATIC);
}

}  // namespace

void RequireOk(const VORN_JSON_DB::Status& Outcome) {
    Require(Outcome.Ok(), Outcome.Message().c_str());
}

TableStore::TableStore(int nRows) {
    const Table Eight = EightMembers();
    VORN_JSON_DB::Options How;
    How.strSqlCreate = Eight.strSqlCreate;
    RequireOk(Own.Open(Db.Get(), Eight.strName, Eight.jDefinition, How));
    Db.Exec("BEGIN");
    for (int i = 0; i < nRows; ++i) {
        RequireOk(Own.Create(EightMemberRecord(i)));
    }
}

Part EightMemberPart(int nId) {
    const Json::Value jRecord = EightMemberRecord(nId);
    return {jRecord["active"].asBool(), jRecord["amount"].asInt(),
            jRecord["city"].asString(), jRecord["id"].asInt(),
            jRecord["level"].asInt(),   jRecord["name"].asString(),
            jRecord["note"].asString(), JsonText().Write(jRecord["tags"])};
}

void Load(VORN_JSON_DB::Loader& Into, const Part& One) {
    Into.SetBoolean(0, One.blActive);
    Into.SetInteger(1, One.nAmount);
    Into.SetText(2, One.strCity);
    Into.SetInteger(3, One.nId);
    Into.SetInteger(4, One.nLevel);
    Into.SetText(5, One.strName);
    Into.SetText(6, One.strNote);
    Into.SetJson(7, One.strTags);
    RequireOk(Into.EndRecord());
}

ByHand::ByHand(const Database& Db) {
    TableStore Source(1);
    SqlCapture Capture(Source.Db.Get());
    Json::Value jOut;
    RequireOk(Source.Own.Create(EightMemberRecord(1), &jOut));
    const std::vector<std::string> vecCreate = Capture.TakeEach();
    Require(vecCreate.size() == m_aCreate.size(), "the statements of a create");
    for (size_t i = 0; i < vecCreate.size(); ++i) {
        m_aCreate[i].reset(Prepare(Db, vecCreate[i]));
    }
    RequireOk(Source.Own.Get(0, jOut));
    m_pGet.reset(Prepare(Db, Capture.Take()));
    RequireOk(Source.Own.List({}, jOut));
    m_pList.reset(Prepare(Db, Capture.Take()));
}

void ByHand::Create(const Json::Value& jRecord, Json::Value& jStored) {
    const auto& [pBegin, pInsert, pSelect, pEnd] = m_aCreate;
    StepTo(pBegin.get(), SQLITE_DONE);
    sqlite3_reset(pBegin.get());
    Load(jRecord);
    sqlite3_bind_int64(pSelect.get(), 1,
                       sqlite3_last_insert_rowid(sqlite3_db_handle(pInsert.get())));
    StepTo(pSelect.get(), SQLITE_ROW);
    jStored = m_Reader.ReadRow(pSelect.get());
    sqlite3_reset(pSelect.get());
    StepTo(pEnd.get(), SQLITE_DONE);
    sqlite3_reset(pEnd.get());
}

void ByHand::Get(int nId, Json::Value& jFound) const {
    sqlite3_bind_int(m_pGet.get(), 1, nId);
    StepTo(m_pGet.get(), SQLITE_ROW);
    jFound = m_Reader.ReadRow(m_pGet.get());
    sqlite3_reset(m_pGet.get());
}

void ByHand::List(Json::Value& jAll) const {
    jAll = Json::Value(Json::arrayValue);
    while (sqlite3_step(m_pList.get()) == SQLITE_ROW) {
        jAll.append(m_Reader.ReadRow(m_pList.get()));
    }
    Require(sqlite3_reset(m_pList.get()) == SQLITE_OK, "list by hand");
}

void ByHand::Load(const Part& One) const {
    sqlite3_stmt* const pInsert = m_aCreate[1].get();
    sqlite3_bind_int(pInsert, 1, One.blActive ? 1 : 0);
    sqlite3_bind_int(pInsert, 2, One.nAmount);
    BindText(pInsert, 3, One.strCity);
    sqlite3_bind_int(pInsert, 4, One.nId);
    sqlite3_bind_int(pInsert, 5, One.nLevel);
    BindText(pInsert, 6, One.strName);
    BindText(pInsert, 7, One.strNote);
    BindText(pInsert, 8, One.strTags);
    StepTo(pInsert, SQLITE_DONE);
    sqlite3_reset(pInsert);
}

void ByHand::Load(const Json::Value& jRecord) {
    sqlite3_stmt* const pInsert = m_aCreate[1].get();
    const std::string strTags = m_Text.Write(jRecord["tags"]);
    BindRecord(pInsert, jRecord, strTags);
    StepTo(pInsert, SQLITE_DONE);
    sqlite3_reset(pInsert);
}

}  // namespace bench
