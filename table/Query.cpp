// Queries and conditions as plain data.

#include <VornJsonDbTable.h>

#include <algorithm>
#include <memory>
#include <utility>

#include "ConditionNode.h"
#include "QueryParser.h"

namespace vornjsondb {

bool IsTooDeep(const Json::Value& jValue) {
    using Iterator = Json::Value::const_iterator;
    if (!jValue.isArray() && !jValue.isObject()) {
        return false;
    }
    std::vector<std::pair<Iterator, Iterator>> vecOpen;  // lists and objects, each inside the last
    const Json::Value* pjNext = &jValue;
    while (true) {
        // mutate(sunk): what has no elements is closed at once.
        if ((pjNext->isArray() || pjNext->isObject()) && !pjNext->empty()) {
            if (vecOpen.size() == kMaxLevels) {
                return true;
            }
            vecOpen.emplace_back(pjNext->begin(), pjNext->end());
        }
        while (!vecOpen.empty() && vecOpen.back().first == vecOpen.back().second) {
            vecOpen.pop_back();
        }
        if (vecOpen.empty()) {
            return false;
        }
        pjNext = &*vecOpen.back().first;
        ++vecOpen.back().first;
    }
}

}  // namespace vornjsondb

namespace VORN_JSON_DB {

namespace {

using Node = Condition::Node;

// Takes what it is given.
std::shared_ptr<const Node> Leaf(std::string& strMember, Op eOp, Json::Value& jOperand) {
    auto pNode = std::make_shared<Node>();
    pNode->eOp = eOp;
    // mutate(exchanged): in any order.
    pNode->strMember = std::move(strMember);
    // mutate(sunk): nobody looks into what is too deep.
    if (vornjsondb::IsTooDeep(jOperand)) {
        pNode->eKind = Node::Kind::kTooDeep;
    } else {
        pNode->jOperand.swapPayload(jOperand);
    }
    return pNode;
}

// Parts of the group's own kind give it their parts, so that trees are as flat as they can be.
Condition Group(Node::Kind eKind, std::vector<Condition> vecParts) {
    if (vecParts.size() == 1 && eKind != Node::Kind::kNot) {
        return std::move(vecParts[0]);
    }
    auto pNode = std::make_shared<Node>();
    pNode->eKind = eKind;
    pNode->nLeaves = 0;
    for (Condition& Part : vecParts) {
        const Node& Each = Part.Root();
        const bool blSame = Each.eKind == eKind && eKind != Node::Kind::kNot;
        pNode->nLeaves += Each.nLeaves;
        // mutate(exchanged): the part is the same wherever it has been moved.
        pNode->nLevels = std::max(pNode->nLevels, Each.nLevels + (blSame ? 0 : 1));
        if (blSame) {
            for (Condition Inner : Each.vecParts) {
                pNode->vecParts.push_back(std::move(Inner));
            }
        } else {
            pNode->vecParts.push_back(std::move(Part));
        }
    }
    if (pNode->nLevels > vornjsondb::kMaxLevels) {
        *pNode = Node();
        pNode->eKind = Node::Kind::kTooDeep;
    }
    return Condition(std::move(pNode));
}

}  // namespace

Condition::Condition(std::string strMember, Json::Value jValue)
    : m_pNode(Leaf(strMember, Op::kEqual, jValue)) {}

Condition::Condition(std::string strMember, Op eOp, Json::Value jOperand)
    : m_pNode(Leaf(strMember, eOp, jOperand)) {}

Condition Condition::All(std::vector<Condition> vecParts) {
    return Group(Node::Kind::kAll, std::move(vecParts));
}

Condition Condition::Any(std::vector<Condition> vecParts) {
    return Group(Node::Kind::kAny, std::move(vecParts));
}

Condition Condition::Not(Condition Part) {
    std::vector<Condition> vecParts;
    vecParts.push_back(std::move(Part));
    return Group(Node::Kind::kNot, std::move(vecParts));
}

Query::Query(const Json::Value& jQuery) : Query(vornjsondb::ParseQuery(jQuery, false)) {}

Query Query::ValuesOnly(const Json::Value& jQuery) {
    return vornjsondb::ParseQuery(jQuery, true);
}

Query& Query::Where(Condition Added) & {
    vecWhere.push_back(std::move(Added));
    return *this;
}

Query& Query::Where(std::string strMember, Json::Value jValue) & {
    return Take(strMember, Op::kEqual, jValue);
}

Query& Query::Where(std::string strMember, Op eOp, Json::Value jOperand) & {
    return Take(strMember, eOp, jOperand);
}

// A condition of what it is given.
Query& Query::Take(std::string& strMember, Op eOp, Json::Value& jOperand) {
    vecWhere.emplace_back(Leaf(strMember, eOp, jOperand));
    return *this;
}

Query& Query::Sort(std::string strTerm) & {
    vecSort.push_back(std::move(strTerm));
    return *this;
}

Query& Query::Limit(std::int64_t nRows) & {
    nLimit = nRows;
    return *this;
}

Query& Query::Offset(std::int64_t nRows) & {
    nOffset = nRows;
    return *this;
}

Query& Query::Members(std::vector<std::string> vecNames) & {
    vecMembers = std::move(vecNames);
    return *this;
}

std::string EscapeLike(std::string_view strText) {
    std::string strEscaped;
    for (const char c : strText) {
        if (c == '%' || c == '_' || c == '\\') {
            strEscaped += '\\';
        }
        strEscaped += c;
    }
    return strEscaped;
}

}  // namespace VORN_JSON_DB
