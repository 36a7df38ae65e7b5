// Texts and lists of them put together by one function, where the operators of std::string and
// std::vector would be compiled into each place anew.

#ifndef VORN_TABLE_CONCAT_H
#define VORN_TABLE_CONCAT_H

#include <cstdint>
#include <initializer_list>
#include <string>
#include <string_view>
#include <vector>

namespace vornjsondb {

std::string Concat(std::initializer_list<std::string_view> listParts);
void Append(std::string& strTo, std::initializer_list<std::string_view> listParts);

void AddText(std::vector<std::string>& vecTexts, std::string_view strText);

// The number in decimal digits; one function for numbers of all sizes.
std::string DigitsOf(std::int64_t nValue);

}  // namespace vornjsondb

#endif  // VORN_TABLE_CONCAT_H
