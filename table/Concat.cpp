#include "Concat.h"

#include <utility>

#include "../src/base/Digits.h"

namespace vornjsondb {

std::string Concat(std::initializer_list<std::string_view> listParts) {
    std::string strAll;
    Append(strAll, listParts);
    return strAll;
}

void Append(std::string& strTo, std::initializer_list<std::string_view> listParts) {
    size_t nSize = strTo.size();
    // mutate(dropped): room shows only when memory runs out.
    for (const std::string_view strPart : listParts) {
        // mutate(dropped, doubled): room shows only when memory runs out.
        nSize += strPart.size();
    }
    // Twice the room when it runs out: texts grow by many calls.
    if (nSize > strTo.capacity()) {
        strTo.reserve(strTo.empty() ? nSize : 2 * nSize);
    }
    for (const std::string_view strPart : listParts) {
        strTo.append(strPart);
    }
}

// Not moved, which would be a function that JsonCpp has as well, and takes from the program.
void AddText(std::vector<std::string>& vecTexts, std::string_view strText) {
    vecTexts.emplace_back();
    vecTexts.back() = strText;
}

std::string DigitsOf(std::int64_t nValue) {
    return std::string(Digits(Json::Int64{nValue}).View());
}

}  // namespace vornjsondb
