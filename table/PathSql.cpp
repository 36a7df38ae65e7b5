#include "PathSql.h"

#include <algorithm>

#include "Concat.h"
#include "Nearest.h"

namespace vornjsondb {

namespace {

constexpr size_t kMostIndexDigits = 9;   // SQLite lets a longer index wrap around
constexpr size_t kMostPathBytes = 1000;  // SQLite follows a path by recursion

bool IsNumber(std::string_view strText) {
    return !strText.empty() && strText.find_first_not_of("0123456789") == std::string_view::npos;
}

// SQLite has no escape for what would end the name or begin one.
bool IsReachable(std::string_view strName) {
    bool blAll = true;
    for (const char c : strName) {
        blAll = blAll && c != '"' && c != '\\' && static_cast<unsigned char>(c) >= ' ';
    }
    return blAll;
}

// Takes ".name" from the front of strSteps.
bool TakeName(std::string_view& strSteps, std::string& strOut, Problem& Why) {
    const std::string_view strName = strSteps.substr(1, strSteps.find_first_of(".[", 1) - 1);
    // mutate(exchanged): no name is both.
    if (strName.empty()) {
        return Why.Tell(FindingCode::kBadPath, "a name is missing in it");
    }
    // mutate(exchanged): no name is both.
    if (!IsReachable(strName)) {
        return Why.Tell(FindingCode::kBadPath, Concat({"no path leads to ", ShownText(strName)}));
    }
    // mutate(exchanged): the path of what is refused is not used.
    if (IsNumber(strName)) {
        return Why.Tell(FindingCode::kNumberInPath,
                        Concat({ShownText(strName), " would be a name, not an index"}));
    }
    strOut += ".\"";
    for (const char c : strName) {
        strOut.append(c == '\'' ? 2 : 1, c);
    }
    strOut += '"';
    strSteps.remove_prefix(1 + strName.size());
    return true;
}

// Takes "[0]".
bool TakeIndex(std::string_view& strSteps, std::string& strOut, Problem& Why) {
    const size_t nEnd = std::min(strSteps.find(']'), strSteps.size() - 1);
    const std::string_view strDigits = strSteps.substr(1, nEnd - 1);
    // mutate(exchanged): all only look, and the path of what is refused is not used.
    if (!IsNumber(strDigits) || strDigits.size() > kMostIndexDigits || strSteps[nEnd] != ']') {
        return Why.Tell(FindingCode::kBadPath, "an index is a whole number in brackets");
    }
    strOut.append(strSteps.substr(0, nEnd + 1));
    strSteps.remove_prefix(nEnd + 1);
    return true;
}

// Into strOut, empty before.
bool TakeSteps(std::string_view strSteps, std::string& strOut, Problem& Why) {
    strOut += "'$";
    while (!strSteps.empty()) {
        if (strSteps[0] != '.' && strSteps[0] != '[') {
            return Why.Tell(FindingCode::kBadPath, "a point or a bracket is missing in it");
        }
        if (!(strSteps[0] == '.' ? TakeName : TakeIndex)(strSteps, strOut, Why)) {
            return false;
        }
    }
    strOut += '\'';
    return true;
}

std::string Guarded(const char* szFunction, const std::string& strColumn,
                    const std::string& strPath) {
    return Concat({"CASE WHEN json_valid(", strColumn, ") THEN ", szFunction, "(", strColumn, ", ",
                   strPath, ") END"});
}

}  // namespace

bool Problem::Tell(FindingCode eWrong, std::string_view strText) {
    eCode = eWrong;
    strMessage = strText;
    return false;
}

bool FindPlace(const Members& Of, std::string_view strName, Place& Out, Problem& Why) {
    // mutate(exchanged): in any order.
    Out.nMember = Of.Find(strName);
    Out.strPath.clear();
    size_t nEnd = strName.size();
    while (Out.nMember == Members::kNone && nEnd > 0) {
        // mutate(exchanged): the whole name is not found a second time either.
        nEnd = strName.find_last_of(".[", nEnd - 1);
        // mutate(exchanged): the whole name is not found a second time either.
        if (nEnd == std::string_view::npos) {
            break;
        }
        Out.nMember = Of.Find(strName.substr(0, nEnd));
    }
    if (Out.nMember == Members::kNone) {
        const std::string_view strFirst = strName.substr(0, strName.find_first_of(".["));
        return Why.Tell(FindingCode::kUnknownMember,
                        Concat({"table ", Of.QuotedTable(), " has no member ", ShownText(strFirst),
                                Suggestion(strFirst, Of.Names())}));
    }
    if (nEnd == strName.size()) {
        return true;
    }
    const Member& Base = Of.At(Out.nMember);
    // mutate(exchanged): what is told last counts.
    if (!Base.IsJson()) {
        return Why.Tell(FindingCode::kNoJsonMember,
                        Concat({"member ", ShownText(Base.strName), " of type \"",
                                Base.pType->szName, "\" has nothing inside"}));
    }
    const bool blGood = strName.size() > kMostPathBytes
                            ? Why.Tell(FindingCode::kBadPath, "it is too long")
                            : TakeSteps(strName.substr(nEnd), Out.strPath, Why);
    if (blGood) {
        return true;
    }
    return Why.Tell(Why.eCode, Concat({"path ", ShownText(strName), ": ", Why.strMessage}));
}

std::string ValueAt(const std::string& strColumn, const std::string& strPath) {
    return Guarded("json_extract", strColumn, strPath);
}

std::string KindAt(const std::string& strColumn, const std::string& strPath) {
    return Guarded("json_type", strColumn, strPath);
}

// One CASE in the other: SQLite does not promise to look at the left side of an AND first.
std::string ElementsAt(const std::string& strColumn, const std::string& strPath) {
    const std::string strTail = Concat({strPath.empty() ? "" : ", ", strPath});
    return Concat({"CASE WHEN json_valid(", strColumn, ") THEN CASE json_type(", strColumn, strTail,
                   ") WHEN 'array' THEN ", strColumn, " END END", strTail});
}

}  // namespace vornjsondb
