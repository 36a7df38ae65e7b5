// The free functions: member types of a table, member copy, time text.

#include <VornJsonDbApi.h>

#include <ctime>
#include <utility>

#include "../base/JsonMember.h"
#include "../base/JsonMemory.h"
#include "../base/JsonText.h"
#include "../core/LogLine.h"
#include "../schema/KnownTables.h"

namespace {

using vornjsondb::FindMember;
using vornjsondb::KnownTable;
using vornjsondb::KnownTables;
using vornjsondb::MakeMember;
using vornjsondb::NameOf;

// Copies what the lookup keeps of each member definition into jEntry. On failure jEntry holds the
// members before the faulty one.
int CopyMemberTypes(const Json::Value& jMember, Json::Value& jEntry) {
    const Json::Value::const_iterator itEnd = jMember.end();
    for (Json::Value::const_iterator it = jMember.begin(); it != itEnd; ++it) {
        const Json::Value* pjType = FindMember(*it, "cpptype");
        VORN_FAIL_IF_TEXT(pjType == nullptr,
                          "!jTableDef[strJsonName][\"member\"][strKey].isMember(\"cpptype\")");
        VORN_FAIL_IF_TEXT(!pjType->isString(),
                          "!jTableDef[strJsonName][\"member\"][strKey][\"cpptype\"].isString()");
        Json::Value& jOne = MakeMember(jEntry, NameOf(it)) = Json::Value(Json::objectValue);
        for (const char* szKept : {"cpptype", "cppDefaultValue"}) {
            if (const Json::Value* pjKept = FindMember(*it, szKept)) {
                jOne[szKept] = *pjKept;
            }
        }
    }
    return 0;
}

// Makes the table known with the types of its definition. Built aside and moved in: running out of
// memory half way must not leave a part of the members for good. A faulty definition does leave
// that part; hosts run on it.
// Pinned by RecTypeTest.FaultyMemberLeavesTheEarlierOnesAsTheWholeEntry.
int Learn(KnownTables& Tables, const Json::Value& jTableDef, const std::string& strJsonName) {
    VORN_FAIL_IF(jTableDef.empty());
    const Json::Value* pjTable = FindMember(jTableDef, strJsonName);
    VORN_FAIL_IF_TEXT(pjTable == nullptr, "!jTableDef.isMember(strJsonName)");
    VORN_FAIL_IF_TEXT(!pjTable->isObject(), "!jTableDef[strJsonName].isObject()");
    const Json::Value* pjMember = FindMember(*pjTable, "member");
    VORN_FAIL_IF_TEXT(pjMember == nullptr, "!jTableDef[strJsonName].isMember(\"member\")");
    VORN_FAIL_IF_TEXT(!pjMember->isObject(), "!jTableDef[strJsonName][\"member\"].isObject()");
    VORN_FAIL_IF(strJsonName.empty());

    Json::Value jEntry;
    const int nResult = CopyMemberTypes(*pjMember, jEntry);
    if (!jEntry.isNull()) {
        Tables.FindOrAdd(strJsonName).jTypes = std::move(jEntry);
    }
    if (0 > nResult) {
        return -1;
    }
    VORN_FAIL_IF_TEXT(Tables.Find(strJsonName) == nullptr,
                      "jType == Json::nullValue || !jType.isMember(strJsonName)");
    return 0;
}

int CheckKnown(const KnownTable& Known) {
    VORN_FAIL_IF_TEXT(Known.jTypes.type() != Json::objectValue,
                      "jType[strJsonName].type() != Json::objectValue");
    return 0;
}

}  // namespace

KnownTable& vornjsondb::LookUpTable(const Json::Value& jTableDef,
                                    const std::string& strJsonName) try {
    KnownTables& Tables = KnownTables::OfProcess();
    KnownTable* pKnown = Tables.Find(strJsonName);
    if (0 <= (pKnown != nullptr ? CheckKnown(*pKnown) : Learn(Tables, jTableDef, strJsonName))) {
        return pKnown != nullptr ? *pKnown : *Tables.Find(strJsonName);
    }
    VORN_LOG_PLAIN("strJsonName=%s", strJsonName.c_str());
    VORN_LOG_PLAIN("jTableDef=%s", vornjsondb::ToString(jTableDef).c_str());
    VORN_LOG_PLAIN("jType=%s", vornjsondb::ToString(Tables.AllTypes()).c_str());
    // A refused name becomes known without types, so that it stays refused: a host that got its
    // first definition wrong sees the same failure for as long as it runs.
    // Pinned by RecTypeTest.EmptyDefinitionIsRefused.
    return Tables.FindOrAdd(strJsonName);
}
VORN_JSON_MEMORY_TO_BAD_ALLOC

Json::Value& VORN_JSON_DB::recType(Json::Value& jTableDef, std::string& strJsonName) {
    return vornjsondb::LookUpTable(jTableDef, strJsonName).jTypes;
}

int VORN_JSON_DB::jsonCopyMember(Json::Value& jIn, Json::Value& jSubSet, bool blOverwrite) try {
    VORN_FAIL_IF(jIn.type() != Json::nullValue && jIn.type() != Json::objectValue);
    VORN_FAIL_IF(jSubSet.type() != Json::objectValue);
    // Copied as a whole first: the source may lie inside the destination, or the other way round.
    Json::Value jSource = jSubSet;
    for (Json::Value::iterator it = jSource.begin(); it != jSource.end(); ++it) {
        if (blOverwrite || FindMember(jIn, NameOf(it)) == nullptr) {
            MakeMember(jIn, NameOf(it)).swap(*it);
        }
    }
    return 0;
}
VORN_JSON_MEMORY_TO_BAD_ALLOC

int VORN_JSON_DB::getTimeAfterNow(int offsetSecond, long& now) {
    // Added in 64 bits: where time_t has 32, a far offset wraps instead of being undefined.
    now = static_cast<long>(static_cast<long long>(std::time(nullptr)) + offsetSecond);
    return 0;
}

int VORN_JSON_DB::convert2ReadableTime(long now, std::string& strOut, int iType) {
    char szTime[1024] = {};
    struct tm sTime = {};
    const time_t ullTimeStamp = now;
    if ((iType & 1) != 0) {
        VORN_FAIL_IF(NULL == gmtime_r(&ullTimeStamp, &sTime));
    } else {
        VORN_FAIL_IF(NULL == localtime_r(&ullTimeStamp, &sTime));
    }
    if ((iType & 2) != 0) {
        VORN_FAIL_IF(0 == strftime(szTime, sizeof(szTime), "%a, %d %b %Y %T GMT", &sTime));
    } else if ((iType & 4) != 0) {
        VORN_FAIL_IF(0 == strftime(szTime, sizeof(szTime), "%Y-%m-%d %H:%M:%S", &sTime));
    } else {
        VORN_LOG_LOCATED("bad iType value=%d", iType);
        return -1;
    }
    strOut = szTime;
    return 0;
}

int VORN_JSON_DB::getTimeAfterNow(int offsetSecond, std::string& strOut, int iType) {
    long now = 0;                                          // mutate(0 to 1): the next line sets it.
    VORN_FAIL_IF(0 > getTimeAfterNow(offsetSecond, now));  // GCOVR_EXCL_BR_LINE: cannot fail
    VORN_FAIL_IF(0 > convert2ReadableTime(now, strOut, iType));
    return 0;
}
