#ifndef VORN_TABLE_NEAREST_H
#define VORN_TABLE_NEAREST_H

#include <string>
#include <string_view>
#include <vector>

namespace vornjsondb {

// The candidate that a person who typed strTyped most likely meant; empty when none is near.
std::string Nearest(std::string_view strTyped, const std::vector<std::string>& vecCandidates);

// " (did you mean \"name\"?)", or nothing.
std::string Suggestion(std::string_view strTyped, const std::vector<std::string>& vecCandidates);

}  // namespace vornjsondb

#endif  // VORN_TABLE_NEAREST_H
