#include "Steps.h"

#include <cerrno>
#include <ctime>

namespace campaign {

namespace {

using Lib = VornJsonDbApi;

// ---- rows, without a record operation
// ------------------------------------------------------------

RowCallback g_fnLibraryRow = nullptr;

// Three columns at most: a number, NULL, a text.
int CallWithRow(RowCallback fnRow, Given& given) {
    static char s_szNumber[] = "7";
    static char s_szText[] = "x";
    char* aszValues[] = {s_szNumber, nullptr, s_szText};
    char* aszNames[3] = {};
    const int nColumns = static_cast<int>(given.vec.size());
    for (int i = 0; i < nColumns; ++i) {
        const bool blNamed = given.nType != kLastNameMissing || i + 1 < nColumns;
        aszNames[i] = blNamed ? given.vec[static_cast<std::size_t>(i)].data() : nullptr;
    }
    return fnRow(given.blNull ? nullptr : &given.jOut,
                 given.nType == kFewerThanNone ? -1 : nColumns,
                 given.nType == kNoValues ? nullptr : aszValues,
                 given.nType == kNoNames ? nullptr : aszNames);
}

// A callback of the host's own. It stops at the third row.
int Gather(void* pArg, int nColumns, char** aszValues, char** aszNames) {
    std::string& strRows = *static_cast<std::string*>(pArg);
    for (int i = 0; i < nColumns; ++i) {
        strRows.append(aszNames[i]).append("=").append(aszValues[i] == nullptr ? "" : aszValues[i]);
    }
    strRows += "\n";
    return strRows.find('\n', strRows.find('\n', strRows.find('\n') + 1) + 1) == std::string::npos
               ? 0
               : 1;
}

// The same, and what made it stop looks like a lock.
int GatherAgain(void* pArg, int nColumns, char** aszValues, char** aszNames) {
    const int nStop = Gather(pArg, nColumns, aszValues, aszNames);
    errno = nStop != 0 ? EAGAIN : errno;
    return nStop;
}

int ModelGatherAgain(void* pArg, int nColumns, char** aszValues, char** aszNames) {
    const int nStop = Gather(pArg, nColumns, aszValues, aszNames);
    Host().nErrno = nStop != 0 ? EAGAIN : Host().nErrno;
    return nStop;
}

// ---- types and times
// -----------------------------------------------------------------------------

int LibraryTypes(Lib&, Given& given) {
    given.jOut = VORN_JSON_DB::recType(given.j, given.str);
    return 0;
}

int ModelTypesOf(Model&, Given& given) {
    given.jOut = ModelTypes(given.j, given.str);
    return 0;
}

// The texts of now: the clock may step between two looks at it, so the library's text is held
// against each second of the time that the call took.
int LibraryNow(Lib&, Given& given) {
    const long nFirst = static_cast<long>(std::time(nullptr));
    const int nResult = VORN_JSON_DB::getTimeAfterNow(-given.nType, given.str, given.nType);
    long nNow = 0;
    const bool blZero = VORN_JSON_DB::getTimeAfterNow(-given.nType, nNow) == 0;
    const long nLast = static_cast<long>(std::time(nullptr));
    Expect(blZero && nNow >= nFirst - given.nType && nNow <= nLast - given.nType,
           [] { return std::string("getTimeAfterNow gives another time"); });
    bool blText = nResult < 0;
    for (long n = nFirst; n <= nLast && !blText; ++n) {
        std::string strWanted;
        blText =
            ModelTimeText(n - given.nType, strWanted, given.nType) == 0 && strWanted == given.str;
    }
    Expect(blText, [&] { return "getTimeAfterNow gives " + given.str; });
    if (blText && nResult == 0) {
        given.str = "right";
    }
    return nResult;
}

int ModelNow(Model&, Given& given) {
    std::string strText;
    const int nResult = ModelTimeAfterNow(0, strText, given.nType);
    if (nResult == 0) {
        given.str = "right";
    }
    return nResult;
}

// ---- the table
// -----------------------------------------------------------------------------------

using G = Given;

// clang-format off
const StepKind kFirst =
    {"recCreate, first records",    0, prepare::FirstRecord,    [](Lib& l, G& g) { return l.recCreate(g.j, g.jOut); },                           [](Model& m, G& g) { return m.RecCreate(g.j, g.jOut); }};

const StepKind kKinds[] = {
    {"tableCreate",                 1, prepare::Nothing,        [](Lib& l, G&) { return l.tableCreate(); },                                      [](Model& m, G&) { return m.TableCreate(); }},
    {"setErrMsg",                   5, prepare::KeyAndValues,   [](Lib& l, G& g) { l.setErrMsg(g.strOut); return 0; },                           [](Model& m, G& g) { m.strErrMsg = g.strOut; return 0; }},
    {"runSqlEx",                    6, prepare::Statement,      [](Lib& l, G& g) { return l.runSqlEx(g.str); },                                  [](Model& m, G& g) { return m.RunSql(g.str); }},
    {"runSqlEx, records",           2, prepare::Statement,      [](Lib& l, G& g) { return l.runSqlEx(g.str, g_fnLibraryRow, g.blNull ? nullptr : &g.jOut); }, [](Model& m, G& g) { return m.RunSql(g.str, ModelRow, g.blNull ? nullptr : &g.jOut); }},
    {"runSqlEx, rows",              2, prepare::Statement,      [](Lib& l, G& g) { return l.runSqlEx(g.str, g.bl ? GatherAgain : Gather, &g.strOut); }, [](Model& m, G& g) { return m.RunSql(g.str, g.bl ? ModelGatherAgain : Gather, &g.strOut); }},
    {"row callback",                4, prepare::Row,            [](Lib&, G& g) { return CallWithRow(g_fnLibraryRow, g); },                       [](Model&, G& g) { return CallWithRow(ModelRow, g); }},
    {"checkJsonType",               3, prepare::Record,         [](Lib& l, G& g) { return l.checkJsonType(g.j); },                               [](Model& m, G& g) { return m.Check(g.j); }},
    {"fillDefaultValue",            3, prepare::Record,         [](Lib& l, G& g) { return l.fillDefaultValue(g.j, g.bl); },                      [](Model& m, G& g) { return m.Fill(g.j, g.bl); }},
    {"SqlExpandMemberName",         2, prepare::Record,         [](Lib& l, G& g) { return l.SqlExpandMemberName(g.str, g.bl ? &g.j : nullptr); }, [](Model& m, G& g) { return m.Names(g.str, g.bl ? &g.j : nullptr); }},
    {"SqlExpandMemberSymbol",       4, prepare::Record,         [](Lib& l, G& g) { return l.SqlExpandMemberSymbol(g.str, g.j); },                [](Model& m, G& g) { return m.Values(g.str, g.j); }},
    {"SqlMakeByMatchField",         3, prepare::Value,          [](Lib& l, G& g) { return l.SqlMakeByMatchField(g.str, g.j, g.strOut); },        [](Model& m, G& g) { return m.Match(g.str, g.j, g.strOut); }},
    {"SqlMakeByMatchField, name",   1, prepare::Value,          [](Lib& l, G& g) { return l.SqlMakeByMatchField(g.str, g.j, g.str); },           [](Model& m, G& g) { return m.Match(std::string(g.str), g.j, g.str); }},
    {"SqlMakeByListField",          3, prepare::Value,          [](Lib& l, G& g) { return l.SqlMakeByListField(g.Key(), g.j, g.strOut); },       [](Model& m, G& g) { return m.List(g.Key(), g.j, g.strOut); }},
    {"SqlMakeByListField, name",    1, prepare::Value,          [](Lib& l, G& g) { return l.SqlMakeByListField(g.str.c_str(), g.j, g.str); },    [](Model& m, G& g) { return m.List(std::string(g.str).c_str(), g.j, g.str); }},
    {"SqlExpandMemberList",         4, prepare::Query,          [](Lib& l, G& g) { return l.SqlExpandMemberList(g.j, g.str, g.nType); },         [](Model& m, G& g) { return m.Conditions(g.j, g.str, g.nType); }},
    {"SqlFilterConditionFromJson",  2, prepare::Query,          [](Lib& l, G& g) { return l.SqlFilterConditionFromJson(g.j, g.str); },           [](Model& m, G& g) { return m.Tail(g.j, g.str); }},
    {"recSave",                     8, prepare::Record,         [](Lib& l, G& g) { return l.recSave(g.j, g.bl); },                               [](Model& m, G& g) { return m.RecSave(g.j, g.bl); }},
    {"recCreate",                  14, prepare::Record,         [](Lib& l, G& g) { return l.recCreate(g.j, g.jOut); },                           [](Model& m, G& g) { return m.RecCreate(g.j, g.jOut); }},
    {"recCreate, refused",          5, prepare::Refused,        [](Lib& l, G& g) { return l.recCreate(g.j, g.jOut); },                           [](Model& m, G& g) { return m.RecCreate(g.j, g.jOut); }},
    {"recCreate, same",             2, prepare::Record,         [](Lib& l, G& g) { return l.recCreate(g.j, g.j); },                              [](Model& m, G& g) { return m.RecCreate(g.j, g.j); }},
    {"recCreate, from a part",      2, prepare::PartOfRecord,   [](Lib& l, G& g) { return l.recCreate(g.j["part"], g.j); },                      [](Model& m, G& g) { return m.RecCreate(g.j["part"], g.j); }},
    {"recCreate, into a part",      2, prepare::RecordWithPart, [](Lib& l, G& g) { return l.recCreate(g.j, g.j["part"]); },                      [](Model& m, G& g) { return m.RecCreate(g.j, g.j["part"]); }},
    {"recList",                     8, prepare::Query,          [](Lib& l, G& g) { return l.recList(g.j, g.jOut); },                             [](Model& m, G& g) { return m.RecList(g.j, g.jOut); }},
    {"recList, same",               1, prepare::Query,          [](Lib& l, G& g) { return l.recList(g.jOut, g.jOut); },                          [](Model& m, G& g) { return m.RecList(g.jOut, g.jOut); }},
    {"recList, from a part",        2, prepare::QueryInArray,   [](Lib& l, G& g) { return l.recList(g.j[0U], g.j); },                            [](Model& m, G& g) { return m.RecList(g.j[0U], g.j); }},
    {"recList, into a part",        3, prepare::QueryWithPart,  [](Lib& l, G& g) { return l.recList(g.j, g.j["part"]); },                        [](Model& m, G& g) { return m.RecList(g.j, g.j["part"]); }},
    {"recGetOne",                   7, prepare::QueryForOne,    [](Lib& l, G& g) { return l.recGetOne(g.j, g.jOut); },                           [](Model& m, G& g) { return m.RecGetOne(g.j, g.jOut); }},
    {"recGetOne, same",             1, prepare::Query,          [](Lib& l, G& g) { return l.recGetOne(g.j, g.j); },                              [](Model& m, G& g) { return m.RecGetOne(g.j, g.j); }},
    {"recGetOne, from a part",      1, prepare::PartOfRecord,   [](Lib& l, G& g) { return l.recGetOne(g.j["part"], g.j); },                      [](Model& m, G& g) { return m.RecGetOne(g.j["part"], g.j); }},
    {"recGetOne, into a part",      1, prepare::QueryWithPart,  [](Lib& l, G& g) { return l.recGetOne(g.j, g.j["part"]); },                      [](Model& m, G& g) { return m.RecGetOne(g.j, g.j["part"]); }},
    {"recUpdateByWhere",            6, prepare::Change,         [](Lib& l, G& g) { return l.recUpdateByWhere(g.jOut, g.str); },                  [](Model& m, G& g) { return m.RecUpdateByWhere(g.jOut, g.str); }},
    {"recUpdateByFilter",           7, prepare::Change,         [](Lib& l, G& g) { return l.recUpdateByFilter(g.j, g.jOut); },                   [](Model& m, G& g) { return m.RecUpdateByFilter(g.j, g.jOut); }},
    {"recUpdateByFilter, refused",  4, prepare::Refused,        [](Lib& l, G& g) { return l.recUpdateByFilter(g.j, g.jOut); },                   [](Model& m, G& g) { return m.RecUpdateByFilter(g.j, g.jOut); }},
    {"recUpdateByFilter, same",     1, prepare::Record,         [](Lib& l, G& g) { return l.recUpdateByFilter(g.j, g.j); },                      [](Model& m, G& g) { return m.RecUpdateByFilter(g.j, g.j); }},
    {"recUpdateByFilter, part",     1, prepare::PartOfRecord,   [](Lib& l, G& g) { return l.recUpdateByFilter(g.j["part"], g.j); },              [](Model& m, G& g) { return m.RecUpdateByFilter(g.j["part"], g.j); }},
    {"recDelete",                   3, prepare::Change,         [](Lib& l, G& g) { return l.recDelete(g.j); },                                   [](Model& m, G& g) { return m.RecDelete(g.j, false); }},
    {"recDelete, all",              1, prepare::Change,         [](Lib& l, G& g) { return l.recDelete(g.j, true); },                             [](Model& m, G& g) { return m.RecDelete(g.j, true); }},
    {"recDeleteAll",                1, prepare::Nothing,        [](Lib& l, G&) { return l.recDeleteAll(); },                                     [](Model& m, G&) { return m.RecDeleteAll(); }},
    {"recDeleteByArray",            4, prepare::KeyAndValues,   [](Lib& l, G& g) { return l.recDeleteByArray(g.vec, g.Key()); },                 [](Model& m, G& g) { return m.RecDeleteByArray(g.vec, g.Key()); }},
    {"recDeleteByName",             4, prepare::KeyAndValues,   [](Lib& l, G& g) { return l.recDeleteByName(g.strOut, g.Key()); },               [](Model& m, G& g) { return m.RecDeleteByName(g.strOut, g.Key()); }},
    {"recDeleteByName, same",       1, prepare::KeyAndValues,   [](Lib& l, G& g) { return l.recDeleteByName(g.strOut, g.strOut.c_str()); },      [](Model& m, G& g) { return m.RecDeleteByName(g.strOut, g.strOut.c_str()); }},
    {"VectorParamToJson",           2, prepare::KeyAndValues,   [](Lib& l, G& g) { return l.VectorParamToJson(g.vec, g.Key(), g.j); },           [](Model& m, G& g) { return m.ToList(g.vec, g.Key(), g.j); }},
    {"recType",                     2, prepare::Definition,     LibraryTypes,                                                                    ModelTypesOf},
    {"jsonCopyMember",              3, prepare::TwoValues,      [](Lib&, G& g) { return VORN_JSON_DB::jsonCopyMember(g.j, g.jOut, g.bl); },      [](Model&, G& g) { return ModelCopyMember(g.j, g.jOut, g.bl); }},
    {"jsonCopyMember, same",        1, prepare::TwoValues,      [](Lib&, G& g) { return VORN_JSON_DB::jsonCopyMember(g.j, g.j, g.bl); },         [](Model&, G& g) { return ModelCopyMember(g.j, g.j, g.bl); }},
    {"jsonCopyMember, from a part", 1, prepare::PartOfRecord,   [](Lib&, G& g) { return VORN_JSON_DB::jsonCopyMember(g.j, g.j["part"], g.bl); }, [](Model&, G& g) { return ModelCopyMember(g.j, g.j["part"], g.bl); }},
    {"jsonCopyMember, into a part", 1, prepare::PartOfRecord,   [](Lib&, G& g) { return VORN_JSON_DB::jsonCopyMember(g.j["part"], g.j, g.bl); }, [](Model&, G& g) { return ModelCopyMember(g.j["part"], g.j, g.bl); }},
    {"convert2ReadableTime",        2, prepare::Time,           [](Lib&, G& g) { return VORN_JSON_DB::convert2ReadableTime(g.n, g.str, g.nType); }, [](Model&, G& g) { return ModelTimeText(g.n, g.str, g.nType); }},
    {"getTimeAfterNow",             1, prepare::Time,           LibraryNow,                                                                      ModelNow},
};
// clang-format on

}  // namespace

const StepKind& FirstStep() {
    return kFirst;
}

const StepKind& AnyStep(Random& random) {
    int nSum = 0;
    for (const StepKind& kind : kKinds) {
        nSum += kind.nWeight;
    }
    int n = random.Below(nSum);
    const StepKind* pKind = kKinds;
    for (; n >= pKind->nWeight; ++pKind) {
        n -= pKind->nWeight;
    }
    return *pKind;
}

void LearnRowCallback() {
    const Database db;
    const std::string strName = "first";
    const Json::Value jDefinition = Definition(strName, "a:int");
    Json::Value jRows;
    const auto pHandle = NewHandle(db.Get(), strName, jDefinition, "CREATE TABLE first (a)");
    pHandle->recList(jRows, jRows);
    g_fnLibraryRow = testhost::LastRowCallback();
    ModelTypes(jDefinition, strName);
}

}  // namespace campaign
