#include "Conditions.h"

#include <algorithm>
#include <cstring>

#include "JsonCells.h"
#include "JsonFile.h"
#include "input/Numbers.h"

namespace VORN_JSON_DB::Cli {

namespace {

std::string TypeOf(const Table& Of, const std::string& strMember) {
    const Json::Value& jMembers = Of.Definition()[Of.Name()]["member"];
    return jMembers.isMember(strMember) ? jMembers[strMember]["cpptype"].asString() : "";
}

bool IsMember(const Table& Of, const std::string& strMember) {
    return std::binary_search(Of.Members().begin(), Of.Members().end(), strMember);
}

// A path begins with a member's name.
std::string BaseOf(const Table& Of, const std::string& strPath) {
    return IsMember(Of, strPath) ? strPath : strPath.substr(0, strPath.find_first_of(".["));
}

void CheckMember(const Table& Of, const std::string& strMember) {
    if (!IsMember(Of, BaseOf(Of, strMember))) {
        Fail(kExitUsage, "table \"" + Of.Name() + "\" has no member \"" + strMember + "\"" +
                             NearestHint(strMember, Of.Members(), "; see vornjsondb schema"));
    }
}

// A word such as 5, true, null or {"a":1}; all else is text that came without its quotes, as do
// dates, addresses and versions.
bool LooksLikeJson(const std::string& strWord) {
    return strWord == "true" || strWord == "false" || strWord == "null" || IsJsonNumber(strWord) ||
           strWord.find_first_of("{[\"") == 0;
}

Json::Value TypedValue(const Table& Of, const std::string& strMember, const std::string& strText) {
    const std::string strType = TypeOf(Of, strMember);
    if (strType == "string") {
        return strText;
    }
    if (strType == "bool" && (strText == "0" || strText == "1")) {
        return strText == "1";
    }
    double dReal = 0;
    if (strType == "double" && IsTooWide(strText) && ToReal(strText, dReal)) {
        return dReal;
    }
    return LooksLikeJson(strText) ? ParseJson(strText, strMember, kExitUsage)
                                  : Json::Value(strText);
}

struct SignRow {
    const char* szSign;
    const char* szOperator;
};
constexpr SignRow kSigns[] = {{">=", "$gte"}, {"<=", "$lte"}, {"!=", "$ne"},
                              {"<>", "$ne"},  {">", "$gt"},   {"<", "$lt"}};

// "price>5" looks like a condition, and --where takes it.
void CheckSigns(const Table& Of, const std::string& strWord) {
    for (const SignRow& Row : kSigns) {
        const std::size_t nAt = strWord.find(Row.szSign);
        if (nAt == std::string::npos || nAt > strWord.find('=') ||
            !IsMember(Of, BaseOf(Of, strWord.substr(0, nAt)))) {
            continue;
        }
        const std::string strText = strWord.substr(nAt + std::strlen(Row.szSign));
        const Json::Value jText(strText);
        Fail(kExitUsage, "\"" + strWord + "\" is not of the form member=value; write --where '{\"" +
                             strWord.substr(0, nAt) + "\": {\"" + Row.szOperator + "\": " +
                             (LooksLikeJson(strText) ? strText : CompactJson(jText)) + "}}'");
    }
}

// "price desc" is how SQL says it.
void CheckSort(const Table& Of, const std::string& strTerm) {
    const std::size_t nBlank = strTerm.find(' ');
    const std::string strMember = strTerm.substr(0, nBlank);
    if (nBlank == std::string::npos || IsMember(Of, BaseOf(Of, strTerm)) ||
        !IsMember(Of, strMember)) {
        return;
    }
    const bool blDown = sqlite3_stricmp(strTerm.c_str() + nBlank, " desc") == 0;
    Fail(kExitUsage,
         "--sort: no member \"" + strTerm + "\"; write " + (blDown ? "-" : "") + strMember);
}

Json::Value ParseWhere(const std::string& strText) {
    if (strText.find_first_of("{[") == std::string::npos) {
        Fail(kExitUsage,
             "--where: \"" + strText +
                 R"(" is no JSON object; write {"size": 5}, or size=5 without --where)");
    }
    return ParseJson(strText, "--where", kExitUsage);
}

}  // namespace

bool IsAssignment(const std::string& strWord) {
    return strWord.find('=') != std::string::npos;
}

Assignment ParseAssignment(const Table& Of, const std::string& strWord) {
    // The first "=" that ends a member's name; a name may hold one itself.
    std::size_t nEquals = strWord.find('=');
    for (std::size_t nAt = nEquals; nAt != std::string::npos; nAt = strWord.find('=', nAt + 1)) {
        if (IsMember(Of, strWord.substr(0, nAt))) {
            nEquals = nAt;
            break;
        }
    }
    if (nEquals == std::string::npos || !IsMember(Of, strWord.substr(0, nEquals))) {
        CheckSigns(Of, strWord);
    }
    if (nEquals == std::string::npos) {
        Fail(
            kExitUsage,
            "\"" + strWord + "\" is not of the form member=value" +
                (IsMember(Of, strWord) ? "; write what the member is: " + strWord + "=VALUE" : ""));
    }
    const std::string strMember = strWord.substr(0, nEquals);
    const std::string strText = strWord.substr(nEquals + 1);
    const bool blJson = !strMember.empty() && strMember.back() == ':' && !IsMember(Of, strMember);
    if (blJson) {
        const std::string strName = strMember.substr(0, strMember.size() - 1);
        CheckMember(Of, strName);
        return {strName, ParseJson(strText, strName, kExitUsage)};
    }
    CheckMember(Of, strMember);
    return {strMember, TypedValue(Of, strMember, strText)};
}

Json::Value ParseAssignments(const Table& Of, const std::vector<std::string>& vecWords) {
    Json::Value jMembers(Json::objectValue);
    for (const std::string& strWord : vecWords) {
        Assignment Parsed = ParseAssignment(Of, strWord);
        if (!IsMember(Of, Parsed.strMember)) {
            Fail(kExitUsage, "\"" + Parsed.strMember + "\" is part of a member; set it whole");
        }
        if (jMembers.isMember(Parsed.strMember)) {
            Fail(kExitUsage, "member \"" + Parsed.strMember + "\" is set twice; set it once");
        }
        jMembers[Parsed.strMember] = std::move(Parsed.jValue);
    }
    return jMembers;
}

Json::Value ParseKey(const Table& Of, const std::string& strWord) {
    const std::vector<std::string>& vecKey = Of.KeyMembers();
    if (vecKey.empty()) {
        Fail(kExitUsage,
             "table \"" + Of.Name() +
                 "\" has no key; select by --where, which list, update and delete have");
    }
    if (vecKey.size() == 1) {
        return TypedValue(Of, vecKey[0], strWord);
    }
    Json::Value jKey;
    if (strWord.compare(0, 1, "{") == 0) {
        jKey = ParseJson(strWord, "key \"" + strWord + "\"", kExitUsage);
    }
    bool blFits = jKey.isObject() && jKey.size() == vecKey.size();
    std::string strNames;
    for (const std::string& strMember : vecKey) {
        blFits = blFits && jKey.isMember(strMember);
        strNames += strNames.empty() ? "" : ", ";
        strNames += strMember;
    }
    if (!blFits) {
        Fail(kExitUsage,
             "key \"" + strWord + "\": it must be an object with just these members: " + strNames);
    }
    return jKey;
}

Query KeyQuery(const Table& Of, const Json::Value& jKey) {
    Query Which;
    for (const std::string& strMember : Of.KeyMembers()) {
        Which.Where(strMember, Op::kEqual, Of.KeyMembers().size() == 1 ? jKey : jKey[strMember]);
    }
    return Which;
}

void TakeMembers(const Context& Call, Query& Which) {
    std::vector<std::string> vecNames = Call.Names("--members");
    for (auto itName = vecNames.begin(); itName != vecNames.end(); ++itName) {
        if (std::find(vecNames.begin(), itName, *itName) != itName) {
            Fail(kExitUsage, "--members: \"" + *itName + "\" is there twice; name it once");
        }
    }
    if (!vecNames.empty()) {
        Which.Members(std::move(vecNames));
    }
}

Query ParseQuery(const Context& Call, const Table& Of, const std::vector<std::string>& vecWords) {
    Json::Value jQuery(Json::objectValue);
    if (Call.Has("--where")) {
        jQuery["where"] = ParseWhere(Call.Text("--where"));
    }
    Query Which(jQuery);
    for (const std::string& strWord : vecWords) {
        Assignment Parsed = ParseAssignment(Of, strWord);
        Which.Where(std::move(Parsed.strMember), Op::kEqual, std::move(Parsed.jValue));
    }
    for (std::string& strTerm : Call.Names("--sort")) {
        CheckSort(Of, strTerm);
        Which.Sort(std::move(strTerm));
    }
    Which.Limit(Call.Whole("--limit", -1));
    Which.Offset(Call.Whole("--offset", 0));
    TakeMembers(Call, Which);
    return Which;
}

}  // namespace VORN_JSON_DB::Cli
