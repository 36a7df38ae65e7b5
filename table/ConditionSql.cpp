#include "ConditionSql.h"

#include <algorithm>
#include <limits>
#include <utility>

#include "Concat.h"

namespace vornjsondb {

namespace {

using VORN_JSON_DB::Condition;
using Node = Condition::Node;
using Kind = Node::Kind;

// SQLite looks for indexes in all that is joined by AND and OR, however nested, and multiplies what
// it finds: a few hundred conditions keep it busy for minutes. IS TRUE behind a group hides what is
// inside. What is small is left open, so that indexes serve it; of more than kFewLeaves two levels
// of groups, of more than kSomeLeaves one.
constexpr size_t kFewLeaves = 16;
constexpr size_t kSomeLeaves = 100;
constexpr size_t kOpenParts = 60;

int OpenLevels(size_t nLeaves) {
    if (nLeaves <= kFewLeaves) {
        return std::numeric_limits<int>::max();
    }
    return nLeaves <= kSomeLeaves ? 2 : 1;
}

// Longer chains would exceed SQLite's depth of expressions.
constexpr size_t kChain = 8;

void AddNodes(const std::vector<Condition>& vecParts, std::vector<const Node*>& vecNodes) {
    for (const Condition& Part : vecParts) {
        vecNodes.push_back(&Part.Root());
    }
}

class ConditionWriter {
  public:
    ConditionWriter(const Members& Of, JsonCodec& Codec, bool blChange, size_t nLeaves,
                    BoundSql& Out, FindingList& vecFindings)
        : m_Leaf(Of, Codec, Out),
          m_blChange(blChange),
          m_nOpenLevels(OpenLevels(nLeaves)),
          m_strSql(Out.strSql),
          m_vecFindings(vecFindings) {}

    // blOpen: SQLite looks into it.
    void WriteGroup(std::vector<const Node*> vecNodes, Kind eKind, int nLevel, bool blOpen) {
        // mutate(exchanged): to look for the deepest changes nothing.
        if (vecNodes.size() == 1) {
            Write(*vecNodes[0], nLevel, blOpen, nullptr);
            return;
        }
        // The deepest part goes first: there it costs SQLite's parser least.
        const auto itDeepest = std::max_element(
            vecNodes.begin(), vecNodes.end(),
            [](const Node* pLeft, const Node* pRight) { return pLeft->nLevels < pRight->nLevels; });
        const Node* pDeepest = *itDeepest;
        std::move_backward(vecNodes.begin(), itDeepest, itDeepest + 1);
        vecNodes.front() = pDeepest;
        const Chain All{vecNodes, eKind == Kind::kAll ? " AND " : " OR ", nLevel + 1, blOpen};
        const size_t nParts = vecNodes.size();
        const size_t nOpen = blOpen && eKind == Kind::kAll ? std::min(nParts, kOpenParts) : nParts;
        const size_t nFirst = vecNodes[0]->nLevels > 0 ? 1 : nOpen;
        WriteChain(All, 0, nFirst);
        WriteRest(All, nFirst, nOpen, ")");
        WriteRest(All, nOpen, nParts, ") IS TRUE");
    }

    void WriteOne(const Node& Leaf) { WriteLeaf(Leaf); }

  private:
    struct Chain {
        const std::vector<const Node*>& vecNodes;
        const char* szJoiner;
        int nLevel;
        bool blOpen;
    };

    // Parts nFrom to nTo; many of them as a tree of chains.
    void WriteChain(const Chain& Of, size_t nFrom, size_t nTo) {
        if (nTo - nFrom > kChain) {
            const size_t nMiddle = nFrom + (nTo - nFrom) / 2;
            m_strSql += '(';
            WriteChain(Of, nFrom, nMiddle);
            m_strSql += ')';
            WriteRest(Of, nMiddle, nTo, ")");
            return;
        }
        for (size_t i = nFrom; i < nTo; ++i) {
            m_strSql += i > nFrom ? Of.szJoiner : "";
            Write(*Of.vecNodes[i], Of.nLevel, Of.blOpen, nullptr);
        }
    }

    void WriteRest(const Chain& Of, size_t nFrom, size_t nTo, const char* szClose) {
        if (nFrom < nTo) {
            const bool blOne = nTo - nFrom == 1;
            m_strSql += Of.szJoiner;
            m_strSql += blOne ? "" : "(";
            WriteChain(Of, nFrom, nTo);
            m_strSql += blOne ? "" : szClose;
        }
    }

    // szClose: in parentheses, and with this behind; nullptr: as it needs to be.
    void Write(const Node& What, int nLevel, bool blOpen, const char* szClose) {
        const bool blHidden = blOpen && nLevel > m_nOpenLevels;
        const bool blGroup = What.eKind == Kind::kAll || What.eKind == Kind::kAny;
        if (blGroup && szClose == nullptr) {
            szClose = blHidden ? ") IS TRUE" : ")";
        }
        m_strSql += szClose != nullptr ? "(" : "";
        if (What.eKind == Kind::kLeaf) {
            WriteLeaf(What);
        } else if (What.eKind == Kind::kNot) {
            Write(What.vecParts[0].Root(), nLevel, false, ") IS NOT TRUE");
        } else if (What.eKind == Kind::kTooDeep) {
            Report(m_vecFindings, FindingCode::kNestedTooDeep, "/where",
                   "the conditions are nested too deep");
        } else if (What.vecParts.empty()) {
            Report(m_vecFindings, FindingCode::kEmptyGroup, "/where", "a group holds no condition");
        } else {
            std::vector<const Node*> vecNodes;
            AddNodes(What.vecParts, vecNodes);
            WriteGroup(std::move(vecNodes), What.eKind, nLevel, blOpen && !blHidden);
        }
        m_strSql += szClose != nullptr ? szClose : "";
    }

    void WriteLeaf(const Node& Leaf) {
        Problem Why;
        if (!m_Leaf.Write(Leaf, Why)) {
            Report(m_vecFindings, Why.eCode, Concat({PathOf(Leaf), Why.strStep}), Why.strMessage);
        } else if (m_blChange && Leaf.eOp == VORN_JSON_DB::Op::kNotIn && Leaf.jOperand.empty()) {
            Report(m_vecFindings, FindingCode::kEmptyNin, PathOf(Leaf),
                   "\"$nin\" of no values is true for every record");
        }
    }

    static std::string PathOf(const Node& Leaf) {
        if (!Leaf.strPath.empty()) {
            return Leaf.strPath;
        }
        const std::string strMember = Below("/where", Leaf.strMember);
        const bool blNamed = Leaf.eOp != VORN_JSON_DB::Op::kEqual && IsOperator(Leaf.eOp);
        return blNamed ? Below(strMember, RowOf(Leaf.eOp).szName) : strMember;
    }

    LeafSql m_Leaf;
    bool m_blChange;
    int m_nOpenLevels;
    std::string& m_strSql;
    FindingList& m_vecFindings;
};

}  // namespace

void AppendConditions(const std::vector<Condition>& vecWhere, const Members& Of, JsonCodec& Codec,
                      bool blChange, BoundSql& Out, FindingList& vecFindings) {
    // One condition needs no list.
    if (vecWhere.size() == 1 && vecWhere[0].Root().eKind == Kind::kLeaf) {
        ConditionWriter(Of, Codec, blChange, 1, Out, vecFindings).WriteOne(vecWhere[0].Root());
        return;
    }
    size_t nLeaves = 0;
    std::vector<const Node*> vecNodes;
    vecNodes.reserve(vecWhere.size());
    for (const Condition& Each : vecWhere) {
        // mutate(exchanged): in any order.
        nLeaves += Each.Root().nLeaves;
        // All of all is all: one chain, whoever grouped it.
        if (Each.Root().eKind == Kind::kAll && !Each.Root().vecParts.empty()) {
            AddNodes(Each.Root().vecParts, vecNodes);
        } else {
            vecNodes.push_back(&Each.Root());
        }
    }
    if (nLeaves > kMaxConditions) {
        Report(vecFindings, FindingCode::kTooManyConditions, "/where",
               "the query has more than 1000 conditions");
    } else if (!vecWhere.empty()) {
        ConditionWriter(Of, Codec, blChange, nLeaves, Out, vecFindings)
            .WriteGroup(std::move(vecNodes), Kind::kAll, 1, true);
    }
}

}  // namespace vornjsondb
