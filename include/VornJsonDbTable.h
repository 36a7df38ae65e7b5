// vornjsondb: the second handle on JSON records in SQLite tables.
//
// This header is the manual of the static library vornjsondb-table. VORN_JSON_DB::Table works on
// the same tables as VornJsonDbApi, at the same time. It is for new code, and for input from
// people, the network and big files: every value is bound and every name is checked, so nothing
// that is passed as data can become SQL.
//
// Contents
//    1  Limits: read these first
//    2  Words: definition, key, type names, record
//    3  What a call returns       Status, StatusCode, Retry, Finding
//    4  Queries                   Query, Condition, Op; the JSON notation
//    5  Settings                  Options, Nulls, OnDuplicate, Written
//    6  One table                 Table; Row, for rows without JSON values
//    7  Many records              Loader
//    8  Several calls as one      Transaction
//    9  Definitions               CreateStatement, DefinitionOf, Lint..., Abilities
//
// 1  Limits
//
// The connection is the caller's and must outlive what works on it: a Table keeps prepared
// statements, and sqlite3_close refuses while one lives. So Table, Loader and Transaction go before
// the connection, in any order. A Loader keeps what it needs of its Table. Transactions and loads
// that are open at the same time are savepoints in each other: they end in the reverse order.
// Threads: one at a time for a connection and all that works on it. Any number of threads may each
// have their own; nothing is shared between them.
// SQLite 3.35 or later. Databases are UTF-8; Table::Open refuses UTF-16.
// Waiting: outside of a transaction a locked database is waited for, five seconds unless told
// otherwise, and the whole call is tried again. Inside a transaction that is open already a lock is
// reported at once, because the other side may be waiting for just this transaction. The caller's
// busy handler is neither replaced nor removed; what it waits is part of the time, which it can
// overrun in the last try.
// A call that changes something is whole or nothing, inside a transaction of the caller's too. Some
// failures may undo that transaction with it, as SQLite works: a full disk, an interrupt, and what
// the table's own SQL answers with ROLLBACK. Then the message ends in "the transaction is undone".
// Where that SQL says IGNORE, what was done before stays, as it asks for. And a progress
// handler can interrupt a statement that has done its work: a call is then told as failed, and may
// be done.
// Functions and hooks of the program that SQLite calls in the middle of a call, an SQL function in
// a trigger say, cannot use the same Table, nor a Loader on it: each call returns kMisuse and does
// nothing, and so do the Set calls of the Loader that is just writing. Nor may they destroy it.
// Another Table on the connection is free, as far as SQLite is.
// Locale: with setlocale to a decimal comma some versions of SQLite, 3.40 among them, read
// fractions inside of JSON wrongly. There paths and "$contains" are refused, and so is Open of a
// table with an index on a path, of which a write would spoil the index: call setlocale(LC_NUMERIC,
// "C"), and before Open. With std::locale::global to one, JsonCpp (1.9.5, 1.9.6) reads fractions in
// stored JSON as texts, null or other numbers, and refuses them in Loader::SetJson: keep numbers
// classic. Exceptions: std::bad_alloc, and what a callback of the caller's throws. Nothing is
// logged.
//
// 2  Words
//
// Definition: the JSON object that VornJsonDbApi takes. Keys that it ignores have a meaning here:
//
//    {"task": {"key": "id",
//              "member": {"id":   {"cpptype": "int"},
//                         "name": {"cpptype": "string", "notNull": true, "cppDefaultValue": ""},
//                         "mail": {"cpptype": "string", "unique": true, "nullSeen": true}}}}
//
//    "key"        a member's name or a list of them: what tells one record from all others. Without
//                 it the primary key of the real table counts.
//    "notNull", "unique", "cppDefaultValue"
//                 also go into a table that is created from the definition
//    "nullSeen"   true: a NULL column is read as null; otherwise its member is left out
//
//    type name                                   value                         stored as
//    "string"                                    text, any bytes               text
//    "bool"                                      true, false                   1, 0
//    "int"                                       whole number of 32 bits       integer
//    "unsigned int", "unsigned", "uid_t"         whole number, 0 to 2^32 - 1   integer
//    "long", "long long", "time_t"               whole number of 64 bits       integer
//    "unsigned long", "unsigned long long"       whole number, 0 to 2^63 - 1   integer
//    "double", "float"                           number (1), but not NaN       real
//    "Json::objectValue", "Json::arrayValue"     object; list                  JSON text
//    "Json::Value"                               any JSON but null             JSON text
//    "any"                                       text or number                as it is
//
// (1) A whole number that no double holds exactly, such as 2^53 + 1, is out of range.
//
// A null is SQL's NULL for every type. A value of another kind or range is refused, never
// converted; so is a record without its key where the next one that the table hands out is none of
// the member's values. A stored value that does not fit its member's type, put there by another
// program, is read as what it is.
//
// Record: a JSON object whose members are the definition's. A member that is absent is not
// written; in a new row it gets its default.

#ifndef VORN_JSON_DB_TABLE_H
#define VORN_JSON_DB_TABLE_H

#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include <json/json.h>
#include <sqlite3.h>

namespace VORN_JSON_DB {

// 3  What a call returns

enum class StatusCode {
    kOk,
    kNotFound,    // no such record; from Open, Lint and Sync, no such table
    kDuplicate,   // another record has this key, or this value of a unique member
    kConstraint,  // not null, check, foreign key, trigger; or the table has ignored the record
    kLocked,      // by another connection, or by a running statement of this one
    kRefused,     // the findings say what is wrong with the arguments; where there are none, SQLite
                  // does not take what the message says. Nothing was changed
    kReadOnly,
    kDiskFull,
    kIoError,
    kCorrupt,
    kNotADatabase,
    kInterrupted,
    kNoMemory,
    kMisuse  // a call that the state of the object or of the connection forbids
};

// What helps against a failure.
enum class Retry {
    kNever,       // the same call fails again, until something else is changed
    kCall,        // call again, later
    kTransaction  // roll back, and do the whole transaction again
};

enum class Severity { kNote, kWarning, kError };

// Something wrong or surprising in a definition, query, record or table.
struct Finding {
    Severity eSeverity;
    const char* szCode;      // "unknown-member", say; docs/findings.md has them all
    std::string strPath;     // a JSON pointer into what was looked at: "/where/size/$gt"
    std::string strMessage;  // what is wrong
    std::string strRemedy;   // what to do
};
using FindingList = std::vector<Finding>;

// The outcome of a call. Success without findings holds no memory; copies share theirs.
class [[nodiscard]] Status {
  public:
    Status() = default;

    bool Ok() const { return m_pDetails == nullptr || Code() == StatusCode::kOk; }
    StatusCode Code() const;
    const char* CodeName() const;  // "duplicate"
    Retry Advice() const;

    // A sentence that names table, member and value (shortened), and has SQLite's own words where
    // SQLite failed. Empty on success.
    const std::string& Message() const;

    // Errors come with kRefused, warnings with any code.
    const FindingList& Findings() const;

    // SQLite's extended result code and the errno behind it; 0 where there is none.
    int SqliteCode() const;
    int SystemError() const;

    // For the rare place where a failure makes no difference.
    void Ignore() const {}

    struct Details;
    explicit Status(std::shared_ptr<const Details> pDetails) : m_pDetails(std::move(pDetails)) {}

  private:
    std::shared_ptr<const Details> m_pDetails;
};

// 4  Queries
//
// In JSON. Every key may be absent; {} is every record, with all members:
//
//    {"where": {"size": {"$gte": 5}, "name": {"$prefix": "a"}},
//     "sort": ["name", "-size"], "limit": 10, "offset": 20, "members": ["id", "name"]}
//
//    "where"    conditions that must all hold: {member: value}, or {member: {operator: operand}}
//               with one operator or several
//    "sort"     members, with "-" before a descending one; the key is the last term, so that pages
//               are stable. NULL is less than all else. Texts are ordered and compared by their
//               bytes.
//    "limit", "offset"   whole numbers from 0; each may stand alone
//    "members"  what a record holds; all, if absent
//    "$not": {operator: operand} stands below a member as well; "$and" and "$or" with a list of
//    conditions, and "$not" with one, stand in the place of a member
//
// Each condition is true or false, never unknown: "$ne", "$nin" and "$not" are true for NULL.
// An empty "$in" selects nothing and an empty "$or" is refused: no condition is ever dropped.
// A path leads into a JSON member: "address.city", "tags[0]". What is absent there counts as null.
// To a name with a point, a bracket, a quote or a backslash in it no path leads.
// A blob of another program's whose bytes are JSON is looked into by paths and "$contains", too.
// Within JSON some versions of SQLite, 3.40 among them, end a text at a NUL byte: paths and
// "$contains" then see what stands before it, and operands of theirs with a NUL byte are refused.
// A member of a JSON type is compared whole with {member: value}.
// Unknown members, unknown operators and values that a member's type cannot have are findings, in
// "sort" and "members" of a query that only counts, too.

enum class Op {       // true for a record whose member
    kEqual,           // "$eq", or a plain value: equals the operand; null means is NULL
    kNotEqual,        // "$ne": does not equal it
    kLess,            // "$lt": is less, and of the operand's kind (text or number)
    kLessOrEqual,     // "$lte"
    kGreater,         // "$gt"
    kGreaterOrEqual,  // "$gte"
    kBetween,         // "$between": lies between the two of [a, b], both included
    kIn,              // "$in": equals one of a list of up to 100,000 values
    kNotIn,           // "$nin": equals none of them
    kLike,            // "$like": matches; % is any text, _ any character, \ takes %, _ or \ as
                      // it is; A equals a, as long as SQLite's own LIKE has not been told
                      // otherwise (PRAGMA case_sensitive_like). No index helps.
    kPrefix,          // "$prefix": begins with the operand. An index helps.
    kNull,            // "$null": with true is NULL, with false is not
    kContains         // "$contains": is a list that holds the operand
};

// One condition or a group. Values are values: nothing in them is taken for an operator.
class Condition {
  public:
    Condition(std::string strMember, Json::Value jValue);
    Condition(std::string strMember, Op eOp, Json::Value jOperand);
    static Condition All(std::vector<Condition> vecParts);
    static Condition Any(std::vector<Condition> vecParts);
    static Condition Not(Condition Part);

    struct Node;
    explicit Condition(std::shared_ptr<const Node> pNode) : m_pNode(std::move(pNode)) {}
    const Node& Root() const { return *m_pNode; }

  private:
    std::shared_ptr<const Node> m_pNode;
};

// A query as plain data: written in JSON, or in C++ field by field or as
//
//    Query().Where("size", Op::kGreaterOrEqual, 5).Sort("-size").Limit(10)
//
struct Query {
    Query();
    ~Query();
    Query(const Query& Other);
    Query(Query&& Other) noexcept;
    Query& operator=(const Query& Other);
    Query& operator=(Query&& Other) noexcept;

    // Reads the notation above. What is wrong with jQuery goes to vecFindings, and every call with
    // this query returns it instead of running.
    Query(const Json::Value& jQuery);  // NOLINT(google-explicit-constructor): calls take JSON

    // The same for input from forms: "where" must not hold operators, so that nobody gets in with
    // {"$ne": ""} in the place of a password.
    static Query ValuesOnly(const Json::Value& jQuery);

    // Each call adds: all conditions must hold, sort terms count in turn.
    Query& Where(Condition Added) &;
    Query& Where(std::string strMember, Json::Value jValue) &;
    Query& Where(std::string strMember, Op eOp, Json::Value jOperand) &;
    Query& Sort(std::string strTerm) &;
    Query& Limit(std::int64_t nRows) &;
    Query& Offset(std::int64_t nRows) &;
    Query& Members(std::vector<std::string> vecNames) &;

    // The same for a chain that begins with Query(): what it is kept as takes it without a copy.
    Query&& Where(Condition Added) && { return std::move(Where(std::move(Added))); }
    Query&& Where(std::string strMember, Json::Value jValue) && {
        return std::move(Take(strMember, Op::kEqual, jValue));
    }
    Query&& Where(std::string strMember, Op eOp, Json::Value jOperand) && {
        return std::move(Take(strMember, eOp, jOperand));
    }
    Query&& Sort(std::string strTerm) && { return std::move(Sort(std::move(strTerm))); }
    Query&& Limit(std::int64_t nRows) && { return std::move(Limit(nRows)); }
    Query&& Offset(std::int64_t nRows) && { return std::move(Offset(nRows)); }
    Query&& Members(std::vector<std::string> vecNames) && {
        return std::move(Members(std::move(vecNames)));
    }

    std::vector<Condition> vecWhere;
    std::vector<std::string> vecSort;
    std::int64_t nLimit = -1;  // -1: none
    std::int64_t nOffset = 0;
    std::vector<std::string> vecMembers;  // empty: all
    FindingList vecFindings;

  private:
    Query& Take(std::string& strMember, Op eOp, Json::Value& jOperand);
};

// The text with \ before each %, _ and \, to be part of a "$like" pattern.
std::string EscapeLike(std::string_view strText);

// 5  Settings

// How a NULL column is read.
enum class Nulls {
    kAsDefined,  // null where the definition says "nullSeen", else left out
    kLeaveOut,   // as VornJsonDbApi reads it
    kKeep        // null
};

// What to do with a record whose key is there already.
enum class OnDuplicate {
    kStop,     // kDuplicate
    kSkip,     // leave the stored record as it is, and hand it out
    kReplace,  // give it all members anew: those that are absent get their defaults, but a rowid
               // stays
    kUpsert    // change the given members alone
};

// What became of the record.
enum class Written { kInserted, kSkipped, kReplaced, kUpdated };

struct Options {
    // The table is created, when there is none, from the definition or by the caller's statement.
    bool blCreateTable = false;
    std::string strSqlCreate;

    // Refuses to store what a VornJsonDbApi could not read back: types that it does not read, such
    // as "double", numbers beyond 31 bits in "unsigned int", texts with a NUL byte.
    bool blCompatible = true;

    // Leaves out members of a record that the definition lacks, instead of refusing the record.
    bool blIgnoreUnknown = false;

    Nulls eNulls = Nulls::kAsDefined;
    int nWaitMs = 5000;
    size_t nStatements = 32;  // that are kept prepared, the least used going first
};

// 6  One table

// A row as SQLite has it. Lives as long as the callback that it is handed to.
class Row {
  public:
    enum class Kind { kNull, kBoolean, kInteger, kReal, kText, kJson, kBlob };

    int Size() const;
    const std::string& Name(int nColumn) const;
    Kind KindOf(int nColumn) const;  // by the member's type, where the stored value fits it
    std::int64_t Integer(int nColumn) const;  // of a boolean, too
    double Real(int nColumn) const;
    std::string_view Text(int nColumn) const;  // text, JSON text, or the bytes of a blob

    struct Source;
    explicit Row(const Source& From) : m_From(From) {}

  private:
    const Source& m_From;
};

// The SQL of a query, SQLite's plan for it, and findings such as a full scan that an index spares.
struct Plan {
    std::string strSql;
    std::vector<std::string> vecSteps;
    FindingList vecFindings;
};

// The statements that Sync ran or would run, and what no statement can do safely.
struct SyncReport {
    std::vector<std::string> vecStatements;
    FindingList vecFindings;
};
enum class SyncMode { kLook, kChange };

// The calls of an old handle that a query is made for: recList and recGetOne; recUpdateByFilter
// and recDelete, which cannot sort or page.
enum class OldCall { kRead, kChange };

// A handle on one table. Outputs are as they were after a failure, unless a call says otherwise;
// an input may be the output, too.
class Table {
  public:
    Table();
    ~Table();
    Table(Table&& From) noexcept;
    Table& operator=(Table&& From) noexcept;
    Table(const Table&) = delete;
    Table& operator=(const Table&) = delete;

    // Must come first; a table that is open already becomes another one, or is closed by a failure,
    // but not in a callback of its own. A Loader goes on with what it was. Copies its arguments but
    // the connection. A null definition is made from the real table. kNotFound: there is no such
    // table and Options do not say how to make one, or their statement makes another, which is
    // undone. Columns that the table lacks, or has more, are
    // no failure: see Lint and Sync. What is learned of the real table here (its key, whether it is
    // a view, columns that it computes) is not learned again: open it anew after its schema has
    // been changed otherwise than by Sync and CreateIndex. A table that has become a view refuses
    // changes.
    Status Open(sqlite3* pDb, const std::string& strName, const Json::Value& jDefinition,
                const Options& How = Options());

    const std::string& Name() const;
    const Json::Value& Definition() const;               // without entries of other tables
    const std::vector<std::string>& Members() const;     // in byte order, which loaders count by
    const std::vector<std::string>& KeyMembers() const;  // empty: the table has no key
    bool IsView() const;  // when it was opened; its INSTEAD OF triggers then do what is written
    sqlite3* Connection() const;

    // Writes one record. pjStored, where given, receives the row as it is stored, with keys and
    // defaults of the database and what triggers did. kDuplicate names the member whose value
    // another row has already. Save needs a key, and its members in the record; so does pjStored
    // in a view or a table WITHOUT ROWID. A view takes kStop and kUpsert. Save and Get find a key
    // as a unique index on it compared texts (COLLATE NOCASE, say) when the table was opened: as
    // its columns do, where one does so or there is none. Conditions always compare bytes.
    Status Create(const Json::Value& jRecord, Json::Value* pjStored = nullptr);
    Status Save(const Json::Value& jRecord, OnDuplicate eOnDuplicate,
                Json::Value* pjStored = nullptr, Written* peWritten = nullptr);

    // Reading. Get takes the value of the key, or an object for a key of several members;
    // kNotFound when there is none. First is kNotFound when the query selects nothing.
    Status Get(const Json::Value& jKey, Json::Value& jRecord);
    Status First(const Query& Which, Json::Value& jRecord);
    Status List(const Query& Which, Json::Value& jRecords);
    Status Count(const Query& Which, std::int64_t& nRecords);
    Status Exists(const Query& Which, bool& blExists);

    // One row at a time, in constant memory, until the callback, which must not be empty, returns
    // false. In it the table can be read, and the Table moved and destroyed, and the query changed;
    // but calls that change the table, and Open, return kMisuse. SQL of the caller's must not
    // change its schema there: SQLite would go on with other columns.
    Status ForEach(const Query& Which, const std::function<bool(const Json::Value&)>& fnRecord);
    Status ForEachRow(const Query& Which, const std::function<bool(const Row&)>& fnRow);

    // Sets members of all records that the query selects, or removes these records: all or none,
    // where ON CONFLICT FAIL or a trigger's RAISE(FAIL) end it halfway, too, if they were there
    // when the table was opened. A query without a condition, with sorting or with paging is
    // refused. Of a view no rows are counted: SQLite does not know what its triggers do.
    Status Update(const Query& Which, const Json::Value& jMembers, std::int64_t* pnRows = nullptr);
    Status Remove(const Query& Which, std::int64_t* pnRows = nullptr);
    Status RemoveAll(std::int64_t* pnRows = nullptr);

    // Compares the definition with the real table, and replaces what is in vecFindings.
    Status Lint(FindingList& vecFindings);

    // Adds columns and unique indexes that the definition has more than the table. A unique index
    // compares texts as their column does. Nothing is ever dropped, renamed, rebuilt or retyped;
    // what would need that is a finding.
    Status Sync(SyncMode eMode, SyncReport& Report);

    // Members may be paths, none twice. pstrSql receives the statement. An index that is there is
    // not made a second time.
    Status CreateIndex(const std::vector<std::string>& vecMembers, bool blUnique,
                       std::string* pstrSql = nullptr);

    // How a query, or any one statement that reads this table, would run. Pass no PRAGMA: SQLite
    // runs some of them as it prepares them.
    Status Explain(const Query& Which, Plan& Found);
    Status ExplainSql(const std::string& strSql, Plan& Found);

    // A query object for VornJsonDbApi that means the same as Which, "members" apart: an old
    // handle always reads all. Values in it are data, never SQL.
    Status ToOldQuery(const Query& Which, OldCall eCall, Json::Value& jOldQuery);

    struct Parts;

  private:
    friend class Loader;
    std::shared_ptr<Parts> m_pParts;  // shared with loaders, and with calls that call back
};

// 7  Many records

struct LoadOptions {
    OnDuplicate eOnDuplicate = OnDuplicate::kStop;
    std::int64_t nRowsPerTransaction = 10000;  // 0: all; in a transaction of the caller's, all
    bool blGoOnAfterBad = false;               // a bad record is left out, instead of ending it all
};

// A failure that ends the load takes back those inserted, replaced and skipped since the last
// commit: they are undone.
struct LoadCounts {
    std::int64_t nRecords = 0;  // so far; the number of the last one
    std::int64_t nInserted = 0;
    std::int64_t nReplaced = 0;  // replaced or updated
    std::int64_t nSkipped = 0;
    std::int64_t nFailed = 0;     // bad ones: for what is in them, or by Reject
    std::int64_t nCommitted = 0;  // how many of nRecords a commit has dealt with
};

// Writes records through prepared statements: as JSON values, or member by member from a parser
// that never builds one. Fastest with ordered keys, and with indexes that are made afterwards.
class Loader {
  public:
    Loader();
    ~Loader();  // undoes what was not committed
    Loader(const Loader&) = delete;
    Loader& operator=(const Loader&) = delete;

    // Also starts anew, and then undoes what was not committed. All modes but kStop need a key.
    Status Start(Table& Into, const LoadOptions& How = LoadOptions());

    // Returns what is wrong with this record; its message has the number, from 1.
    // Nothing of a bad record is stored. Without blGoOnAfterBad it ends the load, as other failures
    // do with it: all later calls return the first failure, and what was not committed is undone.
    // So does a lock, whose advice is kTransaction: Start again, behind the nCommitted records.
    Status Add(const Json::Value& jRecord);

    // The same in steps: set members by their place in Table::Members(), in any order, the last
    // value of each counting; then EndRecord. Texts are copied. A value that does not fit is
    // reported by EndRecord.
    int MemberIndex(std::string_view strMember) const;  // -1: none of that name
    void SetNull(int nMember);
    void SetBoolean(int nMember, bool blValue);
    void SetInteger(int nMember, std::int64_t nValue);
    void SetReal(int nMember, double dValue);
    void SetText(int nMember, std::string_view strText);
    void SetJson(int nMember, std::string_view strJson);  // is checked, and stored in compact form
    void SetBlob(int nMember, const void* pBytes, size_t nBytes);  // for members of type "any"
    void Reject(
        const std::string& strReason);  // the record is bad for a reason that the caller knows
    Status EndRecord();

    // Needed at the end; useful between, where a stop must not lose what was done. After kLocked
    // with the advice kCall all is still there, and Commit can be called again.
    Status Commit();

    const LoadCounts& Counts() const;

    struct Parts;

  private:
    std::unique_ptr<Parts> m_pParts;
};

// 8  Several calls as one

// Everything on the connection between Begin and Commit happens whole or not at all. Inside of an
// open transaction it is a savepoint. One that cannot be rolled back alone, for want of memory, is
// undone with all around it: Rollback and the outer Commit say so, the destructor cannot.
class Transaction {
  public:
    enum class Mode {
        kImmediate,  // locks for writing at once, so that no later call can fail for a lock
        kDeferred    // for reading several times from one state
    };

    Transaction() = default;
    ~Transaction();  // rolls back what is not committed
    Transaction(const Transaction&) = delete;
    Transaction& operator=(const Transaction&) = delete;

    Status Begin(sqlite3* pDb, Mode eMode = Mode::kImmediate, int nWaitMs = 5000);

    // After kLocked the transaction is still there, and Commit can be called again. What a commit
    // hook forbids is rolled back, as SQLite works, and the message says so.
    Status Commit();
    Status Rollback();

    bool IsOpen() const { return m_pDb != nullptr; }

  private:
    int Undo();
    void Close();

    sqlite3* m_pDb = nullptr;
    sqlite3_stmt* m_pUndo = nullptr;
    sqlite3_stmt* m_pEnd = nullptr;
    sqlite3_stmt* m_pBegin = nullptr;
    bool m_blSavepoint = false;
    int m_nWaitMs = 0;
};

// 9  Definitions

// The CREATE TABLE statement that Options::blCreateTable runs. Its columns are in byte order, but
// for the members of vecFirst, which come first and in that order; what else is in there is
// ignored.
Status CreateStatement(const std::string& strTable, const Json::Value& jDefinition,
                       std::string& strSql, const std::vector<std::string>& vecFirst = {});

// A definition that fits the columns of a real table or view. A lock is reported at once.
Status DefinitionOf(sqlite3* pDb, const std::string& strTable, Json::Value& jDefinition);

// What is wrong with a definition, for either handle; what an old handle would make of a query
// object, or of a record for recCreate.
FindingList LintDefinition(const std::string& strTable, const Json::Value& jDefinition);
FindingList LintOldQuery(const std::string& strTable, const Json::Value& jDefinition,
                         const Json::Value& jOldQuery);
FindingList LintOldRecord(const std::string& strTable, const Json::Value& jDefinition,
                          const Json::Value& jRecord);

// What either handle can do with a member. blRead false for the old one means that it cannot read
// any row in which the member is not NULL; blQuery, that {member: value} finds the rows with this
// value, lists in a "Json::Value" apart.
struct Abilities {
    bool blCreate, blRead, blUpdate, blQuery;
};
struct MemberAbilities {
    std::string strMember, strType;
    Abilities Old, Compatible, New;  // New: with Options::blCompatible off
};
std::vector<MemberAbilities> AbilitiesOf(const std::string& strTable,
                                         const Json::Value& jDefinition);

}  // namespace VORN_JSON_DB

#endif  // VORN_JSON_DB_TABLE_H
