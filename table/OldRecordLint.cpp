// What a VornJsonDbApi makes of a record in recCreate.

#include <VornJsonDbTable.h>

#include <algorithm>

#include "../src/base/JsonMember.h"
#include "../src/base/JsonMemory.h"
#include "../src/base/JsonText.h"
#include "../src/schema/MemberType.h"
#include "../src/schema/TableDefinition.h"
#include "Fit.h"
#include "LintCodes.h"
#include "Nearest.h"

namespace vornjsondb {

namespace {

enum class Percents { kExact, kHalved, kRefused };

// It formats all text so far again with each later member: "%%" becomes "%" each time, and any
// other use of the sign is refused. At the end a quote follows it in the statement, and a NUL here.
Percents FateOf(std::string strText, size_t nLater) {
    Percents eFate = Percents::kExact;
    for (; nLater > 0 && strText.find('%') != std::string::npos; --nLater) {
        std::string strHalved;
        // mutate(< to <=): the NUL behind the text is no percent sign.
        for (size_t i = 0; i < strText.size(); ++i) {
            // mutate(exchanged): of two percent signs either is kept.
            if (strText[i] == '%' && strText[++i] != '%') {
                return Percents::kRefused;
            }
            strHalved += strText[i];
        }
        strText = strHalved;
        eFate = Percents::kHalved;
    }
    return eFate;
}

class OldRecordLint {
  public:
    OldRecordLint(const Json::Value& jMembers, const Json::Value& jRecord, FindingList& vecFindings)
        : m_jMembers(jMembers), m_jRecord(jRecord), m_vecFindings(vecFindings) {}

    void Run() {
        if (!m_jRecord.isObject() || m_jRecord.empty()) {
            Report(m_vecFindings, FindingCode::kNotARecord, "",
                   Shown(m_jRecord) + " is no record: an object with members is expected");
            return;
        }
        LintNames();
        const std::vector<std::string> vecNames = m_jMembers.getMemberNames();
        auto nLater = static_cast<size_t>(std::count_if(
            vecNames.begin(), vecNames.end(),
            [this](const std::string& strName) { return ValueOf(strName) != nullptr; }));
        for (const std::string& strName : vecNames) {
            if (const Json::Value* pjValue = ValueOf(strName)) {
                LintValue(strName, *pjValue, --nLater);
            }
        }
        if (ValueOf(vecNames.back()) == nullptr) {
            Report(m_vecFindings, LintCode::kMissingLastMember, Below("", vecNames.back()),
                   "member " + ShownText(vecNames.back()) +
                       " is missing: recCreate refuses a record without the last one");
        }
    }

  private:
    // The value that recCreate takes: the record's, or the default.
    const Json::Value* ValueOf(const std::string& strName) const {
        const Json::Value* pjGiven = FindMember(m_jRecord, strName);
        return pjGiven != nullptr ? pjGiven : FindMember(m_jMembers[strName], "cppDefaultValue");
    }

    void LintNames() {
        for (const std::string& strName : m_jRecord.getMemberNames()) {
            if (FindMember(m_jMembers, strName) == nullptr) {
                Report(m_vecFindings, LintCode::kOldDropsMember, Below("", strName),
                       "there is no member " + ShownText(strName) + ", and recCreate drops it" +
                           Suggestion(strName, m_jMembers.getMemberNames()));
            }
        }
    }

    void LintValue(const std::string& strName, const Json::Value& jValue, size_t nLater) {
        const MemberType& Type = TypeOfMember(m_jMembers[strName]);
        const std::string strPath = Below("", strName);
        const std::string strMember = "member " + ShownText(strName);
        if (Type.pfnFits == nullptr || Type.pfnAppend == nullptr) {
            Report(m_vecFindings, LintCode::kOldCannotWrite, strPath,
                   strMember + ": recCreate refuses every value of type " + Quoted(Type.szName));
        } else if (!Type.pfnFits(jValue)) {
            Report(m_vecFindings, FindingCode::kWrongKind, strPath,
                   strMember + ": " + Shown(jValue) + " is another kind of value: expected is " +
                       Expected(Type));
        } else if (Type.Bound.eKind == BoundKind::kInteger) {
            LintInteger(strMember, Type, jValue, strPath);
        } else if (jValue.isString()) {
            LintText(strMember, std::string(BytesOf(jValue)), strPath, nLater);
        } else if (Type.Bound.eKind != BoundKind::kBoolean) {  // mutate(true): no flag has a text.
            LintJson(strMember, jValue, strPath, nLater);
        }
    }

    // What SQLite has integers for is stored; how much of it is read back depends on the type.
    void LintInteger(const std::string& strMember, const MemberType& Type,
                     const Json::Value& jValue, const std::string& strPath) {
        if (!jValue.isInt64()) {
            Report(
                m_vecFindings, FindingCode::kOutOfRange, strPath,
                strMember + ": " + Shown(jValue) + " is beyond 63 bits, which recCreate refuses");
        } else if (jValue.asInt64() < RangeOf(Type).nLeast ||  // mutate(exchanged): both only look.
                   jValue.asInt64() > RangeOf(Type).nMostRead) {
            Report(m_vecFindings, LintCode::kOldReadsOther, strPath,
                   strMember + ": " + Shown(jValue) +
                       " is stored, and a VornJsonDbApi reads another number: expected is " +
                       Expected(Type));
        }
    }

    void LintText(const std::string& strMember, const std::string& strText,
                  const std::string& strPath, size_t nLater) {
        const std::string strStored = strText.substr(0, strText.find('\0'));
        if (strStored.size() < strText.size()) {
            Report(m_vecFindings, LintCode::kNulCut, strPath,
                   strMember + ": " + ShownText(strStored) +
                       " is stored, and what follows the NUL byte is not");
        }
        LintPercents(strMember, strStored, strPath, nLater);
    }

    void LintJson(const std::string& strMember, const Json::Value& jValue,
                  const std::string& strPath, size_t nLater) {
        static constexpr struct {
            Misfit eMisfit;
            const char* szFate;
        } kFates[] = {
            {Misfit::kNotANumber, " holds NaN, which is stored as null"},
            {Misfit::kInfinite,
             " holds an infinity: it is stored, and JsonCpp 1.9.5 does not read it back"},
            {Misfit::kDepth, " is nested too deeply: it is stored, and only a part is read"}};
        const unsigned nFound = MisfitsIn(jValue);
        for (const auto& Each : kFates) {
            if ((nFound & BitOf(Each.eMisfit)) != 0) {
                Report(m_vecFindings, LintCode::kOldJsonChanged, strPath, strMember + Each.szFate);
            }
        }
        LintPercents(strMember, m_Codec.Write(jValue), strPath, nLater);
    }

    void LintPercents(const std::string& strMember, const std::string& strText,
                      const std::string& strPath, size_t nLater) {
        const Percents eFate = FateOf(strText, nLater);
        if (eFate == Percents::kHalved) {
            Report(m_vecFindings, LintCode::kPercentHalved, strPath,
                   strMember + ": each %% is stored as %, because other members follow");
        } else if (eFate == Percents::kRefused) {
            Report(
                m_vecFindings, LintCode::kPercentRefused, strPath,
                strMember + ": recCreate refuses the percent sign, because other members follow");
        }
    }

    const Json::Value& m_jMembers;
    const Json::Value& m_jRecord;
    JsonCodec m_Codec;
    FindingList& m_vecFindings;
};

}  // namespace

}  // namespace vornjsondb

namespace VORN_JSON_DB {

FindingList LintOldRecord(const std::string& strTable, const Json::Value& jDefinition,
                          const Json::Value& jRecord) try {
    FindingList vecFindings;
    const Json::Value& jMembers = vornjsondb::DeclaredMembers(jDefinition, strTable);
    if (jMembers.empty()) {
        vornjsondb::ReportNoDefinition(strTable, vecFindings);
    } else {
        vornjsondb::OldRecordLint(jMembers, jRecord, vecFindings).Run();
    }
    return vecFindings;
}
VORN_JSON_MEMORY_TO_BAD_ALLOC

}  // namespace VORN_JSON_DB
