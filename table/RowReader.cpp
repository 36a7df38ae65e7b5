#include "RowReader.h"

#include "../src/base/JsonMemory.h"

namespace vornjsondb {

namespace {

using RowKind = VORN_JSON_DB::Row::Kind;

// A column's value. SQLite calls it unprotected, for it is safe in one thread only; that is all
// that a connection may have here, and all else of a column takes its lock once more.
sqlite3_value* ColumnValue(sqlite3_stmt* pStatement, int nColumn) {
    return sqlite3_column_value(pStatement, nColumn);
}

// First the pointer, then the length: the other way round SQLite may convert in between. An empty
// blob has no pointer, and neither has a text for which there is no memory.
std::string_view TextOf(sqlite3_stmt* pStatement, sqlite3_value* pValue) {
    // mutate(exchanged): with values in UTF-8 either order converts once.
    const auto* pText = reinterpret_cast<const char*>(sqlite3_value_text(pValue));
    // mutate(exchanged): without a text nobody asks for its length.
    const int nBytes = sqlite3_value_bytes(pValue);
    // mutate(hoisted): where there is a text, no memory was lacking.
    if (pText == nullptr) {
        if (sqlite3_errcode(sqlite3_db_handle(pStatement)) == SQLITE_NOMEM) {
            ThrowBadAlloc();
        }
        return "";
    }
    return {pText, static_cast<size_t>(nBytes)};
}

Json::Value TextValue(std::string_view strText) {
    return {strText.data(), strText.data() + strText.size()};
}

void ReadJson(std::string_view strText, JsonCodec& Codec, Json::Value& jOut) {
    if (!Codec.Read(strText.data(), strText.size(), jOut)) {
        jOut = TextValue(strText);
    }
}

// Whether a double holds the number exactly.
bool IsExact(sqlite3_int64 nValue) {
    constexpr double kTwoTo63 = 9223372036854775808.0;
    const auto dValue = static_cast<double>(nValue);
    return dValue < kTwoTo63 && static_cast<sqlite3_int64>(dValue) == nValue;
}

// What a value is: of its member's kind where it fits it, else of the stored one.
RowKind KindOf(sqlite3_value* pValue, BoundKind eKind) {
    constexpr RowKind kInt = RowKind::kInteger, kReal = RowKind::kReal, kText = RowKind::kText,
                      kJson = RowKind::kJson, kBlob = RowKind::kBlob, kNull = RowKind::kNull;
    // By SQLite's type, from 1, and the member's: none, text, boolean, integer, real, object, list,
    // JSON, any.
    static constexpr RowKind kKinds[][9] = {
        {kInt, kText, RowKind::kBoolean, kInt, kReal, kInt, kInt, kInt, kInt},
        {kReal, kText, kReal, kReal, kReal, kReal, kReal, kReal, kReal},
        {kText, kText, kText, kText, kText, kJson, kJson, kJson, kText},
        {kBlob, kBlob, kBlob, kBlob, kBlob, kBlob, kBlob, kBlob, kBlob},
        {kNull, kNull, kNull, kNull, kNull, kNull, kNull, kNull, kNull}};
    const int nType = sqlite3_value_type(pValue);
    const RowKind eFound = kKinds[nType - 1][static_cast<size_t>(eKind)];
    const bool blNumber =
        (eFound == RowKind::kBoolean && (sqlite3_value_int64(pValue) & ~sqlite3_int64{1}) != 0) ||
        (eFound == kReal && nType == SQLITE_INTEGER && !IsExact(sqlite3_value_int64(pValue)));
    return blNumber ? kInt : eFound;
}

Json::Value ReadValue(sqlite3_stmt* pStatement, sqlite3_value* pValue, RowKind eKind) {
    switch (eKind) {
        case RowKind::kBoolean:
            return sqlite3_value_int64(pValue) == 1;
        case RowKind::kInteger:
            return static_cast<Json::Int64>(sqlite3_value_int64(pValue));
        case RowKind::kReal:
            return sqlite3_value_double(pValue);
        default:
            return TextValue(TextOf(pStatement, pValue));
    }
}

}  // namespace

RowReader::RowReader(const Members& Of, const std::vector<size_t>& vecColumns,
                     VORN_JSON_DB::Nulls eNulls) try
    : m_vecColumns(vecColumns.begin(), vecColumns.end()), m_jEmpty(Json::objectValue) {
    for (const size_t nMember : m_vecColumns) {
        const Member& Shown = Of.At(nMember);
        const bool blKeepNull = eNulls == VORN_JSON_DB::Nulls::kKeep ||
                                (eNulls == VORN_JSON_DB::Nulls::kAsDefined && Shown.blNullSeen);
        // Members are numbered in the order of their names, as those of a record are.
        m_vecRead.push_back(Column{&Shown, Shown.Kind(), blKeepNull});
        m_jEmpty[Shown.strName] = Json::Value();
    }
}
VORN_JSON_MEMORY_TO_BAD_ALLOC

// The empty record is copied and its values replaced: no search for a name in any row.
Json::Value RowReader::Read(sqlite3_stmt* pStatement, JsonCodec& Codec) const try {
    Json::Value jRecord = m_jEmpty;
    Json::Value::iterator itMember = jRecord.begin();
    bool blLeaveOut = false;
    int nColumn = 0;
    for (const Column& Each : m_vecRead) {
        Json::Value& jMember = *itMember;
        ++itMember;
        sqlite3_value* const pValue = ColumnValue(pStatement, nColumn++);
        const RowKind eKind = KindOf(pValue, Each.eKind);
        // mutate(sunk): with nothing to leave out nothing is.
        if (eKind == RowKind::kJson) {
            // mutate(doubled): it reads the same again.
            ReadJson(TextOf(pStatement, pValue), Codec, jMember);
        } else if (eKind != RowKind::kNull) {
            MakeInPlace(jMember, [&] { return ReadValue(pStatement, pValue, eKind); });
        } else {
            blLeaveOut = blLeaveOut || !Each.blKeepNull;
        }
    }
    // mutate(hoisted, sunk): with nothing to leave out nothing is.
    if (blLeaveOut) {
        // mutate(doubled): the second time there is nothing to leave out.
        LeaveOutNulls(pStatement, jRecord);
    }
    return jRecord;
}
VORN_JSON_MEMORY_TO_BAD_ALLOC

void RowReader::LeaveOutNulls(sqlite3_stmt* pStatement, Json::Value& jRecord) const {
    int nColumn = 0;
    for (const Column& Each : m_vecRead) {
        const int nType = sqlite3_value_type(ColumnValue(pStatement, nColumn++));
        if (nType == SQLITE_NULL && !Each.blKeepNull) {
            jRecord.removeMember(Each.pMember->strName);
        }
    }
}

}  // namespace vornjsondb

namespace VORN_JSON_DB {

int Row::Size() const {
    return static_cast<int>(m_From.vecColumns.size());
}

const std::string& Row::Name(int nColumn) const {
    return m_From.Of.Names()[m_From.vecColumns[static_cast<size_t>(nColumn)]];
}

Row::Kind Row::KindOf(int nColumn) const {
    const size_t nMember = m_From.vecColumns[static_cast<size_t>(nColumn)];
    return vornjsondb::KindOf(vornjsondb::ColumnValue(m_From.pStatement, nColumn),
                              m_From.Of.At(nMember).Kind());
}

std::int64_t Row::Integer(int nColumn) const {
    return sqlite3_column_int64(m_From.pStatement, nColumn);
}

double Row::Real(int nColumn) const {
    return sqlite3_column_double(m_From.pStatement, nColumn);
}

// A blob that is asked for as a text would be one from then on.
std::string_view Row::Text(int nColumn) const {
    sqlite3_value* const pValue = vornjsondb::ColumnValue(m_From.pStatement, nColumn);
    if (sqlite3_value_type(pValue) == SQLITE_BLOB) {
        const auto* const pBytes = static_cast<const char*>(sqlite3_value_blob(pValue));
        return {pBytes, static_cast<size_t>(sqlite3_value_bytes(pValue))};
    }
    return vornjsondb::TextOf(m_From.pStatement, pValue);
}

}  // namespace VORN_JSON_DB
