#include "AccumulatedFormat.h"

#include <cstring>

namespace vornjsondb {

AccumulatedFormat::AccumulatedFormat(std::string_view Text)
    : m_blLiteral(Text.find('%') == std::string_view::npos &&
                  Text.find('\0') == std::string_view::npos) {
    m_Text.Append(Text);
}

// Each "%%" is passed over. A last "%" joins the one of the value's own specifier to another "%%",
// or stands before a NUL, where the formatter writes it as it is.
bool AccumulatedFormat::HoldsConversion() const {
    if (m_blLiteral) {  // mutate(false, exchanged): there is none to be found.
        return false;
    }
    const char* p = m_Text.CStr();
    while ((p = std::strchr(p, '%')) != nullptr && p[1] != '\0') {
        if (p[1] != '%') {
            return true;
        }
        p += 2;
    }
    return false;
}

void AccumulatedFormat::Format(const MemberType& Type, const Json::Value& jValue) {
    if (!m_blLiteral) {
        FormatAgain(Type, jValue);
        return;
    }
    const size_t nBefore = m_Text.Length();
    Type.pfnAppend(jValue, m_Text);
    const std::string_view Value(m_Text.View().data() + nBefore, m_Text.Length() - nBefore);
    // Numbers, which hold no percent sign, stand without quotes.
    // mutate(|| to &&): the longer way gives the same.
    m_blLiteral = Value[0] != '\'' || Value.find('%') == std::string_view::npos;
}

// What the formatter makes of the text and the specifier behind it: the text ends at a NUL, "%%" is
// a percent sign, and the first other conversion is the value's own. There may be none left: the
// value is then lost, as it is there.
void AccumulatedFormat::FormatAgain(const MemberType& Type, const Json::Value& jValue) {
    TextBuffer Value;
    Type.pfnAppend(jValue, Value);
    TextBuffer Format;
    Format.Take(m_Text.Append(Type.szSpecifier));
    const char* pNext = Format.CStr();
    while (const char* pSign = std::strchr(pNext, '%')) {
        m_Text.Append({pNext, static_cast<size_t>(pSign - pNext)});
        if (pSign[1] != '%' && pSign[1] != '\0') {
            m_Text.Append(Value.View());
            pNext = "";
            break;
        }
        m_Text.Append('%');
        pNext = pSign + (pSign[1] == '%' ? 2 : 1);
    }
    m_Text.Append(pNext);
}

}  // namespace vornjsondb
