// Queries and conditions as plain data.

#include <VornJsonDbTable.h>

#include <memory>
#include <utility>

#include "ConditionNode.h"
#include "QueryParser.h"

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

}  // namespace

Condition::Condition(std::string strMember, Json::Value jValue)
    : m_pNode(Leaf(strMember, Op::kEqual, jValue)) {}

Condition::Condition(std::string strMember, Op eOp, Json::Value jOperand)
    : m_pNode(Leaf(strMember, eOp, jOperand)) {}

// Here, and not at each place that has one.
Query::Query() = default;
Query::~Query() = default;
Query::Query(const Query& Other) = default;
Query::Query(Query&& Other) noexcept = default;
Query& Query::operator=(const Query& Other) = default;
Query& Query::operator=(Query&& Other) noexcept = default;

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
    // As AddText makes a list longer.
    vecSort.emplace_back();
    vecSort.back() = std::move(strTerm);
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
