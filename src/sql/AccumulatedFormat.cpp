#include "AccumulatedFormat.h"

#include <cstring>
#include <stdexcept>

#include "../base/SqlText.h"

namespace vornjsondb {

namespace {

SqlText FormatOrThrow(const MemberType& Type, const char* szFormat, const Json::Value& jValue) {
    SqlText szText(Type.pfnFormat(szFormat, jValue));
    if (!szText) {
        throw std::logic_error("vornjsondb: the SQL formatter gave no text");
    }
    return szText;
}

}  // namespace

AccumulatedFormat::AccumulatedFormat(const std::string& strText)
    : m_blLiteral(strText.find('%') == std::string::npos &&
                  strText.find('\0') == std::string::npos) {
    m_strText.reserve(strText.length() + kUsualStatement);
    m_strText.append(strText);
}

// Each "%%" is passed over. A last "%" joins the one of the value's own specifier to another "%%",
// or stands before a NUL, where the formatter writes it as it is.
bool AccumulatedFormat::HoldsConversion() const {
    if (m_blLiteral) {
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
    const SqlText szText = FormatOrThrow(Type, Type.szSpecifier, jValue);
    const size_t nLength = std::strlen(szText.get());
    m_strText.append(szText.get(), nLength);
    m_blLiteral = std::memchr(szText.get(), '%', nLength) == nullptr;
}

void AccumulatedFormat::FormatAgain(const MemberType& Type, const Json::Value& jValue) {
    const std::string strFormat = m_strText + Type.szSpecifier;
    m_strText = FormatOrThrow(Type, strFormat.c_str(), jValue).get();
    m_blLiteral = m_strText.find('%') == std::string::npos;
}

}  // namespace vornjsondb
