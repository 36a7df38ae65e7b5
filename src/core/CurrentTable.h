#ifndef VORN_CORE_CURRENT_TABLE_H
#define VORN_CORE_CURRENT_TABLE_H

#include <string>

// Name of the table whose statement runs. One for the process, because the row callback is given
// nothing but the caller's argument.
extern std::string g_strCurTable;

#endif  // VORN_CORE_CURRENT_TABLE_H
