// vornjsondb: JSON records in SQLite tables.
//
// This header is the manual of libvornjsondb.so.6.
//
// Contents
//    1  Limits: read these first
//    2  Words used below: record, table definition, query object
//    3  Log flags                  blLogToStdout, blDebugOutput
//    4  Join modes                 VORN_SQL_WHERE_TYPE_OR, _AND, _COMMA
//    5  Free functions             VORN_JSON_DB::recType, jsonCopyMember,
//                                  getTimeAfterNow, convert2ReadableTime
//    6  Class VornJsonDbApi
//       6.1  handle                constructor, destructor, tableCreate, setErrMsg, getErrMsg
//       6.2  running SQL           runSqlEx
//       6.3  checking and filling  checkJsonType, fillDefaultValue
//       6.4  SQL texts             SqlExpandMemberName, SqlExpandMemberSymbol,
//                                  SqlMakeByMatchField, SqlMakeByListField,
//                                  SqlExpandMemberList, SqlFilterConditionFromJson
//       6.5  records               recSave, recCreate, recList, recGetOne,
//                                  recUpdateByWhere, recUpdateByFilter,
//                                  recDelete, recDeleteAll,
//                                  recDeleteByArray, recDeleteByName, VectorParamToJson
//
// 1  Limits
//
// Threads: one thread at a time per process, not per handle. The name of the running table and
// the cache of member types are shared by all handles, and nothing is locked. For the same reason
// no call may be made from inside another: from an SQL function, say, that a statement calls.
// Arguments must not change while a call with them runs.
// Waiting: a locked database blocks the caller for about five seconds (500 attempts, 10 ms apart).
// The table name is the key of the type cache: the first definition seen under a name serves
// every later handle on that name, in any database, until the process ends.
// Texts are C strings inside SQL: a text value ends at its first NUL byte, and a statement at a
// NUL byte in a name or filter text. UTF-8 is expected.
// Names and filter texts go into SQL as they stand: they must come from the program, never from
// its users. The same holds for a number member that is given as text in a query object.
// A percent sign in a text value can halve ("%%" becomes "%") or get the record refused, when
// members that follow it in key order are written too.
// Exceptions: std::bad_alloc, and std::logic_error from SqlExpandMemberSymbol and recSave when
// SQLite's formatter, which writes numbers with a fraction, runs out of memory. Nothing else is
// thrown.
//
// 2  Words
//
// Record: a JSON object whose members are named as the table's columns.
//
// Table definition: a JSON object. Under the table's name stands an object whose "member" object
// has one entry per column; an entry holds "cpptype" (a type name, below) and, if wanted,
// "cppDefaultValue" (any JSON value). Other keys are ignored. Every column of the table needs an
// entry, or rows cannot be read back:
//
//    {"task": {"member": {"id":   {"cpptype": "int"},
//                         "name": {"cpptype": "string", "cppDefaultValue": ""}}}}
//
//    type name               JSON kind when read        recCreate/update  query condition
//    "string"                string                     string            quoted text
//    "int"                   integer, 32 bits           integer           bare
//    "long long"             integer, 64 bits           integer           bare
//    "unsigned int"          integer, 32 bits, signed   refused           bare
//    "unsigned long long"    integer, 64 bits, signed   refused           bare
//    "bool"                  boolean, true for 1        boolean           0 or 1
//    "Json::objectValue"     parsed JSON text           object            quoted JSON text
//    "Json::arrayValue"      parsed JSON text           array             quoted JSON text
//    "Json::Value"           parsed JSON text           refused           quoted JSON text
//    "long", "unsigned long", "unsigned", "double", "float"
//                            refused                    refused           bare
//    "uid_t", "time_t"       refused                    not created (1)   bare
//
//    (1) An update stores them; rows with them can then not be read.
//    recSave stores all of these but "Json::Value", "uid_t" and "time_t"; it checks no kinds
//    except those that cannot be converted at all.
//
// Query object: a JSON object, or null for no condition. A member of the table means "equals
// this value", or, when the value is an array, "in this list". Further keys:
//    "vornSqlWhereFilter"    string: a raw SQL condition, taken as it stands
//    "sort_by"               string; "sort_direction": "desc" or anything else for ascending
//    "limit", "offset"       integers; "offset" counts only beside "limit"
// Other keys are ignored.
//
// Failures: unless a call says otherwise it returns -1 and has logged why. A log line names the
// file, line and process id, and the condition that failed as its source text.

#ifndef VORN_JSON_DB_API_H
#define VORN_JSON_DB_API_H

#include <cstddef>
#include <string>
#include <vector>

#include <json/json.h>
#include <sqlite3.h>

#define VORN_JSON_DB_EXPORT __attribute__((visibility("default")))

// 3  Log flags
//
// The host's, read afresh for every line. The library brings weak ones that are false, so that a
// host without a logging library of its own links too. A definition in the program wins; so does
// one in a shared library that is linked before this one. One that is linked after it shares the
// flags as well, but its initial values are lost: set them at run time there.
//    blLogToStdout   true: lines go to standard output; false: to syslog, at LOG_ERR
//    blDebugOutput   true: four debug lines are written besides the errors (retries of a locked
//                    statement, its failure, the count of deleted rows, a record that lacks
//                    members)
extern VORN_JSON_DB_EXPORT bool blLogToStdout;
extern VORN_JSON_DB_EXPORT bool blDebugOutput;

// 4  Join modes of SqlExpandMemberList
enum VornSqlWhereType {
    VORN_SQL_WHERE_TYPE_OR = 0,    // joined by " or ", wrapped in " (" and " )"
    VORN_SQL_WHERE_TYPE_AND = 1,   // joined by " and ", wrapped in " (" and " )"
    VORN_SQL_WHERE_TYPE_COMMA = 2  // joined by " , ", not wrapped: the SET list of an UPDATE
};

// 5  Free functions
namespace VORN_JSON_DB {

// Returns the member types of the table strJsonName: an object with one entry per member, each
// holding "cpptype" and, where defined, "cppDefaultValue". The first call for a name takes them
// from jTableDef and keeps them; later calls answer from the cache, whatever they pass (an empty
// jTableDef is fine then). The reference is shared and lives as long as the process. Read it, and
// do not change it: the library works on a copy, which a change may or may not reach. Reading a
// member that is missing by [] adds it, with null, and makes it a member of an unknown type.
// On failure (no entry, no "member" object, an entry without a "cpptype" text) the definition
// and the whole cache are logged, and a value that is no object is returned. Note: a name whose
// first lookup failed stays unusable until the process ends; if some members came before the
// faulty one, this call and later ones return those as the whole.
VORN_JSON_DB_EXPORT Json::Value& recType(Json::Value& jTableDef, std::string& strJsonName);

// Copies the members of the object jSubSet into jIn (object or null): all of them when
// blOverwrite is true, else only those that jIn lacks. Members with a null value are copied too.
// Returns 0, or -1 when one of them is of another kind (a null jSubSet is refused); then jIn is
// as it was. jSubSet is not changed.
VORN_JSON_DB_EXPORT int jsonCopyMember(Json::Value& jIn, Json::Value& jSubSet, bool blOverwrite);

// Sets now to the time offsetSecond seconds from now (negative: ago), in seconds since the Unix
// epoch, and returns 0. Where long has 32 bits the value wraps after January 2038.
VORN_JSON_DB_EXPORT int getTimeAfterNow(int offsetSecond, long& now);

// Writes the time stamp now (seconds since the Unix epoch) into strOut. iType is a set of bits:
//    1   UTC; without it local time
//    2   "Sun, 15 Nov 2026 11:30:00 GMT" (the suffix is written for local time as well)
//    4   "2026-11-15 11:30:00"; only looked at when bit 2 is clear
// Day and month names follow the process's locale. Returns 0, or -1 with strOut as it was: bits 2
// and 4 both clear, or a year that cannot be written.
VORN_JSON_DB_EXPORT int convert2ReadableTime(long now, std::string& strOut, int iType);

// Writes the time offsetSecond seconds from now into strOut: the two calls above in one.
VORN_JSON_DB_EXPORT int getTimeAfterNow(int offsetSecond, std::string& strOut, int iType);

}  // namespace VORN_JSON_DB

// 6  Class VornJsonDbApi: a handle on one table of a database that the caller opened.
class VORN_JSON_DB_EXPORT VornJsonDbApi {
  public:
    // 6.1  Handle

    // Copies the name, the definition and the CREATE statement, keeps pDb, and runs the statement
    // at once. pDb stays the caller's: it must be open for every call on the handle but the
    // destructor, and it is never closed here. The arguments are not changed.
    // Nothing is reported but by the log: a handle whose table could not be created is complete,
    // and its calls fail in their own right. To have a second handle on an existing table, write
    // "CREATE TABLE IF NOT EXISTS".
    VornJsonDbApi(sqlite3* pDb, std::string& strName, Json::Value& jTableDef,
                  std::string& strSqlCreate);

    // Releases the handle's copies; the connection stays open.
    ~VornJsonDbApi();

    // Two handles would share one connection and two error texts would drift apart: construct
    // another handle instead.
    VornJsonDbApi(const VornJsonDbApi&) = delete;
    VornJsonDbApi& operator=(const VornJsonDbApi&) = delete;

    // Runs the CREATE statement that the constructor was given, unchanged. Returns 0 or -1.
    int tableCreate();

    // The message slot for the caller. It is empty after construction, and the library writes one
    // text to it: "DUPLICATE_PRIMARY_KEY", when recCreate or recUpdateByFilter fails and the
    // handle's last SQL error was a UNIQUE failure. It is never cleared by a success: read it right
    // after a -1, and set it to "" before a call whose failure shall be told apart.
    void setErrMsg(std::string strMsg);
    std::string getErrMsg();

    // 6.2  Running SQL

    // Runs strSql, one statement or several, by sqlite3_exec; callback and pArg are handed on to
    // it. While the answer is "database is locked" (or errno is EAGAIN) the whole text is run
    // again, at most 500 times with 10 ms between.
    // Returns the number of rows that the last statement changed; with a callback 0; -1 on
    // failure (an empty strSql included). No transaction is opened: what earlier statements of
    // the text did stays. "BEGIN" and "COMMIT" are run like any other text.
    int runSqlEx(std::string strSql, int (*callback)(void*, int, char**, char**) = NULL,
                 void* pArg = NULL);

    // 6.3  Checking and filling

    // Returns 0 when the values of the object jParam fit their members' types (the table in 2),
    // else -1 at the first misfit in key order. Members unknown to the table are passed over.
    // Any integer fits an integer type, whatever its size. jParam is not changed.
    int checkJsonType(Json::Value& jParam);

    // blStrict false: gives every declared member that jParam (object or null) lacks its
    // "cppDefaultValue", where it has one, and returns 0; a member that is there is left alone,
    // null included. A jParam of another kind is left alone, with 0.
    // blStrict true: changes nothing; returns 0 when every declared member is there, else -1.
    int fillDefaultValue(Json::Value& jParam, bool blStrict);

    // 6.4  SQL texts. They run nothing; the record operations are made of them.

    // Appends to strSql the names of the declared members in key order, separated by commas: those
    // that pjRec holds, or all of them when it is NULL. Returns 0.
    // Note: the comma depends on the member's place in the definition, so a record that lacks the
    // last declared member leaves a trailing comma.
    int SqlExpandMemberName(std::string& strSql, Json::Value* pjRec = NULL);

    // Appends to strSql, which ends in ") VALUES (", the values of the declared members that jRec
    // holds, and ") ". Returns 0; -1 with strSql as it was when a member's type cannot be stored,
    // its value cannot be converted, or text so far holds a percent sign that SQLite's formatter
    // would take for a conversion (all text so far is formatted again with each member).
    int SqlExpandMemberSymbol(std::string& strSql, Json::Value& jRec);

    // Appends "name='text'" (or "name=value" for numbers, bare) to strSqlOut. Returns 0; -1, with
    // nothing appended, when the table has no such member or jParam is an object or array for a
    // type that is no JSON type.
    int SqlMakeByMatchField(std::string& strField, Json::Value& jParam, std::string& strSqlOut);

    // Appends "name in (...)" for the array jList, nothing for an empty one. Returns 0; -1 as
    // above, or when jList is no array. Note: no comma is written between the elements, so only
    // lists of one element mean what they seem to.
    int SqlMakeByListField(const char* szField, Json::Value& jList, std::string& strSqlOut);

    // Appends the conditions (or assignments) of the query object jRecParam to strSqlWhereOut,
    // joined as andType says (section 4). Returns 0; 1 when there was nothing to append; -1 on
    // failure, then strSqlWhereOut may hold part of the text.
    int SqlExpandMemberList(Json::Value& jRecParam, std::string& strSqlWhereOut, int andType);

    // Appends " order by '...'", " LIMIT n" and " OFFSET n" as the query object jFilter asks.
    // Returns 0; -1, with nothing appended, when jFilter is neither object nor null or "sort_by"
    // is no text. Note: SQLite takes the quoted name for a constant, so "sort_by" does not change
    // the order of the rows.
    int SqlFilterConditionFromJson(Json::Value& jFilter, std::string& strSqlOut);

    // 6.5  Records

    // Stores a record and reads it back: jRecInOut becomes the stored row (assigned keys,
    // defaults of the database, members that the table lacks gone). blCreate true: INSERT; false:
    // REPLACE. Returns 0; -1 with jRecInOut as it was; when only the read-back failed the row is
    // stored. The record must hold the last declared member in key order.
    int recSave(Json::Value& jRecInOut, bool blCreate);

    // Creates a record: fills defaults, checks types, inserts, and sets jParamOut to the stored
    // row. jParamIn is not changed (it may be the same object as jParamOut). Returns 0; -1 with
    // jParamOut as it was. A refused duplicate key leaves "DUPLICATE_PRIMARY_KEY" in getErrMsg().
    int recCreate(Json::Value& jParamIn, Json::Value& jParamOut);

    // Appends the rows that the query object jRecParam selects to jRecArrayOut (array or null; a
    // null one stays null when no row was found). A NULL column is absent from its record.
    // Returns 0; -1 on failure, then rows read before it stay in jRecArrayOut.
    int recList(Json::Value& jRecParam, Json::Value& jRecArrayOut);

    // Merges the first row that jRecParam selects into jRecOut (object or null). All matching
    // rows are read: add "limit": 1. Returns 1 when a row was found, 0 when none, -1 on failure;
    // jRecOut is unchanged but for 1.
    int recGetOne(Json::Value& jRecParam, Json::Value& jRecOut);

    // Sets the members of jRecIn on the rows that the SQL condition strSqlWhere (not empty,
    // without the word WHERE, taken as it stands) selects. Types are not checked. Returns 0, also
    // when no row matched, or -1; jRecIn is not changed.
    int recUpdateByWhere(Json::Value& jRecIn, std::string& strSqlWhere);

    // Sets the members of the object jParamIn on the rows that the query object jFilterIn (which
    // must yield a condition) selects, after checkJsonType(jParamIn). Returns 0, also when no row
    // matched, or -1; the arguments are not changed. A UNIQUE failure sets getErrMsg() as in
    // recCreate.
    int recUpdateByFilter(Json::Value& jFilterIn, Json::Value& jParamIn);

    // Deletes the rows that the query object jRecParam selects. Sorting and paging keys have no
    // effect. Without a condition nothing is deleted unless blAllowAll is true: then every row
    // is. jRecParam must be an object, not null. Returns the number of deleted rows or -1.
    int recDelete(Json::Value& jRecParam, bool blAllowAll = false);

    // Deletes every row. Returns their number or -1.
    int recDeleteAll();

    // Deletes the rows whose member szKey, of type "string", equals the one value in strVector.
    // Returns the number of deleted rows or -1. Note: several values are run together to one (see
    // SqlMakeByListField); call recDeleteByName for each.
    int recDeleteByArray(std::vector<std::string>& strVector, const char* szKey);

    // As above, for one value that is not empty.
    int recDeleteByName(std::string& strValue, const char* szKey);

    // Sets member szKey of jParamOut (object or null) to the array of the values. Returns 0, or
    // -1 with jParamOut as it was.
    int VectorParamToJson(std::vector<std::string>& strVector, const char* szKey,
                          Json::Value& jParamOut);

  private:
    sqlite3* m_pDb;         // the caller's
    std::string m_strName;  // table name, and key into the definition and the type cache
    Json::Value m_jTableDef;
    Json::Value m_jReserved;  // always null; part of the layout that hosts were built against
    std::string m_strSqlCreate;
    std::string m_strSqlError;  // SQLite's text for the last failed statement, else empty
    std::string m_strErrMsg;    // the caller's message slot
};

#endif  // VORN_JSON_DB_API_H
