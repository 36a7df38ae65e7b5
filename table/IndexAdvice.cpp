#include "IndexAdvice.h"

#include "ConditionNode.h"

namespace vornjsondb {

namespace {

using VORN_JSON_DB::Condition;
using VORN_JSON_DB::Op;
using Node = Condition::Node;

// Others are true for most records, for none, or for what no order of values brings together.
bool IsFoundByIndex(const Node& Leaf) {
    switch (Leaf.eOp) {
        case Op::kNotEqual:
        case Op::kNotIn:
        case Op::kLike:
        case Op::kContains:
            return false;
        case Op::kNull:
            return Leaf.jOperand.asBool();
        case Op::kIn:
            return !Leaf.jOperand.empty();
        default:
            // JSON's true within a value is neither a number nor a text, which an index has.
            return !Leaf.jOperand.isBool() ||
                   Leaf.strMember.find_first_of(".[") == std::string::npos;
    }
}

bool Advise(const Node& Of, std::vector<std::string>& vecMembers);

// One of the parts is enough where all must hold, and each is needed where any may.
bool AdviseGroup(const Node& Of, std::vector<std::string>& vecMembers) {
    const bool blAny = Of.eKind == Node::Kind::kAny;
    for (const Condition& Part : Of.vecParts) {
        std::vector<std::string> vecOfPart;
        const bool blPart = Advise(Part.Root(), vecOfPart);
        if (blPart) {
            vecMembers.insert(vecMembers.end(), vecOfPart.begin(), vecOfPart.end());
        }
        if (blPart != blAny) {
            return blPart;
        }
    }
    return blAny;
}

bool Advise(const Node& Of, std::vector<std::string>& vecMembers) {
    switch (Of.eKind) {
        case Node::Kind::kLeaf:
            if (IsFoundByIndex(Of)) {
                vecMembers.push_back(Of.strMember);
            }
            return !vecMembers.empty();
        case Node::Kind::kAll:
        case Node::Kind::kAny:
            return AdviseGroup(Of, vecMembers);
        default:
            return false;
    }
}

}  // namespace

std::vector<std::string> IndexAdvice(const VORN_JSON_DB::Query& Which) {
    std::vector<std::string> vecMembers;
    for (const Condition& Part : Which.vecWhere) {
        if (Advise(Part.Root(), vecMembers)) {
            return vecMembers;
        }
        vecMembers.clear();
    }
    return vecMembers;
}

}  // namespace vornjsondb
