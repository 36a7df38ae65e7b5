#include "IndexAdvice.h"

#include "LeafSql.h"

namespace vornjsondb {

namespace {

using VORN_JSON_DB::Condition;
using VORN_JSON_DB::Op;
using Node = Condition::Node;

// Others are true for most records, for none, or for what no order of values brings together.
bool IsFoundByIndex(const Node& Leaf, const Members& Of, JsonCodec& Codec) {
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
        default: {
            BoundSql Sql;
            Problem None;
            LeafSql(Of, Codec, Sql).Write(Leaf, None);
            // JSON's true within a value is neither a number nor a text, which an index has.
            // mutate(exchanged): all of them only look.
            return !Sql.blNoIndex && (!Leaf.jOperand.isBool() ||
                                      Leaf.strMember.find_first_of(".[") == std::string::npos);
        }
    }
}

bool Advise(const Node& Where, const Members& Of, JsonCodec& Codec,
            std::vector<std::string>& vecMembers);

// One of the parts is enough where all must hold, and each is needed where any may.
bool AdviseGroup(const Node& Where, const Members& Of, JsonCodec& Codec,
                 std::vector<std::string>& vecMembers) {
    const bool blAny = Where.eKind == Node::Kind::kAny;
    for (const Condition& Part : Where.vecParts) {
        std::vector<std::string> vecOfPart;
        const bool blPart = Advise(Part.Root(), Of, Codec, vecOfPart);
        if (blPart) {
            vecMembers.insert(vecMembers.end(), vecOfPart.begin(), vecOfPart.end());
        }
        if (blPart != blAny) {
            return blPart;
        }
    }
    return blAny;
}

bool Advise(const Node& Where, const Members& Of, JsonCodec& Codec,
            std::vector<std::string>& vecMembers) {
    switch (Where.eKind) {
        case Node::Kind::kLeaf:
            if (IsFoundByIndex(Where, Of, Codec)) {
                vecMembers.push_back(Where.strMember);
            }
            return !vecMembers.empty();
        case Node::Kind::kAll:
        case Node::Kind::kAny:
            return AdviseGroup(Where, Of, Codec, vecMembers);
        default:
            return false;
    }
}

}  // namespace

std::vector<std::string> IndexAdvice(const VORN_JSON_DB::Query& Which, const Members& Of,
                                     JsonCodec& Codec) {
    std::vector<std::string> vecMembers;
    for (const Condition& Part : Which.vecWhere) {
        if (Advise(Part.Root(), Of, Codec, vecMembers)) {
            return vecMembers;
        }
        vecMembers.clear();
    }
    return vecMembers;
}

}  // namespace vornjsondb
