#ifndef VORN_CORE_VORN_JSON_DB_API_ROWS_H
#define VORN_CORE_VORN_JSON_DB_API_ROWS_H

// The row callback for sqlite3_exec: turns one row into a record by the member types of the
// current table and appends it to the array that pArg points to (Json::Value*, array or null).
// Returns 0, or -1 to stop the statement; the array then holds the rows before. Never throws:
// an exception must not pass through SQLite's frames.
int DbCallBackFillList(void* pArg, int n_column, char** column_value, char** column_name);

// The same for the first row alone, into a record (Json::Value*, null before; it stays null where
// there is no row). The rows behind it are read, too, so that one that no record can be made of
// fails here as in a list, but nothing of them is kept.
int DbCallBackFillFirst(void* pArg, int n_column, char** column_value, char** column_name);

#endif  // VORN_CORE_VORN_JSON_DB_API_ROWS_H
