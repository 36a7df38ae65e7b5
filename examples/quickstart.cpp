// Quickstart: real records go into an SQLite file and come back.
//
//    quickstart [json-dir [database-file]]
//
// json-dir       where iso_639-3.json and iso_3166-2.json lie; /usr/share/iso-codes/json if not
//                given (Debian package iso-codes)
// database-file  a file that does not exist yet; if not given, one in a directory of its own under
//                /tmp, removed at the end
// Exit code: 0 when everything came back as it went in, 1 when not, 2 for bad arguments.
//
// A percent sign in a text needs care. recCreate formats all text so far again for each member that
// follows: "%%" becomes "%", and "%d" is refused. These files hold none. For text of your users:
// create the record with that member empty, then set it with recUpdateByFilter in the same
// transaction. An update formats each value once and stores it exactly.

#include <VornJsonDbApi.h>

#include <unistd.h>

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <iostream>
#include <iterator>
#include <map>
#include <sstream>
#include <string>

namespace {

// One entry per column. Members that the files leave out get a default, so that every stored record
// is complete. The last member in name order ("type" in both tables) must be in every record or
// have a default: without it the INSERT is not well formed.
const char kDefinition[] = R"({
    "language": {"member": {
        "alpha_2":       {"cpptype": "string", "cppDefaultValue": ""},
        "alpha_3":       {"cpptype": "string"},
        "bibliographic": {"cpptype": "string", "cppDefaultValue": ""},
        "common_name":   {"cpptype": "string", "cppDefaultValue": ""},
        "inverted_name": {"cpptype": "string", "cppDefaultValue": ""},
        "name":          {"cpptype": "string"},
        "scope":         {"cpptype": "string"},
        "type":          {"cpptype": "string"}}},
    "subdivision": {"member": {
        "code":          {"cpptype": "string"},
        "name":          {"cpptype": "string"},
        "parent":        {"cpptype": "string", "cppDefaultValue": ""},
        "type":          {"cpptype": "string"}}}
})";

struct Source {
    const char *szFile, *szArray;  // the file, and its member that holds the records
    const char *szTable, *szKey, *szCreate;
    const char *szUpdateType, *szUpdateMember;   // that member changes on records of that "type"
    const char *szDeleteMember, *szDeleteValue;  // records with that value go
};

const Source kSources[] = {
    {"iso_639-3.json", "639-3", "language", "alpha_3",
     "CREATE TABLE IF NOT EXISTS language (alpha_3 TEXT PRIMARY KEY, alpha_2 TEXT, "
     "bibliographic TEXT, common_name TEXT, inverted_name TEXT, name TEXT, scope TEXT, type TEXT)",
     "E", "common_name", "name", "'Are'are"},
    {"iso_3166-2.json", "3166-2", "subdivision", "code",
     "CREATE TABLE IF NOT EXISTS subdivision (code TEXT PRIMARY KEY, name TEXT, parent TEXT, "
     "type TEXT)",
     "Parish", "parent", "type", "Province"}};

using Clock = std::chrono::steady_clock;
using Records = std::map<std::string, Json::Value>;  // complete records by their key

Clock::time_point g_tLast;  // when the last line of the report was printed

bool Fail(const std::string& strWhat) {
    std::cerr << "quickstart: " << strWhat << std::endl;
    return false;
}

bool Report(const char* szWhat, std::size_t nRecords) {
    const std::chrono::duration<double> seconds = Clock::now() - g_tLast;
    std::printf("  %-40s %6zu  %6.3f s\n", szWhat, nRecords, seconds.count());
    g_tLast = Clock::now();
    return true;
}

bool Parse(std::istream&& text, const std::string& strName, Json::Value& jValue) {
    std::string strError;
    return Json::parseFromStream(Json::CharReaderBuilder(), text, &jValue, &strError) ||
           Fail("cannot read " + strName + ": " + strError);
}

// What the table should hold: the source's records, completed with the defaults.
Records Complete(const Json::Value& jRecords, const Json::Value& jMembers, const char* szKey) {
    Records records;
    for (Json::Value jRec : jRecords) {
        for (const std::string& strMember : jMembers.getMemberNames()) {
            if (!jRec.isMember(strMember)) {
                jRec[strMember] = jMembers[strMember]["cppDefaultValue"];
            }
        }
        records[jRec[szKey].asString()] = jRec;
    }
    return records;
}

// Every row must be one of the expected records, and each of those must be there once.
bool Same(const Json::Value& jRows, const char* szKey, Records expected) {
    for (const Json::Value& jRow : jRows) {
        const auto it = expected.find(jRow[szKey].asString());
        if (it == expected.end() || it->second != jRow) {
            return Fail("not what was stored: " + jRow.toStyledString());
        }
        expected.erase(it);
    }
    return expected.empty() || Fail(expected.begin()->first + " is missing");
}

bool Run(VornJsonDbApi& api, const char* szSql) {
    return api.runSqlEx(szSql) >= 0 || Fail(std::string(szSql) + " failed");
}

// One transaction for all records: a commit costs far more than a record.
bool StoreAll(VornJsonDbApi& api, const Json::Value& jRecords) {
    if (!Run(api, "BEGIN")) {
        return false;
    }
    for (Json::Value jRec : jRecords) {
        Json::Value jStored;  // receives the row as SQLite has it
        if (api.recCreate(jRec, jStored) != 0) {
            Fail("recCreate failed " + api.getErrMsg() + " for " + jRec.toStyledString());
            Run(api, "ROLLBACK");  // reports its own failure
            return false;
        }
    }
    return Run(api, "COMMIT") && Report("stored (recCreate)", jRecords.size());
}

bool ListAll(VornJsonDbApi& api, const char* szKey, const Records& expected) {
    Json::Value jAll;  // a null query object sets no condition
    Json::Value jRows;
    return (api.recList(jAll, jRows) == 0 || Fail("recList failed")) &&
           Same(jRows, szKey, expected) && Report("listed and equal (recList)", jRows.size());
}

bool FetchEach(VornJsonDbApi& api, const char* szKey, const Records& expected) {
    Json::Value jQuery;
    jQuery["limit"] = 1;  // recGetOne would read every matching row
    for (const Records::value_type& entry : expected) {
        Json::Value jRec;
        jQuery[szKey] = entry.first;
        if (api.recGetOne(jQuery, jRec) != 1 || jRec != entry.second) {
            return Fail("recGetOne did not bring back " + entry.first);
        }
    }
    Json::Value jNowhere;
    jQuery[szKey] = "no such key";
    return (api.recGetOne(jQuery, jNowhere) == 0 || Fail("recGetOne found what is not there")) &&
           Report("fetched by key and equal (recGetOne)", expected.size());
}

// "sort_by" would not sort (docs/sharp-edges.md): the order is SQLite's own, and the same for each
// page as long as nobody writes. recList appends, so the pages add up.
bool ReadPages(VornJsonDbApi& api, const char* szKey, const Records& expected) {
    Json::Value jQuery;
    Json::Value jRows;
    Json::ArrayIndex nBefore = 0;
    jQuery["limit"] = 1000;
    do {
        jQuery["offset"] = nBefore = jRows.size();
        if (api.recList(jQuery, jRows) != 0 || jRows.size() > nBefore + 1000) {
            return Fail("a page failed or is too long");
        }
    } while (jRows.size() > nBefore);
    return Same(jRows, szKey, expected) && Report("paged and equal (limit, offset)", jRows.size());
}

// Creates a record whose key is taken. The library logs each step that gave up; so many lines would
// bury the report, so they go to the system log here.
bool RefuseDuplicate(VornJsonDbApi& api, Json::Value jRec) {
    Json::Value jStored;
    api.setErrMsg("");  // no success clears the message
    blLogToStdout = false;
    const int nResult = api.recCreate(jRec, jStored);
    blLogToStdout = true;
    const std::string strMessage = api.getErrMsg();
    if (nResult != -1 || strMessage != "DUPLICATE_PRIMARY_KEY" || !jStored.isNull()) {
        return Fail("a second record with a stored key was not refused as it should be");
    }
    return Report(("refused again: " + strMessage).c_str(), 1);
}

bool UpdateType(VornJsonDbApi& api, const Source& source, Records& expected) {
    Json::Value jFilter;
    Json::Value jNew;
    jFilter["type"] = source.szUpdateType;
    jNew[source.szUpdateMember] = "quickstart's";  // quotes are the library's business
    if (api.recUpdateByFilter(jFilter, jNew) != 0) {
        return Fail("recUpdateByFilter failed");
    }
    std::size_t nChanged = 0;
    for (Records::value_type& entry : expected) {
        if (entry.second["type"] == jFilter["type"]) {
            entry.second[source.szUpdateMember] = jNew[source.szUpdateMember];
            ++nChanged;
        }
    }
    return Report("updated (recUpdateByFilter)", nChanged);
}

bool DeleteByValue(VornJsonDbApi& api, const Source& source, Records& expected) {
    std::string strValue = source.szDeleteValue;
    const int nDeleted = api.recDeleteByName(strValue, source.szDeleteMember);
    const std::size_t nBefore = expected.size();
    for (auto it = expected.begin(); it != expected.end();) {
        it = it->second[source.szDeleteMember] == strValue ? expected.erase(it) : std::next(it);
    }
    const std::size_t nGone = nBefore - expected.size();
    return (nDeleted == static_cast<int>(nGone) || Fail("recDeleteByName went wrong")) &&
           Report("deleted (recDeleteByName)", nGone);
}

bool RunTable(sqlite3* pDb, Json::Value& jDefinition, const Source& source,
              const Json::Value& jRecords) {
    std::string strTable = source.szTable;
    std::string strCreate = source.szCreate;
    Records expected = Complete(jRecords, jDefinition[strTable]["member"], source.szKey);
    std::printf("\n%s\n", source.szFile);
    g_tLast = Clock::now();

    VornJsonDbApi api(pDb, strTable, jDefinition, strCreate);
    // The constructor only logs a failure. Asking again tells, thanks to IF NOT EXISTS.
    return (api.tableCreate() == 0 || Fail("cannot create the table " + strTable)) &&
           StoreAll(api, jRecords) && ListAll(api, source.szKey, expected) &&
           FetchEach(api, source.szKey, expected) && ReadPages(api, source.szKey, expected) &&
           RefuseDuplicate(api, jRecords[0]) && UpdateType(api, source, expected) &&
           DeleteByValue(api, source, expected) && ListAll(api, source.szKey, expected);
}

bool RunDatabase(const std::string& strDir, const std::string& strDatabase) {
    Json::Value jDefinition;
    bool blGood = Parse(std::istringstream(kDefinition), "the table definition", jDefinition);
    sqlite3* pDb = nullptr;
    if (sqlite3_open(strDatabase.c_str(), &pDb) != SQLITE_OK) {
        blGood = Fail("cannot open " + strDatabase + ": " + sqlite3_errmsg(pDb));
    }
    for (const Source& source : kSources) {
        const std::string strPath = strDir + "/" + source.szFile;
        Json::Value jFile;
        blGood = blGood && Parse(std::ifstream(strPath), strPath, jFile) &&
                 ((jFile.isObject() && !jFile[source.szArray].empty()) ||
                  Fail("no records in " + strPath)) &&
                 RunTable(pDb, jDefinition, source, jFile[source.szArray]);
    }
    // The connection is the program's own; no handle lives any more.
    return (sqlite3_close(pDb) == SQLITE_OK || Fail("cannot close " + strDatabase)) && blGood;
}

}  // namespace

int main(int argc, char** argv) {
    if (argc > 3 || (argc == 3 && access(argv[2], F_OK) == 0)) {
        Fail("usage: quickstart [json-dir [database-file]]; the file must not exist yet");
        return 2;
    }
    const std::string strDir = argc > 1 ? argv[1] : "/usr/share/iso-codes/json";
    char szTemp[] = "/tmp/vornjsondb-XXXXXX";
    if (argc < 3 && mkdtemp(szTemp) == nullptr) {
        Fail("cannot make a directory under /tmp");
        return 1;
    }
    const std::string strDatabase = argc == 3 ? argv[2] : std::string(szTemp) + "/quickstart.db";

    blLogToStdout = true;  // let the library say here, not in the system log, why a step failed
    std::printf("from %s into %s\n", strDir.c_str(), strDatabase.c_str());
    bool blGood = RunDatabase(strDir, strDatabase);
    if (argc < 3 && (unlink(strDatabase.c_str()) != 0 || rmdir(szTemp) != 0)) {
        blGood = Fail("cannot remove " + strDatabase);
    }
    if (blGood) {
        std::printf("\neverything came back as it went in\n");
    }
    return blGood ? 0 : 1;
}
