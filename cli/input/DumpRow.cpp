#include "DumpRow.h"

#include <rapidjson/reader.h>

#include <cmath>
#include <utility>

#include "../JsonCells.h"
#include "CheckedText.h"
#include "JsonHandler.h"
#include "Numbers.h"
#include "Utf8.h"

namespace VORN_JSON_DB::Cli {

namespace {

constexpr char kOtherKind[] = "a value is of a kind that no dump has";
constexpr char kOtherForm[] = "a value has an unknown form";

class RowBinder : public rapidjson::BaseReaderHandler<rapidjson::UTF8<>, RowBinder> {
  public:
    explicit RowBinder(sqlite3_stmt* pInto) : m_pInto(pInto) {}

    const std::string& Reason() const { return m_strReason; }

    bool Null() { return Cell() && Bound(sqlite3_bind_null(m_pInto, m_nColumn)); }
    bool Bool(bool) {
        m_strForm = m_strKey;
        return m_nLevel == 2 || Wrong(kOtherKind);
    }
    bool RawNumber(const char* pText, rapidjson::SizeType nText, bool);
    bool String(const char* pText, rapidjson::SizeType nText, bool);
    bool Key(const char* pText, rapidjson::SizeType nText, bool) {
        m_strKey.assign(pText, nText);
        return true;
    }
    bool StartArray() { return m_nLevel++ == 0 || Wrong(kOtherKind); }
    bool EndArray(rapidjson::SizeType nValues) {
        m_nLevel = 0;
        return static_cast<int>(nValues) == sqlite3_bind_parameter_count(m_pInto) || WrongCount();
    }
    bool StartObject();
    bool EndObject(rapidjson::SizeType);

  private:
    bool Wrong(std::string strReason) {
        m_strReason = std::move(strReason);
        return false;
    }
    bool WrongCount() {
        return Wrong("a row has not " + std::to_string(sqlite3_bind_parameter_count(m_pInto)) +
                     " values");
    }
    bool Cell() {
        ++m_nColumn;
        return m_nLevel == 1 || (m_nLevel == 0 ? WrongCount() : Wrong(kOtherForm));
    }
    bool Bound(int nResult) {
        return nResult == SQLITE_OK ||
               (nResult == SQLITE_RANGE ? WrongCount() : Wrong(sqlite3_errstr(nResult)));
    }

    sqlite3_stmt* m_pInto;
    int m_nLevel = 0;
    int m_nColumn = 0;
    std::string m_strReason;
    // Of an object that stands for a value.
    std::string m_strKey;
    std::string m_strForm;
    std::string m_strBytes;
    bool m_blRight = false;
};

bool RowBinder::RawNumber(const char* pText, rapidjson::SizeType nText, bool) {
    const Value Number = JsonNumber({pText, nText});
    if (Number.eKind == Value::Kind::kWide) {
        return Wrong(kOtherKind);
    }
    return Cell() && Bound(Number.eKind == Value::Kind::kReal
                               ? sqlite3_bind_double(m_pInto, m_nColumn, Number.dReal)
                               : sqlite3_bind_int64(m_pInto, m_nColumn, Number.nInteger));
}

bool RowBinder::String(const char* pText, rapidjson::SizeType nText, bool) {
    if (m_nLevel == 2) {
        m_strForm = m_strKey == "encoded" ? m_strForm : m_strKey;
        m_strBytes = m_strKey == "encoded" ? FromBase64({pText, nText}, m_blRight)
                                           : std::string(pText, nText);
        return true;
    }
    return Cell() &&
           Bound(sqlite3_bind_text64(m_pInto, m_nColumn, pText, nText, SQLITE_STATIC, SQLITE_UTF8));
}

bool RowBinder::StartObject() {
    m_strForm.clear();
    m_blRight = false;
    return m_nLevel++ == 1 || Wrong(kOtherForm);
}

bool RowBinder::EndObject(rapidjson::SizeType) {
    m_nLevel = 1;
    Cell();
    if (m_strForm == "$real" && (m_strBytes == "inf" || m_strBytes == "-inf")) {
        return Bound(
            sqlite3_bind_double(m_pInto, m_nColumn, m_strBytes == "inf" ? HUGE_VAL : -HUGE_VAL));
    }
    if (m_blRight && m_strForm == "$text") {
        return Bound(sqlite3_bind_text64(m_pInto, m_nColumn, m_strBytes.data(), m_strBytes.size(),
                                         SQLITE_TRANSIENT, SQLITE_UTF8));
    }
    if (m_blRight && m_strForm == "$base64") {
        return Bound(sqlite3_bind_blob64(m_pInto, m_nColumn, m_strBytes.data(), m_strBytes.size(),
                                         SQLITE_TRANSIENT));
    }
    return Wrong(kOtherForm);
}

}  // namespace

std::string BindRow(LineBuffer& Lines, sqlite3_stmt* pInto) {
    if (!IsUtf8WithoutControls({Lines.Begin(), Lines.Size()})) {
        return "a row has bytes that no dump has";
    }
    constexpr unsigned kFlags = rapidjson::kParseInsituFlag | rapidjson::kParseNumbersAsStringsFlag;
    RowBinder Binder(pInto);
    rapidjson::InsituStringStream Stream(Lines.Begin());
    rapidjson::GenericReader<CheckedText, rapidjson::UTF8<>> Reader;
    const rapidjson::ParseResult Parsed = Reader.Parse<kFlags>(Stream, Binder);
    return Parsed.Code() == rapidjson::kParseErrorTermination ? Binder.Reason()
           : Parsed.IsError()                                 ? JsonErrorText(Parsed.Code())
                                                              : "";
}

}  // namespace VORN_JSON_DB::Cli
