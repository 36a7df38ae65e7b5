// Model check: random sequences of all public operations, run against the library and against the
// model; results, arguments, message slot and stored rows are compared after each step.

#include <ctime>
#include <memory>

#include "model/Generator.h"
#include "model/Model.h"
#include "support/Operations.h"

namespace campaign {

namespace {

constexpr int kBatch = 200;

struct Pair {
    VornJsonDbApi* pLibrary;
    Model* pModel;
    Generator& generator;
    Random& random;
};

// One call of both sides: each gets its own copy of the arguments.
struct Row {
    const char* szName;
    int nWeight;
    void (*pfnPrepare)(Pair&, Arguments&);
    int (*pfnLibrary)(VornJsonDbApi&, Arguments&);
    int (*pfnModel)(Model&, Arguments&);
};

using Lib = VornJsonDbApi;
using Args = Arguments;

// ---- arguments: vecValues also carries small numbers, written as texts --------------------------

void Nothing(Pair&, Args&) {}

void OneRecord(Pair& p, Args& a) {
    a.jFirst = p.generator.Record();
    a.jSecond = p.generator.AnyValue();
    a.strFirst = "text so far " + std::string(p.random.OneIn(20) ? "%" : "");
    a.vecValues = {p.random.OneIn(2) ? "1" : ""};
}

void OneQuery(Pair& p, Args& a) {
    a.jFirst = p.generator.Query();
    a.jSecond = p.random.OneIn(12)  ? p.generator.AnyValue()
                : p.random.OneIn(2) ? Json::Value()
                                    : Json::Value(Json::arrayValue);
    if (p.random.OneIn(5) && a.jSecond.isArray()) {
        a.jSecond.append("before");
    }
    a.strFirst = p.random.OneIn(3) ? "text so far" : "";
    a.vecValues = {std::to_string(p.random.OneIn(8) ? p.random.Below(9) - 4 : p.random.Below(3))};
}

void QueryForOne(Pair& p, Args& a) {
    OneQuery(p, a);
    if (!p.random.OneIn(10)) {
        a.jSecond = p.random.OneIn(2) ? Json::Value() : p.generator.Record();
    }
}

void OneChange(Pair& p, Args& a) {
    a.jFirst = p.generator.Query();
    a.jSecond = p.generator.Changes();
    a.strFirst = p.random.OneIn(15) ? "" : p.generator.Condition();
}

void OneValue(Pair& p, Args& a) {
    a.jFirst = p.generator.AnyValue();
    a.strFirst = p.generator.MemberName();
    a.strSecond = p.random.OneIn(2) ? "before " : "";
}

void KeyAndValues(Pair& p, Args& a) {
    a.strFirst = p.generator.MemberName();
    a.strSecond = p.generator.Text();
    for (int i = p.random.OneIn(4) ? p.random.Below(4) : 1; i > 0; --i) {
        a.vecValues.push_back(p.generator.Text());
    }
    a.jFirst = p.random.OneIn(2) ? Json::Value() : p.generator.Record();
}

void OneStatement(Pair& p, Args& a) {
    a.strFirst = p.generator.Statement();
}

void TwoValues(Pair& p, Args& a) {
    a.jFirst = p.generator.Record();
    a.jSecond = p.random.OneIn(5) ? p.generator.AnyValue() : p.generator.Record();
    a.vecValues = {p.random.OneIn(2) ? "1" : ""};
}

void OneDefinition(Pair& p, Args& a) {
    a.jFirst = p.generator.Definition();
    a.strFirst = p.random.OneIn(8) ? "" : p.generator.TableName();
}

void OneTime(Pair& p, Args& a) {
    // Both ends are in range for 32 bits.
    a.vecValues = {std::to_string(p.random.Next() % 2147480000U),
                   std::to_string(p.random.Below(9))};
    a.strFirst = "before";
}

bool Flag(const Args& a) {
    return !a.vecValues[0].empty();
}

int Number(const Args& a, std::size_t i) {
    return static_cast<int>(std::stol(a.vecValues[i]));
}

const char* Key(const Args& a) {
    return a.strFirst == "z9" && a.vecValues.size() > 2 ? nullptr : a.strFirst.c_str();
}

int LibraryTypes(Lib&, Args& a) {
    a.jSecond = VORN_JSON_DB::recType(a.jFirst, a.strFirst);
    return 0;
}

int ModelTypesOf(Model&, Args& a) {
    a.jSecond = ModelTypes(a.jFirst, a.strFirst);
    return 0;
}

// The texts of now: the clock may step between two looks at it.
int LibraryNow(Lib&, Args& a) {
    const long nFirst = static_cast<long>(std::time(nullptr));
    const int nType = Number(a, 1);
    long nNow = 0;
    std::string strText = a.strFirst;
    const int nResult = VORN_JSON_DB::getTimeAfterNow(-Number(a, 1), strText, nType);
    VORN_JSON_DB::getTimeAfterNow(-Number(a, 1), nNow);
    const long nLast = static_cast<long>(std::time(nullptr));
    bool blRight = nNow >= nFirst - Number(a, 1) && nNow <= nLast - Number(a, 1);
    bool blText = nResult < 0 && strText == a.strFirst;
    for (long n = nFirst; n <= nLast; ++n) {
        std::string strWanted = a.strFirst;
        blText = blText || (ModelTimeText(n - Number(a, 1), strWanted, nType) == nResult &&
                            strWanted == strText);
    }
    blRight = blRight && blText;
    return blRight ? nResult : -99;
}

int ModelNow(Model&, Args& a) {
    std::string strText;
    return ModelTimeText(0, strText, Number(a, 1));
}

// clang-format off
const Row kRows[] = {
    {"tableCreate",          1, Nothing,      [](Lib& l, Args&) { return l.tableCreate(); },                                       [](Model& m, Args&) { return m.TableCreate(); }},
    {"setErrMsg",            2, KeyAndValues, [](Lib& l, Args& a) { l.setErrMsg(a.strSecond); return 0; },                         [](Model& m, Args& a) { m.strErrMsg = a.strSecond; return 0; }},
    {"runSqlEx",             5, OneStatement, [](Lib& l, Args& a) { return l.runSqlEx(a.strFirst); },                              [](Model& m, Args& a) { return m.RunSql(a.strFirst, nullptr); }},
    {"checkJsonType",        2, OneRecord,    [](Lib& l, Args& a) { return l.checkJsonType(a.jFirst); },                           [](Model& m, Args& a) { return m.Check(a.jFirst); }},
    {"fillDefaultValue",     2, OneRecord,    [](Lib& l, Args& a) { return l.fillDefaultValue(a.jFirst, Flag(a)); },               [](Model& m, Args& a) { return m.Fill(a.jFirst, Flag(a)); }},
    {"SqlExpandMemberName",  2, OneRecord,    [](Lib& l, Args& a) { return l.SqlExpandMemberName(a.strFirst, Flag(a) ? &a.jFirst : nullptr); }, [](Model& m, Args& a) { return m.Names(a.strFirst, Flag(a) ? &a.jFirst : nullptr); }},
    {"SqlExpandMemberSymbol", 4, OneRecord,   [](Lib& l, Args& a) { return l.SqlExpandMemberSymbol(a.strFirst, a.jFirst); },       [](Model& m, Args& a) { return m.Values(a.strFirst, a.jFirst); }},
    {"SqlMakeByMatchField",  3, OneValue,     [](Lib& l, Args& a) { return l.SqlMakeByMatchField(a.strFirst, a.jFirst, a.strSecond); }, [](Model& m, Args& a) { return m.Match(a.strFirst, a.jFirst, a.strSecond); }},
    {"SqlMakeByListField",   3, OneValue,     [](Lib& l, Args& a) { return l.SqlMakeByListField(Key(a), a.jFirst, a.strSecond); }, [](Model& m, Args& a) { return m.List(Key(a), a.jFirst, a.strSecond); }},
    {"SqlExpandMemberList",  4, OneQuery,     [](Lib& l, Args& a) { return l.SqlExpandMemberList(a.jFirst, a.strFirst, Number(a, 0)); }, [](Model& m, Args& a) { return m.Conditions(a.jFirst, a.strFirst, Number(a, 0)); }},
    {"SqlFilterConditionFromJson", 2, OneQuery, [](Lib& l, Args& a) { return l.SqlFilterConditionFromJson(a.jFirst, a.strFirst); }, [](Model&, Args& a) { return Model::Tail(a.jFirst, a.strFirst); }},
    {"recSave",              8, OneRecord,    [](Lib& l, Args& a) { return l.recSave(a.jFirst, Flag(a)); },                        [](Model& m, Args& a) { return m.RecSave(a.jFirst, Flag(a)); }},
    {"recCreate",           14, OneRecord,    [](Lib& l, Args& a) { return l.recCreate(a.jFirst, a.jSecond); },                    [](Model& m, Args& a) { return m.RecCreate(a.jFirst, a.jSecond); }},
    {"recCreate in place",   2, OneRecord,    [](Lib& l, Args& a) { return l.recCreate(a.jFirst, a.jFirst); },                     [](Model& m, Args& a) { const Json::Value jIn = a.jFirst; return m.RecCreate(jIn, a.jFirst); }},
    {"recList",              8, OneQuery,     [](Lib& l, Args& a) { return l.recList(a.jFirst, a.jSecond); },                      [](Model& m, Args& a) { return m.RecList(a.jFirst, a.jSecond); }},
    {"recGetOne",            5, QueryForOne,  [](Lib& l, Args& a) { return l.recGetOne(a.jFirst, a.jSecond); },                    [](Model& m, Args& a) { return m.RecGetOne(a.jFirst, a.jSecond); }},
    {"recUpdateByWhere",     4, OneChange,    [](Lib& l, Args& a) { return l.recUpdateByWhere(a.jSecond, a.strFirst); },           [](Model& m, Args& a) { return m.RecUpdateByWhere(a.jSecond, a.strFirst); }},
    {"recUpdateByFilter",    7, OneChange,    [](Lib& l, Args& a) { return l.recUpdateByFilter(a.jFirst, a.jSecond); },            [](Model& m, Args& a) { return m.RecUpdateByFilter(a.jFirst, a.jSecond); }},
    {"recDelete",            3, OneChange,    [](Lib& l, Args& a) { return l.recDelete(a.jFirst); },                               [](Model& m, Args& a) { return m.RecDelete(a.jFirst, false); }},
    {"recDelete, all",       1, OneChange,    [](Lib& l, Args& a) { return l.recDelete(a.jFirst, true); },                         [](Model& m, Args& a) { return m.RecDelete(a.jFirst, true); }},
    {"recDeleteAll",         1, Nothing,      [](Lib& l, Args&) { return l.recDeleteAll(); },                                      [](Model& m, Args&) { return m.RecDelete(Json::Value(Json::objectValue), true); }},
    {"recDeleteByArray",     2, KeyAndValues, [](Lib& l, Args& a) { return l.recDeleteByArray(a.vecValues, Key(a)); },             [](Model& m, Args& a) { return m.RecDeleteByArray(a.vecValues, Key(a)); }},
    {"recDeleteByName",      3, KeyAndValues, [](Lib& l, Args& a) { return l.recDeleteByName(a.strSecond, Key(a)); },              [](Model& m, Args& a) { return m.RecDeleteByName(a.strSecond, Key(a)); }},
    {"VectorParamToJson",    1, KeyAndValues, [](Lib& l, Args& a) { return l.VectorParamToJson(a.vecValues, Key(a), a.jFirst); },  [](Model&, Args& a) { return Model::ToList(a.vecValues, Key(a), a.jFirst); }},
    {"recType",              2, OneDefinition, LibraryTypes,                                                                       ModelTypesOf},
    {"jsonCopyMember",       2, TwoValues,    [](Lib&, Args& a) { return VORN_JSON_DB::jsonCopyMember(a.jFirst, a.jSecond, Flag(a)); }, [](Model&, Args& a) { return ModelCopyMember(a.jFirst, a.jSecond, Flag(a)); }},
    {"convert2ReadableTime", 2, OneTime,      [](Lib&, Args& a) { return VORN_JSON_DB::convert2ReadableTime(Number(a, 0), a.strFirst, Number(a, 1)); }, [](Model&, Args& a) { return ModelTimeText(Number(a, 0), a.strFirst, Number(a, 1)); }},
    {"getTimeAfterNow",      1, OneTime,      LibraryNow,                                                                          ModelNow},
};
// clang-format on

const Row& Choose(Random& random) {
    int nSum = 0;
    for (const Row& row : kRows) {
        nSum += row.nWeight;
    }
    int n = random.Below(nSum);
    const Row* pRow = kRows;
    for (; n >= pRow->nWeight; ++pRow) {
        n -= pRow->nWeight;
    }
    return *pRow;
}

// ---- one sequence -------------------------------------------------------------------------------

class Sequence {
  public:
    explicit Sequence(std::uint64_t nSeed)
        : m_nSeed(nSeed), m_random(nSeed), m_generator(m_random, "t" + std::to_string(nSeed)) {
        AddHandle();
    }

    void Run() {
        const int nSteps = 10 + m_random.Below(20);
        for (m_nStep = 0; m_nStep < nSteps && m_blSame; ++m_nStep) {
            if (m_random.OneIn(25)) {
                AddHandle();
            }
            Step();
        }
        ++Figure("sequences");
    }

  private:
    // Another handle may bring another definition of the same table: the first one counts.
    void AddHandle() {
        std::string strName = m_generator.TableName();
        Json::Value jDefinition = m_generator.Definition();
        std::string strCreate = m_generator.Create();
        m_pLibrary = std::make_unique<Lib>(m_dbLibrary.Get(), strName, jDefinition, strCreate);
        m_pModel = std::make_unique<Model>(m_dbModel.Get(), strName, jDefinition, strCreate);
    }

    // SQLite guesses a key at random when the largest one is taken: both sides guess alike.
    void SameLuck() const {
        sqlite3_test_control(SQLITE_TESTCTRL_PRNG_SEED, 4711 + m_nStep, nullptr);
        sqlite3_randomness(0, nullptr);
    }

    void Step() {
        const Row& row = Choose(m_random);
        Pair pair = {m_pLibrary.get(), m_pModel.get(), m_generator, m_random};
        Arguments argsBefore;
        row.pfnPrepare(pair, argsBefore);
        Arguments argsLibrary = argsBefore;
        Arguments argsModel = argsBefore;
        SameLuck();
        const int nModel = row.pfnModel(*m_pModel, argsModel);
        SameLuck();
        int nLibrary = -99;
        std::string strThrown;
        try {
            nLibrary = row.pfnLibrary(*m_pLibrary, argsLibrary);
        } catch (const std::exception& e) {
            strThrown = std::string(", threw ") + e.what();
        }
        ++Figure("steps");
        Figure("steps that failed as they should") += nModel < 0 ? 1 : 0;
        const std::string strRows = "SELECT rowid, * FROM " + m_generator.TableName();
        const std::string strLibrary = m_dbLibrary.Rows(strRows);
        const std::string strModel = m_dbModel.Rows(strRows);
        m_blSame = nLibrary == nModel && argsLibrary == argsModel && strLibrary == strModel &&
                   m_pLibrary->getErrMsg() == m_pModel->strErrMsg;
        Expect(m_blSame, [&] {
            return "sequence " + std::to_string(m_nSeed) + ", step " + std::to_string(m_nStep) +
                   ", " + row.szName + strThrown + "\n  arguments " + ToText(argsBefore.AsJson()) +
                   "\n  library   " + std::to_string(nLibrary) + " " +
                   ToText(argsLibrary.AsJson()) + " [" + m_pLibrary->getErrMsg() + "] " +
                   strLibrary + "\n  model     " + std::to_string(nModel) + " " +
                   ToText(argsModel.AsJson()) + " [" + m_pModel->strErrMsg + "] " + strModel +
                   "\n  table     " + m_generator.Create();
        });
    }

    std::uint64_t m_nSeed;
    Random m_random;
    Generator m_generator;
    Database m_dbLibrary;
    Database m_dbModel;
    std::unique_ptr<Lib> m_pLibrary;
    std::unique_ptr<Model> m_pModel;
    int m_nStep = 0;
    bool m_blSame = true;
};

int RunModelCampaign(const Options& options) {
    setenv("TZ", "XXX-1", 1);
    tzset();
    for (const char* szFigure : {"sequences", "steps", "steps that failed as they should"}) {
        Figure(szFigure);
    }
    const int nSequences = options.Count(200, 10000);
    // The type cache grows with each sequence, and a failed look-up logs it as a whole: a process
    // runs a part of them.
    for (int nFirst = 0; nFirst < nSequences; nFirst += kBatch) {
        InChild("sequences from " + std::to_string(nFirst), [&] {
            for (int i = nFirst; i < nFirst + kBatch && i < nSequences; ++i) {
                // The printed number of a sequence is the seed that runs it alone.
                Sequence(options.nSeed + static_cast<std::uint64_t>(i)).Run();
            }
        });
    }
    return Finish("model");
}

}  // namespace

}  // namespace campaign

int main(int argc, char** argv) {
    return campaign::RunModelCampaign(campaign::ParseOptions(argc, argv, "model"));
}
