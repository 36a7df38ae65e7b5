// Texts that have broken programs which put texts together.

#ifndef VORN_TESTS_TABLE_HOSTILE_TEXTS_H
#define VORN_TESTS_TABLE_HOSTILE_TEXTS_H

#include <string>
#include <vector>

namespace VORN_JSON_DB {

// Each differs from all others, and none is part of the names that the tests use.
std::vector<std::string> HostileTexts();

}  // namespace VORN_JSON_DB

#endif  // VORN_TESTS_TABLE_HOSTILE_TEXTS_H
