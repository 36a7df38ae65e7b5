// The conditions of the JSON notation.

#include <memory>
#include <utility>

#include "../src/base/JsonMember.h"
#include "../src/base/JsonMemory.h"
#include "Concat.h"
#include "ConditionNode.h"
#include "FindingCodes.h"
#include "Operators.h"
#include "QueryParser.h"

namespace vornjsondb {

namespace {

using VORN_JSON_DB::Condition;
using VORN_JSON_DB::Op;
using Conditions = std::vector<Condition>;

using MakeGroup = Condition (*)(Conditions);

// What one object says together must all hold.
Condition NotAll(Conditions vecParts) {
    return Condition::Not(Condition::All(std::move(vecParts)));
}

struct GroupKey {
    const char* szKey;
    MakeGroup pfnMake;
    bool blList;  // of objects; else one object
};
constexpr GroupKey kGroupKeys[] = {
    {"$and", Condition::All, true}, {"$or", Condition::Any, true}, {"$not", NotAll, false}};

const GroupKey* FindGroupKey(std::string_view strKey) {
    for (const GroupKey& Each : kGroupKeys) {
        if (strKey == Each.szKey) {
            return &Each;
        }
    }
    return nullptr;
}

bool IsOperator(const MemberName& Name) {
    return Name.Length() > 0 && *Name.pBegin == '$';
}

Json::ArrayIndex CountOperators(const Json::Value& jValue) {
    Json::ArrayIndex nOperators = 0;
    if (jValue.isObject()) {
        const Json::Value::const_iterator itEnd = jValue.end();
        for (Json::Value::const_iterator it = jValue.begin(); it != itEnd; ++it) {
            nOperators += IsOperator(NameOf(it)) ? 1 : 0;
        }
    }
    return nOperators;
}

class WhereParser {
  public:
    WhereParser(bool blValuesOnly, FindingList& vecFindings)
        : m_blValuesOnly(blValuesOnly), m_vecFindings(vecFindings) {}

    // An object of conditions.
    Conditions Read(const Json::Value& jObject, const std::string& strPath, int nLevel) {
        Conditions vecOut;
        if (nLevel > kMaxLevels) {
            Report(m_vecFindings, FindingCode::kNestedTooDeep, strPath,
                   "the conditions are nested too deep");
            return vecOut;
        }
        // mutate(exchanged): what has no members has an end, too.
        if (!jObject.isObject()) {
            Report(m_vecFindings, FindingCode::kNotConditions, strPath,
                   Concat({"conditions are an object, not ", Shown(jObject)}));
            return vecOut;
        }
        const Json::Value::const_iterator itEnd = jObject.end();
        for (Json::Value::const_iterator it = jObject.begin(); it != itEnd; ++it) {
            const MemberName Name = NameOf(it);
            const std::string strKey(Name.View());
            const std::string strBelow = Below(strPath, strKey);
            const GroupKey* pGroup = FindGroupKey(strKey);
            if (!IsOperator(Name)) {
                ReadMember(strKey, *it, strBelow, nLevel, vecOut);
            } else if (m_blValuesOnly || pGroup == nullptr) {
                Refuse(strKey, strBelow);
            } else {
                ReadGroup(*pGroup, *it, strBelow, nLevel, vecOut);
            }
        }
        return vecOut;
    }

  private:
    void ReadMember(const std::string& strMember, const Json::Value& jValue,
                    const std::string& strPath, int nLevel, Conditions& vecOut) {
        if (CountOperators(jValue) == 0) {
            AddLeaf(strMember, Op::kEqual, jValue, strPath, vecOut);
        } else if (m_blValuesOnly) {
            Report(m_vecFindings, FindingCode::kOperatorRefused, strPath,
                   Concat({"the value of ", ShownText(strMember), " holds operators"}));
        } else {
            ReadOperators(strMember, jValue, strPath, nLevel, vecOut);
        }
    }

    // {"$gt": 1, "$not": {...}} below a member.
    void ReadOperators(const std::string& strMember, const Json::Value& jOperators,
                       const std::string& strPath, int nLevel, Conditions& vecOut) {
        const Json::ArrayIndex nOperators = CountOperators(jOperators);
        if (nOperators == 0 || nLevel > kMaxLevels) {
            Report(m_vecFindings,
                   nOperators == 0 ? FindingCode::kWrongOperand : FindingCode::kNestedTooDeep,
                   strPath,
                   Concat({"\"$not\" takes an object of operators, not ", Shown(jOperators)}));
            return;
        }
        if (nOperators < jOperators.size()) {
            Report(m_vecFindings, FindingCode::kMixedKeys, strPath,
                   "operators and members stand side by side");
            return;
        }
        const Json::Value::const_iterator itEnd = jOperators.end();
        for (Json::Value::const_iterator it = jOperators.begin(); it != itEnd; ++it) {
            const MemberName Name = NameOf(it);
            const std::string strKey(Name.View());
            const std::string strBelow = Below(strPath, strKey);
            if (const Operator* pRow = FindOperator(strKey)) {
                AddLeaf(strMember, pRow->eOp, *it, strBelow, vecOut);
            } else if (Name.Is("$not")) {
                Conditions vecParts;
                ReadOperators(strMember, *it, strBelow, nLevel + 1, vecParts);
                vecOut.push_back(NotAll(std::move(vecParts)));
            } else {
                Refuse(strKey, strBelow);
            }
        }
    }

    void ReadGroup(const GroupKey& Group, const Json::Value& jParts, const std::string& strPath,
                   int nLevel, Conditions& vecOut) {
        if (Group.blList && !jParts.isArray()) {
            Report(m_vecFindings, FindingCode::kNotConditions, strPath,
                   Concat({"this group is a list of conditions, not ", Shown(jParts)}));
            return;
        }
        if (IsEmpty(jParts, strPath)) {
            return;
        }
        if (!Group.blList) {
            vecOut.push_back(Group.pfnMake(Read(jParts, strPath, nLevel + 1)));
            return;
        }
        Conditions vecParts;
        for (Json::ArrayIndex i = 0; i < jParts.size(); ++i) {
            const std::string strBelow = Below(strPath, DigitsOf(i));
            // mutate(hoisted, sunk): a query with a finding does not run.
            if (!IsEmpty(jParts[i], strBelow)) {
                vecParts.push_back(Condition::All(Read(jParts[i], strBelow, nLevel + 1)));
            }
        }
        vecOut.push_back(Group.pfnMake(std::move(vecParts)));
    }

    // Left out, an empty group would select everything.
    bool IsEmpty(const Json::Value& jParts, const std::string& strPath) {
        const bool blEmpty = (jParts.isArray() || jParts.isObject()) && jParts.empty();
        if (blEmpty) {
            Report(m_vecFindings, FindingCode::kEmptyGroup, strPath,
                   "the group holds no condition");
        }
        return blEmpty;
    }

    void AddLeaf(const std::string& strMember, Op eOp, const Json::Value& jOperand,
                 const std::string& strPath, Conditions& vecOut) {
        if (++m_nLeaves > kMaxConditions) {
            if (m_nLeaves == kMaxConditions + 1) {
                Report(m_vecFindings, FindingCode::kTooManyConditions, strPath,
                       "the query has more than 1000 conditions");
            }
            return;
        }
        if (IsTooDeep(jOperand)) {
            Report(m_vecFindings, FindingCode::kNestedTooDeep, strPath,
                   "the value is nested too deep");
            return;
        }
        auto pNode = std::make_shared<Condition::Node>();
        pNode->eOp = eOp;
        pNode->strMember = strMember;
        pNode->jOperand = jOperand;
        pNode->strPath = strPath;
        vecOut.emplace_back(std::move(pNode));
    }

    // A key with $ that cannot be where it is.
    void Refuse(const std::string& strKey, const std::string& strPath) {
        const std::string strShown = ShownText(strKey);
        if (m_blValuesOnly) {
            Report(m_vecFindings, FindingCode::kOperatorRefused, strPath,
                   Concat({strShown, " is an operator, and this query takes plain values"}));
        } else if (FindOperator(strKey) != nullptr ||  // mutate(exchanged): both only look.
                   FindGroupKey(strKey) != nullptr) {
            Report(m_vecFindings, FindingCode::kMisplacedOperator, strPath,
                   Concat({strShown, " cannot stand here"}));
        } else {
            Report(m_vecFindings, FindingCode::kUnknownOperator, strPath,
                   Concat({"there is no operator ", strShown, OperatorSuggestion(strKey)}));
        }
    }

    bool m_blValuesOnly;
    FindingList& m_vecFindings;
    size_t m_nLeaves = 0;
};

}  // namespace

Conditions ParseWhere(const Json::Value& jWhere, bool blValuesOnly, FindingList& vecFindings) try {
    return WhereParser(blValuesOnly, vecFindings).Read(jWhere, "/where", 0);
}
VORN_JSON_MEMORY_TO_BAD_ALLOC

}  // namespace vornjsondb
