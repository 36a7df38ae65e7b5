#include "LoaderSink.h"

#include <cmath>
#include <utility>

#include "../Command.h"
#include "../JsonCells.h"
#include "../Tables.h"
#include "InputFiles.h"
#include "JsonText.h"
#include "Numbers.h"

namespace VORN_JSON_DB::Cli {

namespace {

using vornjsondb::BoundKind;

bool IsJson(BoundKind eKind) {
    return eKind == BoundKind::kObject || eKind == BoundKind::kList || eKind == BoundKind::kJson;
}

// The record's own fault, which harms no other: a table may also demand that a bad record undoes
// the whole transaction.
bool IsOfRecord(const Status& Outcome, sqlite3* pDb) {
    if (sqlite3_get_autocommit(pDb) != 0) {
        return false;
    }
    return Outcome.Code() == StatusCode::kRefused || Outcome.Code() == StatusCode::kDuplicate ||
           Outcome.Code() == StatusCode::kConstraint;
}

std::string At(const std::string& strInput, const Place& Where) {
    return strInput + ":" + std::to_string(Where.nLine);
}

}  // namespace

LoaderSink::LoaderSink(const Table& Of, Loader& Into, ErrorFile* pErrors, Inference* pSeen,
                       bool blMode, std::function<void()> fnBefore, std::function<bool()> fnAfter)
    : m_Of(Of),
      m_Into(Into),
      m_pErrors(pErrors),
      m_pSeen(pSeen),
      m_blMode(blMode),
      m_fnBefore(std::move(fnBefore)),
      m_fnAfter(std::move(fnAfter)),
      m_vecNumberColumns(NumberColumns(Of.Connection(), Of.Name())),
      m_vecNulls(Of.Members().size()) {}

void LoaderSink::BeginInput(const std::string& strName, bool blCells) {
    m_strInput = strName;
    m_blCells = blCells;
    m_vecColumns.clear();
    if (m_pSeen != nullptr) {
        m_pSeen->BeginInput(blCells);
    }
}

void LoaderSink::NewMember(std::string_view strName) {
    Column Added{std::string(strName), m_Into.MemberIndex(strName), BoundKind::kNone, false};
    if (Added.nLoader >= 0) {
        const Json::Value& jMembers = m_Of.Definition()[m_Of.Name()]["member"];
        Added.eKind = vornjsondb::TypeOfMember(jMembers[Added.strName]).Bound.eKind;
        Added.blNumbers = (Added.eKind == BoundKind::kAny || Added.eKind == BoundKind::kText) &&
                          HasName(m_vecNumberColumns, Added.strName);
    }
    m_vecColumns.push_back(std::move(Added));
    if (m_pSeen != nullptr) {
        m_pSeen->NewMember(strName);
    }
}

void LoaderSink::Take(size_t nMember, const Value& Given) {
    const Column& Into = m_vecColumns[nMember];
    if (m_pSeen != nullptr) {
        m_pSeen->Take(nMember, Given);
    }
    if (Into.nLoader < 0) {
        if (!m_blUnknown) {
            m_strUnknown = Into.strName;
        }
        m_blUnknown = true;
    } else if (Given.eKind == Value::Kind::kNull) {
        m_vecNulls[static_cast<size_t>(Into.nLoader)] = true;
        m_Into.SetNull(Into.nLoader);
    } else if (m_blCells) {
        SetCell(Into, Given.strText);
    } else if (IsJson(Into.eKind)) {
        SetAsJson(Into, Given);
    } else {
        Set(Into, Given);
    }
}

void LoaderSink::Set(const Column& Into, const Value& Given) {
    switch (Given.eKind) {
        case Value::Kind::kBoolean:
            return m_Into.SetBoolean(Into.nLoader, Given.nInteger != 0);
        case Value::Kind::kInteger:
            return m_Into.SetInteger(Into.nLoader, Given.nInteger);
        case Value::Kind::kReal:
            if (Into.eKind == BoundKind::kInteger && MayBeRounded(Given.dReal)) {
                return m_Into.Reject(RoundedText(Into.strName));
            }
            return m_Into.SetReal(Into.nLoader, Given.dReal);
        case Value::Kind::kWide:
            return SetWide(Into, Given.strText);
        case Value::Kind::kJson:
            return SetObject(Into, Given.strText);
        default:
            return SetText(Into, Given.strText);
    }
}

void LoaderSink::SetText(const Column& Into, std::string_view strText) {
    if (Into.blNumbers && IsNumberToSqlite(strText)) {
        m_Into.Reject(NumberColumnText(Into.strName, strText));
    } else {
        m_Into.SetText(Into.nLoader, strText);
    }
}

// What the base64 of {"$base64":true,"encoded":"..."} stands for; false: it is not of this form.
bool LoaderSink::Decode(const Column& Into, std::string_view strBegin, std::string_view strJson) {
    if (strJson.size() < strBegin.size() + 2 || strJson.substr(0, strBegin.size()) != strBegin) {
        return false;
    }
    strJson.remove_prefix(strBegin.size());
    strJson.remove_suffix(2);  // of the text and of the object
    bool blRight = false;
    m_strBytes = FromBase64(std::string(strJson), blRight);
    if (!blRight) {
        m_Into.Reject("member \"" + Into.strName + R"(": its "encoded" is no base64)");
    }
    return true;
}

// What stands for a value that JSON has not goes where such a value may be. Else a list or an
// object is refused there.
void LoaderSink::SetObject(const Column& Into, std::string_view strJson) {
    const bool blAny = Into.eKind == BoundKind::kAny;
    if (blAny && Decode(Into, kBlobBegin, strJson)) {
        m_Into.SetBlob(Into.nLoader, m_strBytes.data(), m_strBytes.size());
    } else if ((blAny || Into.eKind == BoundKind::kText) && Decode(Into, kTextBegin, strJson)) {
        m_Into.SetText(Into.nLoader, m_strBytes);
    } else if ((blAny || Into.eKind == BoundKind::kReal) &&
               (strJson == kInfinity || strJson == kMinusInfinity)) {
        m_Into.SetReal(Into.nLoader, strJson == kInfinity ? HUGE_VAL : -HUGE_VAL);
    } else {
        m_Into.SetJson(Into.nLoader, strJson);
    }
}

// Into a real column the nearest double; else the digits.
void LoaderSink::SetWide(const Column& Into, std::string_view strNumber) {
    double dReal = 0;
    if (Into.eKind == BoundKind::kReal && ToReal(strNumber, dReal)) {
        m_Into.SetReal(Into.nLoader, dReal);
    } else {
        SetText(Into, strNumber);
    }
}

// A member that holds any JSON keeps each value as its text.
void LoaderSink::SetAsJson(const Column& Into, const Value& Given) {
    m_strJson.clear();
    switch (Given.eKind) {
        case Value::Kind::kBoolean:
            return m_Into.SetJson(Into.nLoader, Given.nInteger != 0 ? "true" : "false");
        case Value::Kind::kText:
        case Value::Kind::kWide:  // whose digits no reader of JSON would give back
            AppendQuoted(Given.strText, m_strJson);
            return m_Into.SetJson(Into.nLoader, m_strJson);
        default:
            return m_Into.SetJson(Into.nLoader, Given.strText);
    }
}

// What does not look like the member's type is passed as a text, which the loader then refuses.
void LoaderSink::SetCell(const Column& Into, std::string_view strCell) {
    const Value Number = CellNumber(strCell);
    double dReal = 0;
    switch (Into.eKind) {
        case BoundKind::kReal:
            return ToReal(strCell, dReal) ? m_Into.SetReal(Into.nLoader, dReal)
                                          : SetText(Into, strCell);
        case BoundKind::kInteger:
        case BoundKind::kAny:
            return Set(Into, Number);
        case BoundKind::kBoolean:
            if (strCell == "1" || strCell == "true" || strCell == "0" || strCell == "false") {
                return m_Into.SetBoolean(Into.nLoader, strCell == "1" || strCell == "true");
            }
            return SetText(Into, strCell);
        case BoundKind::kText:
            return SetText(Into, strCell);
        default:
            return m_Into.SetJson(Into.nLoader, strCell);
    }
}

void LoaderSink::NotStored(const Place& Where, const std::string& strReason) {
    if (m_pErrors == nullptr) {
        FailAt(m_strInput, Where.nLine, strReason, kLeaveOut);
    }
    m_pErrors->Add(m_strInput, Where, strReason);
}

bool LoaderSink::EndRecord(const Place& Where) {
    if (m_pSeen != nullptr) {
        m_pSeen->EndRecord(Where);
    }
    if (m_blUnknown) {
        m_blUnknown = false;
        const std::string strNearest = NearestHint(m_strUnknown, m_Of.Members(), "");
        return BadRecord(Where,
                         "the table has no member \"" + m_strUnknown + "\"" +
                             (strNearest.empty() ? "; --add-members adds it"
                                                 : strNearest + " or add it by --add-members"));
    }
    m_fnBefore();
    const Status Outcome = m_Into.EndRecord();
    if (!Outcome.Ok() && (m_pErrors == nullptr || !IsOfRecord(Outcome, m_Of.Connection()))) {
        const bool blDuplicate = Outcome.Code() == StatusCode::kDuplicate;
        const char* const szHint = !blDuplicate ? ""
                                   : m_blMode
                                       ? "; correct it, or leave it out by --errors FILE"
                                       : "; --skip, --replace or --upsert tells what to do with it";
        Fail(ExitOf(Outcome.Code(), kExitBadData),
             At(m_strInput, Where) + ": " + LineOf(Outcome) + szHint);
    }
    if (!Outcome.Ok()) {
        NotStored(Where, Outcome.Message());
    }
    return m_fnAfter();
}

bool LoaderSink::BadRecord(const Place& Where, const std::string& strReason) {
    if (m_pSeen != nullptr) {
        m_pSeen->BadRecord(Where, strReason);
    }
    m_blUnknown = false;
    m_Into.Reject(strReason);
    m_Into.EndRecord().Ignore();  // counts it
    NotStored(Where, strReason);
    return m_fnAfter();
}

}  // namespace VORN_JSON_DB::Cli
