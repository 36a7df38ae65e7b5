#include "AccumulatedFormat.h"

#include <cstring>

#include "../base/SqlText.h"

namespace vornjsondb {

AccumulatedFormat::AccumulatedFormat(const std::string& strText)
    : m_blLiteral(strText.find('%') == std::string::npos &&
                  strText.find('\0') == std::string::npos) {
    m_strText.reserve(strText.length() + kUsualStatement);
    m_strText.append(strText);
}

// Each "%%" is passed over. A last "%" joins the one of the value's own specifier to another "%%",
// or stands before a NUL, where the formatter writes it as it is.
bool AccumulatedFormat::HoldsConversion() const {
    if (m_blLiteral) {  // mutate(false): there is no percent sign to be found.
        return false;
    }
    const char* p = m_strText.c_str();
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
    const size_t nBefore = m_strText.length();
    Type.pfnAppend(jValue, m_strText);
    // Numbers, which hold no percent sign, stand without quotes.
    // mutate(exchanged, || to &&): the longer way gives the same.
    m_blLiteral = m_strText[nBefore] != '\'' || m_strText.find('%', nBefore) == std::string::npos;
}

// What the formatter makes of the text and the specifier behind it: the text ends at a NUL, "%%" is
// a percent sign, and the first other conversion is the value's own. There may be none left: the
// value is then lost, as it is there.
void AccumulatedFormat::FormatAgain(const MemberType& Type, const Json::Value& jValue) {
    std::string strValue;
    Type.pfnAppend(jValue, strValue);
    const std::string strFormat = m_strText + Type.szSpecifier;
    const char* pNext = strFormat.c_str();
    m_strText.clear();
    while (const char* pSign = std::strchr(pNext, '%')) {
        m_strText.append(pNext, static_cast<size_t>(pSign - pNext));
        if (pSign[1] != '%' && pSign[1] != '\0') {
            m_strText += strValue;
            pNext = "";
            break;
        }
        m_strText += '%';
        pNext = pSign + (pSign[1] == '%' ? 2 : 1);
    }
    m_strText += pNext;
}

}  // namespace vornjsondb
