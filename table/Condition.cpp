// Groups of conditions.

#include <VornJsonDbTable.h>

#include <algorithm>
#include <memory>
#include <utility>

#include "ConditionNode.h"

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
        // An empty one stays, to be refused: in a list of others it would be dropped.
        const bool blSame =
            Each.eKind == eKind && eKind != Node::Kind::kNot && !Each.vecParts.empty();
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

}  // namespace VORN_JSON_DB
