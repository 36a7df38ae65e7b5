// A table with an old handle beside the new one.

#ifndef VORN_TESTS_TABLE_OLD_HANDLE_FIXTURE_H
#define VORN_TESTS_TABLE_OLD_HANDLE_FIXTURE_H

#include <VornJsonDbApi.h>

#include <memory>
#include <string>

#include "QueryFixture.h"

namespace VORN_JSON_DB {

class OldHandleTest : public TableTest {
  protected:
    // Makes a table of these members and opens both handles on it. An old handle knows a table by
    // its name for the life of the process, so each has a name of its own.
    void Describe(const std::string& strMembers) {
        static int s_nTables = 0;
        m_strName = "old" + std::to_string(++s_nTables);
        Options How;
        How.blCompatible = false;
        Open("{\"" + m_strName + "\": {\"member\": " + strMembers + "}}", How);
        m_jDefinition = m_Table.Definition();
        OpenOld();
    }

    void OpenOld() {
        std::string strCreate = "SELECT 1";
        m_pOld = std::make_unique<VornJsonDbApi>(m_pDb, m_strName, m_jDefinition, strCreate);
    }

    // "<result> <stored record>".
    std::string OldCreate(const Json::Value& jRecord) {
        Json::Value jIn = jRecord;
        Json::Value jOut;
        const int nResult = m_pOld->recCreate(jIn, jOut);
        return nResult == 0 ? "0 " + Text(jOut) : std::to_string(nResult);
    }

    // "<member>" of each record that recList finds, or "-1".
    std::string OldList(const Json::Value& jQuery, const char* szMember = "id") {
        Json::Value jIn = jQuery;
        Json::Value jRecords(Json::arrayValue);
        if (m_pOld->recList(jIn, jRecords) != 0) {
            return "-1";
        }
        std::string strFound;
        for (const Json::Value& jRecord : jRecords) {
            strFound += (strFound.empty() ? "" : ",") + Text(jRecord[szMember]);
        }
        return strFound;
    }

    std::string AllRows() { return Rows("SELECT * FROM " + m_strName); }

    std::string m_strName;
    Json::Value m_jDefinition;
    std::unique_ptr<VornJsonDbApi> m_pOld;
};

}  // namespace VORN_JSON_DB

#endif  // VORN_TESTS_TABLE_OLD_HANDLE_FIXTURE_H
