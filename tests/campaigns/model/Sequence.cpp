#include "Sequence.h"

#include <functional>
#include <memory>

#include "Side.h"
#include "Steps.h"

namespace campaign {

namespace {

constexpr const char kSequences[] = "sequences";
constexpr const char kSteps[] = "steps";
constexpr const char kFailed[] = "steps that failed as they should";
constexpr const char kLines[] = "log lines compared";
constexpr const char kStatements[] = "statements compared";
constexpr const char kPauses[] = "pauses compared";
constexpr const char kFaults[] = "faults injected";

// So that there is something to find and to change.
constexpr int kFirstRecords = 3;

struct Table {
    std::unique_ptr<Generator> pGenerator;
    std::string strRows;  // the statement that reads them
};

// The same handle on both sides.
struct Pair {
    Table* pTable = nullptr;
    bool blConnected = true;
    std::unique_ptr<VornJsonDbApi> pLibrary;
    std::unique_ptr<Model> pModel;
};

class Sequence {
  public:
    explicit Sequence(std::uint64_t nSeed) : m_nSeed(nSeed), m_random(nSeed) {
        AddTable();
        AddPair();
    }

    void Run() {
        const int nSteps = 12 + m_random.Below(20);
        for (m_nStep = 0; m_nStep < nSteps && m_blSame; ++m_nStep) {
            if (m_random.OneIn(15)) {
                AddTable();
                AddPair();
            } else if (m_random.OneIn(20)) {
                AddPair();
            } else {
                Step();
            }
        }
        ++Figure(kSequences);
    }

  private:
    void AddTable() {
        const std::string strName =
            "t" + std::to_string(m_nSeed) + "_" + std::to_string(m_vecTables.size());
        m_vecTables.push_back(std::make_unique<Table>());
        Table& table = *m_vecTables.back();
        table.pGenerator = std::make_unique<Generator>(m_random, strName);
        table.strRows = "SELECT rowid, * FROM " + table.pGenerator->NameInSql();
    }

    // Another handle may bring another definition of the same table: the first one counts.
    void AddPair() {
        Pair pair;
        pair.pTable = m_vecTables[Last(m_vecTables.size())].get();
        Generator& generator = *pair.pTable->pGenerator;
        std::string strName = generator.TableName();
        std::string strCreate = generator.Create();
        Json::Value jDefinition = generator.Definition();
        if (m_random.OneIn(25)) {  // a handle that lacks several things at once
            pair.blConnected = m_random.OneIn(2);
            strName = m_random.OneIn(2) ? strName : "";
            strCreate = m_random.OneIn(2) ? strCreate : "";
            jDefinition = m_random.OneIn(2) ? FromText(R"({"":{"member":{"a":{"cpptype":"int"}}}})")
                                            : Json::Value(m_random.OneIn(2) ? Json::nullValue
                                                                            : Json::objectValue);
        }
        sqlite3* const pDbLibrary = pair.blConnected ? m_dbLibrary.Get() : nullptr;
        sqlite3* const pDbModel = pair.blConnected ? m_dbModel.Get() : nullptr;
        const Plan plan = m_random.OneIn(2) ? Plan() : AnyPlan(m_random, pair.blConnected);
        const Difference difference = Both(
            plan,
            [&] {
                pair.pLibrary =
                    std::make_unique<VornJsonDbApi>(pDbLibrary, strName, jDefinition, strCreate);
                return 0;
            },
            [&] {
                pair.pModel = std::make_unique<Model>(pDbModel, strName, jDefinition, strCreate);
                return 0;
            });
        Tell(difference, plan, [&] { return "constructor\n  given     " + ToText(jDefinition); });
        m_vecPairs.push_back(std::move(pair));
    }

    void Step() {
        const Pair& pair = m_vecPairs[Last(m_vecPairs.size())];
        const bool blFirst = m_nStep < kFirstRecords;
        const StepKind& kind = blFirst ? FirstStep() : AnyStep(m_random);
        Given before;
        kind.pfnPrepare(*pair.pTable->pGenerator, m_random, before);
        const Plan plan = blFirst ? Plan() : AnyPlan(m_random, pair.blConnected);
        Given ofLibrary = before;
        Given ofModel = before;
        Difference difference = Both(
            plan, [&] { return kind.pfnLibrary(*pair.pLibrary, ofLibrary); },
            [&] { return kind.pfnModel(*pair.pModel, ofModel); });
        if (difference.IsNone() && !(ofLibrary == ofModel)) {
            difference = {"arguments", ofLibrary.Text(), ofModel.Text()};
        }
        if (difference.IsNone()) {
            difference =
                Compared("message slot", pair.pLibrary->getErrMsg(), pair.pModel->strErrMsg);
        }
        Tell(difference, plan,
             [&] { return std::string(kind.szName) + "\n  given     " + before.Text(); });
    }

    // Mostly the last one.
    std::size_t Last(std::size_t nCount) {
        return m_random.OneIn(3) ? static_cast<std::size_t>(m_random.Next() % nCount) : nCount - 1;
    }

    Difference Both(const Plan& plan, const std::function<int()>& fnLibrary,
                    const std::function<int()>& fnModel) const {
        SameLuck();
        const int nModel = OnModel(plan, fnModel);
        const Seen& wanted = Host().Result();
        SameLuck();
        Side library;
        OnLibrary(plan, fnLibrary, library);
        ++Figure(kSteps);
        Figure(kFailed) += nModel < 0 ? 1 : 0;
        Figure(kLines) += wanted.vecLines.size();
        Figure(kStatements) += wanted.vecStatements.size();
        Figure(kPauses) += wanted.vecPauses.size();
        Figure(kFaults) += static_cast<std::uint64_t>(Host().FaultsUsed());
        Difference difference = FirstDifference(library, wanted);
        if (difference.IsNone()) {
            difference = Compared("result", library.Result(), std::to_string(nModel));
        }
        for (const auto& pTable : m_vecTables) {
            if (difference.IsNone()) {
                difference = Compared("rows", m_dbLibrary.Rows(pTable->strRows),
                                      m_dbModel.Rows(pTable->strRows));
            }
        }
        return difference;
    }

    // SQLite guesses a key at random when the largest one is taken: both sides guess alike.
    void SameLuck() const {
        sqlite3_test_control(SQLITE_TESTCTRL_PRNG_SEED, 4711 + m_nStep, nullptr);
        sqlite3_randomness(0, nullptr);
    }

    void Tell(const Difference& difference, const Plan& plan,
              const std::function<std::string()>& fnStep) {
        m_blSame = Expect(difference.IsNone(), [&] {
            return "sequence " + std::to_string(m_nSeed) + ", step " + std::to_string(m_nStep) +
                   ", " + fnStep() + "\n  plan      " + TextOf(plan) + "\n  differs   " +
                   difference.strWhat + "\n  library   " + difference.strLibrary +
                   "\n  model     " + difference.strModel;
        });
    }

    std::uint64_t m_nSeed;
    Random m_random;
    Database m_dbLibrary;
    Database m_dbModel;
    std::vector<std::unique_ptr<Table>> m_vecTables;
    std::vector<Pair> m_vecPairs;
    int m_nStep = -1;
    bool m_blSame = true;
};

}  // namespace

void NameSequenceFigures() {
    for (const char* szFigure :
         {kSequences, kSteps, kFailed, kLines, kStatements, kPauses, kFaults}) {
        Figure(szFigure);
    }
}

void RunSequence(std::uint64_t nSeed) {
    Sequence(nSeed).Run();
}

}  // namespace campaign
