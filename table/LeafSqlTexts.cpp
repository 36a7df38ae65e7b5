// "$like" and "$prefix".

#include <string_view>
#include <utility>

#include "Concat.h"
#include "LeafSql.h"

namespace vornjsondb {

namespace {

constexpr size_t kLongestPattern = 50000;  // SQLite's limit in its usual build

// What SQLite cannot take for a pattern, or takes for another one; nullptr: nothing.
const char* PatternFault(std::string_view strPattern) {
    static constexpr std::string_view kEscaped = "%_\\";
    if (strPattern.size() > kLongestPattern) {
        return "is longer than SQLite takes";
    }
    for (size_t i = 0; i < strPattern.size(); ++i) {
        // mutate(exchanged): no character is both.
        if (strPattern[i] == '\0') {
            return "holds a NUL byte, where SQLite ends it";
        }
        if (strPattern[i] == '\\') {
            ++i;
            if (i == strPattern.size() || kEscaped.find(strPattern[i]) == std::string_view::npos) {
                return "has a \\ before something else than %, _ and \\";
            }
        }
    }
    return nullptr;
}

// What follows all texts with that beginning: it, with its last byte raised. Where no byte can be
// raised, the blob that comes behind all texts.
BoundValue Beyond(std::string_view strPrefix, OperandReader& Reader) {
    while (!strPrefix.empty() && strPrefix.back() == '\xff') {
        strPrefix.remove_suffix(1);
    }
    if (strPrefix.empty()) {
        BoundValue Blob;
        Blob.eKind = BoundValue::Kind::kBlob;
        return Blob;
    }
    std::string strBeyond(strPrefix);
    strBeyond.back() = static_cast<char>(static_cast<unsigned char>(strBeyond.back()) + 1);
    return Reader.Keep(std::move(strBeyond));
}

}  // namespace

// With a bare parameter SQLite would prepare the statement again for each pattern.
bool LeafSql::WriteLike(const Json::Value& jPattern, Problem& Why) {
    // mutate(exchanged): the SQL of what is refused is not run.
    if (const char* szFault = PatternFault(BytesOf(jPattern))) {
        return Why.Tell(FindingCode::kBadPattern,
                        Concat({"pattern ", Shown(jPattern), " ", szFault}));
    }
    m_strSql += '(';
    AddLeft(ValueKind::kNull);
    m_strSql += " LIKE ";
    m_Out.Add(BoundText(BytesOf(jPattern)));
    m_strSql += "||'' ESCAPE '\\'";
    // mutate(hoisted): without a path it writes nothing.
    if (m_blPath) {
        CloseJson(ValueKind::kText);
    } else {
        Append(m_strSql, {" AND typeof(", m_pMember->strColumn, ") = 'text')"});
    }
    return true;
}

void LeafSql::WritePrefix(const Json::Value& jPrefix) {
    // mutate(exchanged): in any order.
    const Operand From{ValueKind::kText, BoundText(BytesOf(jPrefix))};
    const Operand To{ValueKind::kText, Beyond(BytesOf(jPrefix), m_Reader)};
    m_strSql += '(';
    AddOrdered(From);
    m_strSql += " >= ";
    m_Out.Add(From.Value);
    m_strSql += " AND ";
    AddOrdered(To);
    m_strSql += " < ";
    m_Out.Add(To.Value);
    m_strSql += m_blPath ? "" : ")";
    CloseJson(ValueKind::kText);
}

}  // namespace vornjsondb
