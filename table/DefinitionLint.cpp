// What is wrong with a definition, by itself.

#include <VornJsonDbTable.h>

#include <algorithm>

#include "../src/base/JsonMember.h"
#include "../src/base/JsonText.h"
#include "../src/schema/TableDefinition.h"
#include "Abilities.h"
#include "BareNames.h"
#include "Fit.h"
#include "LintCodes.h"
#include "Members.h"
#include "Nearest.h"
#include "OldKeys.h"

namespace vornjsondb {

namespace {

constexpr const char* kTableKeys[] = {"key", "member"};
constexpr const char* kMemberKeys[] = {"cppDefaultValue", "cpptype", "notNull", "nullSeen",
                                       "unique"};

// Hosts keep keys of their own in a definition, so only what looks like a slip is reported.
template <size_t nKeys>
void LintKeys(const Json::Value& jEntry, const char* const (&aszKeys)[nKeys],
              const std::string& strPath, FindingList& vecFindings) {
    const std::vector<std::string> vecKnown(aszKeys, aszKeys + nKeys);
    for (const std::string& strKey : jEntry.getMemberNames()) {
        const std::string strSuggestion = Suggestion(strKey, vecKnown);
        if (std::count(vecKnown.begin(), vecKnown.end(), strKey) == 0 && !strSuggestion.empty()) {
            Report(vecFindings, LintCode::kMisspeltKey, Below(strPath, strKey),
                   ShownText(strKey) + " is no key of a definition" + strSuggestion);
        }
    }
}

class DefinitionLint {
  public:
    DefinitionLint(const std::string& strTable, const Json::Value& jDefinition,
                   FindingList& vecFindings)
        : m_strTable(strTable),
          m_jMembers(DeclaredMembers(jDefinition, strTable)),
          m_Of(strTable, jDefinition, vecFindings),
          m_vecFindings(vecFindings) {}

    void Run() {
        if (m_jMembers.empty()) {
            return;
        }
        const std::string strPath = Below("", m_strTable);
        LintKeys(m_Of.Definition()[m_strTable], kTableKeys, strPath, m_vecFindings);
        if (!m_Names.Has(m_strTable)) {
            AddOldName(strPath, "table " + m_Of.QuotedTable());
        }
        const Json::Value::const_iterator itEnd = m_jMembers.end();
        for (Json::Value::const_iterator it = m_jMembers.begin(); it != itEnd; ++it) {
            LintMember(it.name(), *it);
        }
        LintLast();
    }

  private:
    std::string PathOf(const std::string& strMember) const {
        return Below(Below(Below("", m_strTable), "member"), strMember);
    }

    void AddOldName(const std::string& strPath, const std::string& strWhat) {
        Report(m_vecFindings, LintCode::kOldName, strPath,
               strWhat +
                   ": a VornJsonDbApi writes names as they stand, and SQL reads another "
                   "thing");
    }

    void LintMember(const std::string& strName, const Json::Value& jEntry) {
        const std::string strPath = PathOf(strName);
        if (jEntry.isObject()) {
            LintKeys(jEntry, kMemberKeys, strPath, m_vecFindings);
        }
        LintFlags(jEntry, strPath);
        LintName(strName, strPath);
        const MemberType& Type = TypeOfMember(jEntry);
        if (Type.Bound.eKind == BoundKind::kNone) {
            return;  // told already
        }
        LintType(strName, Type, strPath);
        if (const Json::Value* pjDefault = FindMember(jEntry, "cppDefaultValue")) {
            LintDefault(strName, Type, *pjDefault, Below(strPath, "cppDefaultValue"));
        }
    }

    void LintFlags(const Json::Value& jEntry, const std::string& strPath) {
        for (const char* szFlag : {"notNull", "nullSeen", "unique"}) {
            const Json::Value* pjFlag = FindMember(jEntry, szFlag);
            if (pjFlag != nullptr && !pjFlag->isBool()) {
                Report(m_vecFindings, LintCode::kBadFlag, Below(strPath, szFlag),
                       Quoted(szFlag) + " is " + Shown(*pjFlag) + ", not true or false");
            }
        }
    }

    void LintName(const std::string& strName, const std::string& strPath) {
        if (!m_Names.Has(strName)) {
            AddOldName(strPath, "member " + ShownText(strName));
        }
        // mutate(exchanged statements): in any order.
        if (IsOldKey(strName)) {
            Report(m_vecFindings, LintCode::kHidesQueryKey, strPath,
                   "member " + Quoted(strName) + ": a VornJsonDbApi takes this key of a query " +
                       "for more than a condition");
        }
        // As the table's key of one whole number the column is the rowid itself.
        const bool blRowid = m_Of.HasRowidKey() && m_Of.Key()[0] == m_Of.Find(strName);
        if (sqlite3_stricmp(strName.c_str(), "rowid") == 0 && !blRowid) {
            Report(m_vecFindings, LintCode::kRowidName, strPath,
                   "member " + Quoted(strName) + " hides the row number by which a VornJsonDbApi " +
                       "reads back what it has stored");
        }
    }

    void LintType(const std::string& strName, const MemberType& Type, const std::string& strPath) {
        const std::string strLacking = Lacking(OldAbilities(Type));
        if (!strLacking.empty()) {
            Report(m_vecFindings, LintCode::kOldType, Below(strPath, "cpptype"),
                   "member " + Quoted(strName) + " of type " + Quoted(Type.szName) +
                       ": a VornJsonDbApi cannot " + strLacking);
        }
    }

    void LintDefault(const std::string& strName, const MemberType& Type,
                     const Json::Value& jDefault, const std::string& strPath) {
        JsonCodec Codec;
        std::string strJson;
        BoundValue Value;
        if (jDefault.isNull()) {
            Report(m_vecFindings, LintCode::kNullDefault, strPath,
                   "member " + Quoted(strName) + ": a VornJsonDbApi refuses the records that it " +
                       "gives this default");
        } else if (FitJson(Type, jDefault, false, Codec, strJson, Value) != Misfit::kNone) {
            Report(m_vecFindings, LintCode::kBadDefault, strPath,
                   "member " + Quoted(strName) + " cannot be " + Shown(jDefault) +
                       ": expected is " + Expected(Type));
        }
    }

    void LintLast() {
        const std::string strLast = m_jMembers.getMemberNames().back();
        if (FindMember(m_jMembers[strLast], "cppDefaultValue") == nullptr) {
            Report(m_vecFindings, LintCode::kNoLastDefault, PathOf(strLast),
                   "member " + ShownText(strLast) + " comes last: a VornJsonDbApi refuses every " +
                       "record without it");
        }
    }

    const std::string& m_strTable;
    const Json::Value& m_jMembers;
    Members m_Of;
    BareNames m_Names;
    FindingList& m_vecFindings;
};

}  // namespace

}  // namespace vornjsondb

namespace VORN_JSON_DB {

FindingList LintDefinition(const std::string& strTable, const Json::Value& jDefinition) {
    FindingList vecFindings;
    vornjsondb::DefinitionLint(strTable, jDefinition, vecFindings).Run();
    return vecFindings;
}

}  // namespace VORN_JSON_DB
