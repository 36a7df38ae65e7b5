#include "AccumulatedFormat.h"

#include <cstring>
#include <stdexcept>

#include "../util/SqlText.h"

namespace vornjsondb {

namespace {

constexpr size_t kUsualValues = 256;  // room for them, to spare the text growing step by step

SqlText FormatOrThrow(const MemberType& Type, const char* szFormat, const Json::Value& jValue) {
    SqlText szText(Type.pfnFormat(szFormat, jValue));
    if (!szText) {
        throw std::logic_error("vornjsondb: the SQL formatter gave no text");
    }
    return szText;
}

}  // namespace

bool IsPlainFormat(const std::string& strFormat, size_t nSpecifier) {
    size_t nPos = strFormat.find('%');
    while (nPos < nSpecifier) {
        const size_t nNext = nPos + 1;
        // A last "%" is written as it is.
        if (nNext < strFormat.length() && strFormat[nNext] != '%') {
            return false;
        }
        nPos = strFormat.find('%', nNext + 1);
    }
    return true;
}

AccumulatedFormat::AccumulatedFormat(const std::string& strText)
    : m_blLiteral(strText.find('%') == std::string::npos &&
                  strText.find('\0') == std::string::npos) {
    m_strText.reserve(strText.length() + kUsualValues);
    m_strText.append(strText);
}

bool AccumulatedFormat::Format(const MemberType& Type, const Json::Value& jValue) {
    if (!m_blLiteral) {
        return FormatAgain(Type, jValue);
    }
    const SqlText szText = FormatOrThrow(Type, Type.szSpecifier, jValue);
    const size_t nLength = std::strlen(szText.get());
    m_strText.append(szText.get(), nLength);
    m_blLiteral = std::memchr(szText.get(), '%', nLength) == nullptr;
    return true;
}

bool AccumulatedFormat::FormatAgain(const MemberType& Type, const Json::Value& jValue) {
    std::string strFormat = m_strText;
    const size_t nSpecifier = strFormat.length();
    strFormat += Type.szSpecifier;
    // The formatter reads a C string.
    strFormat.resize(std::strlen(strFormat.c_str()));
    if (!IsPlainFormat(strFormat, nSpecifier)) {
        return false;
    }
    m_strText = FormatOrThrow(Type, strFormat.c_str(), jValue).get();
    m_blLiteral = m_strText.find('%') == std::string::npos;
    return true;
}

}  // namespace vornjsondb
