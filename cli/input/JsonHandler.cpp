#include "JsonHandler.h"

#include <utility>

#include "JsonText.h"
#include "Numbers.h"

namespace VORN_JSON_DB::Cli {

namespace {

constexpr const char* kErrorTexts[] = {
    "nothing is wrong",
    "there is no value",
    "something follows the value",
    "no value can begin like this",
    "a member's name in quotes is missing",
    "a colon is missing after a member's name",
    "a comma or } is missing after a member",
    "a comma or ] is missing after an element",
    "\\u needs four hexadecimal digits",
    "\\u gives half of a surrogate pair",
    "a text has an escape that JSON has not, or a control character that must be escaped",
    "a text has no end quote",
    "a text is no UTF-8; convert the input with iconv",
    "a number is greater than any double",
    "a number has no digit after the point",
    "a number has no digit in the exponent",
    "reading was ended",
    "this is no JSON",
};

// U+D800 to U+DFFF, which RapidJSON lets pass when they come as a lone low escape.
bool HasSurrogate(std::string_view strText) {
    for (size_t i = strText.find('\xED'); i != std::string_view::npos;
         i = strText.find('\xED', i + 1)) {
        if (i + 1 < strText.size() && static_cast<unsigned char>(strText[i + 1]) >= 0xA0) {
            return true;
        }
    }
    return false;
}

}  // namespace

const char* JsonErrorText(rapidjson::ParseErrorCode eCode) {
    return kErrorTexts[eCode];
}

JsonHandler::JsonHandler(Sink& To, JsonPosition& At, bool blLists)
    : m_To(To), m_At(At), m_Names(To), m_eList(blLists ? List::kMayBe : List::kNone) {}

// The first thing that is wrong counts.
void JsonHandler::Blame(std::string strReason) {
    if (m_strReason.empty()) {
        m_strReason = std::move(strReason);
    }
}

void JsonHandler::BeginRecord(std::string_view strTaken) {
    m_blInRecord = true;
    ++m_nRecord;
    m_strReason.clear();
    m_Names.BeginRecord();
    m_At.BeginRecord(strTaken);
}

bool JsonHandler::EndRecord() {
    m_blInRecord = false;
    const Place Where{m_nRecord, m_At.RecordLine(), m_At.RecordText()};
    const bool blGoOn =
        m_strReason.empty() ? m_To.EndRecord(Where) : m_To.BadRecord(Where, m_strReason);
    m_blStopped = !blGoOn;
    m_strReason.clear();
    return blGoOn;
}

bool JsonHandler::Broken(const std::string& strReason) {
    if (!m_blInRecord) {
        BeginRecord("");
    }
    Blame(strReason);
    m_nLevel = m_nRecordLevel;
    m_strJson.clear();
    m_vecNested.clear();
    return EndRecord();
}

// A value stands where a record should.
bool JsonHandler::NoRecord(const Value& Given, const char* szKind) {
    std::string strTaken(Given.strText);
    if (Given.eKind == Value::Kind::kText) {
        strTaken.clear();
        AppendQuoted(Given.strText, strTaken);
    } else if (strTaken.empty()) {
        strTaken = szKind;  // null, true, false
    }
    m_eList = List::kNone;  // an object that follows is a record, too
    BeginRecord(strTaken);
    Blame(std::string("the record is ") + szKind + ", not an object");
    return EndRecord();
}

bool JsonHandler::CheckEscapes(std::string_view strText) {
    const bool blWrong = HasSurrogate(strText);
    if (blWrong) {
        Blame("\\u gives half of a surrogate pair");
    }
    return !blWrong;
}

void JsonHandler::SeparateInJson() {
    m_eList = List::kNone;
    const char cLast = m_strJson.back();
    if (cLast != '[' && cLast != '{' && cLast != ':') {
        m_strJson += ',';
    }
}

void JsonHandler::AppendToJson(std::string_view strText) {
    SeparateInJson();
    m_strJson += strText;
}

void JsonHandler::AppendTextToJson(std::string_view strText) {
    SeparateInJson();
    if (m_blEscapes) {
        AppendQuoted(strText, m_strJson);
    } else {
        // What came without escapes needs none.
        m_strJson += '"';
        m_strJson += strText;
        m_strJson += '"';
    }
}

bool JsonHandler::Null() {
    if (IsNested()) {
        AppendToJson("null");
        return true;
    }
    return Scalar(Value(), "null");
}

bool JsonHandler::Bool(bool blValue) {
    if (IsNested()) {
        AppendToJson(blValue ? "true" : "false");
        return true;
    }
    Value Given;
    Given.eKind = Value::Kind::kBoolean;
    Given.nInteger = blValue ? 1 : 0;
    return Scalar(Given, blValue ? "true" : "false");
}

bool JsonHandler::RawNumber(const char* pText, rapidjson::SizeType nText, bool) {
    const std::string_view strText(pText, nText);
    if (!IsNested()) {
        return Scalar(JsonNumber(strText), "a number");
    }
    // What keeps the list or the object would round it. Most numbers are shorter.
    if (nText > 18 && m_strReason.empty() && IsTooWide(strText)) {
        Blame("in the member \"" + m_Names.Name(m_nMember) + "\" the number " +
              std::string(strText) + " has more than 64 bits; write it as a text");
    }
    AppendToJson(strText);
    return true;
}

bool JsonHandler::String(const char* pText, rapidjson::SizeType nText, bool) {
    const std::string_view strText(pText, nText);
    CheckText(strText);
    if (IsNested()) {
        AppendTextToJson(strText);
        return true;
    }
    Value Given;
    Given.eKind = Value::Kind::kText;
    Given.strText = strText;
    return Scalar(Given, "a text");
}

// Of two members with one name only the last would be kept.
void JsonHandler::NestedKey(std::string_view strName) {
    if (m_strReason.empty() && !m_vecNested.back().emplace(strName).second) {
        Blame("in an object of the member \"" + m_Names.Name(m_nMember) + "\" the name \"" +
              std::string(strName) + "\" is there twice");
    }
    AppendTextToJson(strName);
    m_strJson += ':';
}

bool JsonHandler::KeyBesideList(std::string_view strName) {
    Blame("the object has the member \"" + std::string(strName) + "\" beside the list \"" +
          m_strListName + "\"; take the list out of it, or use --format jsonl");
    return false;
}

bool JsonHandler::KeyTwice(std::string_view strName) {
    Blame("the member \"" + std::string(strName) + "\" is there twice");
    return true;
}

bool JsonHandler::Key(const char* pText, rapidjson::SizeType nText, bool) {
    const std::string_view strName(pText, nText);
    const bool blGood = CheckText(strName);
    if (IsNested()) {
        NestedKey(strName);
        return true;
    }
    if (!blGood) {
        m_eList = List::kNone;
        return m_nLevel > m_nRecordLevel;  // nobody is told of a name that is no text
    }
    if (m_nLevel < m_nRecordLevel) {
        return KeyBesideList(strName);
    }
    if (m_eList == List::kMayBe) {
        m_eList = List::kNamed;
        m_strListName = strName;
    } else if (m_eList == List::kNamed) {
        m_eList = List::kNone;
    }
    bool blTwice = false;
    m_nMember = m_Names.Find(strName, blTwice);
    if (m_nMember == MemberNames::kTooMany) {
        Blame(MemberNames::TooMany());
        return false;
    }
    return !blTwice || KeyTwice(strName);
}

// Whether the bracket makes records of what follows, instead of being a part of one.
bool JsonHandler::IsWrappedList(char cBracket) {
    if (m_eList == List::kMayBe && m_nLevel == 0 && cBracket == '[') {
        m_eList = List::kNone;
        m_nRecordLevel = 1;
        return true;
    }
    if (m_eList == List::kNamed && m_nLevel == 1 && cBracket == '[') {
        m_eList = List::kBegun;
    } else if (m_eList == List::kBegun && m_nLevel == 2 && cBracket == '{') {
        // What was taken for a record was the object around the list.
        m_eList = List::kNone;
        m_nRecordLevel = 2;
        m_nRecord = 0;
        m_strJson.clear();
    } else if (m_nLevel > 0) {
        m_eList = List::kNone;
    }
    return false;
}

bool JsonHandler::Open(char cBracket) {
    const bool blList = IsWrappedList(cBracket);
    if (m_nLevel == kMostLevels) {
        m_strReason = "lists and objects are nested more than " + std::to_string(kMostLevels) +
                      " levels deep";
        return false;
    }
    if (!blList && m_nLevel == m_nRecordLevel) {
        BeginRecord(std::string_view(&cBracket, 1));
        if (cBracket == '[') {
            Blame("the record is a list, not an object");
            m_strJson = "[";
        }
    } else if (!blList && OfMember()) {
        m_strJson = cBracket;
    } else if (!blList) {
        AppendToJson(std::string_view(&cBracket, 1));
    }
    if (cBracket == '{' && m_nLevel > m_nRecordLevel) {
        m_vecNested.emplace_back();
    }
    ++m_nLevel;
    return true;
}

bool JsonHandler::Close(char cBracket) {
    --m_nLevel;
    if (m_nLevel < m_nRecordLevel) {
        return true;  // of the list, or of the object around it
    }
    if (m_nLevel == m_nRecordLevel) {
        m_strJson.clear();
        m_eList = List::kNone;
        return EndRecord();
    }
    m_strJson += cBracket;
    if (cBracket == '}') {
        m_vecNested.pop_back();
    }
    if (OfMember() && m_strReason.empty()) {
        Value Given;
        Given.eKind = Value::Kind::kJson;
        Given.strText = m_strJson;
        m_To.Take(m_nMember, Given);
    }
    return true;
}

}  // namespace VORN_JSON_DB::Cli
