#include "Store.h"

namespace campaign {

namespace {

int Number(const Database& db, const std::string& strSql) {
    return std::stoi("0" + db.Rows(strSql));
}

}  // namespace

void NewFile(const std::string& strPath, const char* szMode) {
    RemoveDatabase(strPath);
    const Database db(strPath);
    db.Run(std::string("PRAGMA journal_mode=") + szMode);
    db.Run(
        "CREATE TABLE shared (id INTEGER PRIMARY KEY, name TEXT UNIQUE, owner INTEGER, text TEXT);"
        "INSERT INTO shared VALUES (0, 'name-0', -1, 0)");
}

Json::Value RecordOf(const Step& step, int nKey) {
    Json::Value jRecord;
    jRecord["id"] = nKey;
    jRecord["name"] = "name-" + std::to_string(nKey);
    jRecord["owner"] = step.nOwner;
    jRecord["text"] = step.strText;
    return jRecord;
}

State ReadState(const Database& db, int nOwner) {
    const std::string strSide = "('side" + std::to_string(nOwner) + "')";
    State state;
    state.nCounted = Number(db, "SELECT CAST(text AS INTEGER) FROM shared WHERE id = 0");
    state.nSideColumns = Number(db, "SELECT count(*) FROM pragma_table_info" + strSide);
    state.nSideIndexes = Number(db, "SELECT count(*) FROM pragma_index_list" + strSide);
    const std::string strRows = db.Rows(
        "SELECT json_group_object(id, text) FROM shared WHERE owner = " + std::to_string(nOwner));
    const Json::Value jRows = FromText(strRows.substr(1, strRows.size() - 3));
    for (const std::string& strKey : jRows.getMemberNames()) {
        state.rows[std::stoi(strKey)] = jRows[strKey].asString();
    }
    Expect(db.Rows("SELECT count(*) FROM shared WHERE name IS NOT 'name-' || id") == "0\n",
           [] { return std::string("a row is no record of ours"); });
    return state;
}

}  // namespace campaign
