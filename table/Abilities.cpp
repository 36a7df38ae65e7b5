#include "Abilities.h"

#include <utility>

#include "../src/base/JsonMember.h"
#include "../src/schema/TableDefinition.h"
#include "BareNames.h"
#include "Members.h"

namespace vornjsondb {

using VORN_JSON_DB::Abilities;

// recCreate checks the value, writes it and reads the row back. An update writes every value as a
// condition does: what is no text goes in bare, and a list becomes a membership, which is no
// assignment and never compares the list as a whole.
Abilities OldAbilities(const MemberType& Type) {
    const BoundKind eKind = Type.Bound.eKind;
    const bool blRead = Type.pfnRead != nullptr;
    const bool blFits = Type.pfnFits != nullptr;
    const bool blWritten = blFits && Type.pfnAppend != nullptr;
    const bool blList = eKind == BoundKind::kList;
    const bool blBareTexts = eKind == BoundKind::kAny || eKind == BoundKind::kNone;
    return Abilities{blRead && blWritten, blRead, blFits && !blList, !blList && !blBareTexts};
}

std::string Lacking(const Abilities& Some) {
    std::string strLacking;
    const std::pair<bool, const char*> kAbilities[] = {{Some.blCreate, "create"},
                                                       {Some.blRead, "read"},
                                                       {Some.blUpdate, "update"},
                                                       {Some.blQuery, "query"}};
    for (const auto& Each : kAbilities) {
        if (!Each.first) {
            strLacking.append(strLacking.empty() ? "" : ", ").append(Each.second);
        }
    }
    return strLacking;
}

namespace {

Abilities All(bool blCan) {
    return Abilities{blCan, blCan, blCan, blCan};
}

Abilities Both(const Abilities& Left, const Abilities& Right) {
    return Abilities{Left.blCreate && Right.blCreate, Left.blRead && Right.blRead,
                     Left.blUpdate && Right.blUpdate, Left.blQuery && Right.blQuery};
}

// A list names all columns; a condition, or what is written, the member's own.
Abilities OldByNames(bool blOwn, bool blAll) {
    return Abilities{blOwn, blAll, blOwn, blOwn};
}

}  // namespace

}  // namespace vornjsondb

namespace VORN_JSON_DB {

std::vector<MemberAbilities> AbilitiesOf(const std::string& strTable,
                                         const Json::Value& jDefinition) {
    const Json::Value& jMembers = vornjsondb::DeclaredMembers(jDefinition, strTable);
    FindingList vecFindings;
    const vornjsondb::Members Known(strTable, jDefinition, vecFindings);
    const vornjsondb::BareNames Names;
    const bool blTable = Names.Has(strTable);
    bool blAll = blTable;
    for (const std::string& strName : jMembers.getMemberNames()) {
        blAll = blAll && Names.Has(strName);
    }
    std::vector<MemberAbilities> vecAbilities;
    const Json::Value::const_iterator itEnd = jMembers.end();
    for (Json::Value::const_iterator it = jMembers.begin(); it != itEnd; ++it) {
        const std::string strName = it.name();
        const vornjsondb::MemberType& Type = vornjsondb::TypeOfMember(*it);
        // mutate(exchanged): in any order.
        const Abilities Old =
            vornjsondb::Both(vornjsondb::OldAbilities(Type),
                             vornjsondb::OldByNames(blTable && Names.Has(strName), blAll));
        const Abilities New = vornjsondb::All(Known.Find(strName) != vornjsondb::Members::kNone);
        const bool blReadable = Type.pfnRead != nullptr;
        const Abilities Compatible =
            vornjsondb::Both(New, Abilities{blReadable, true, blReadable, true});
        vecAbilities.push_back(
            MemberAbilities{strName, vornjsondb::TypeName(*it), Old, Compatible, New});
    }
    return vecAbilities;
}

}  // namespace VORN_JSON_DB
