// The growing text of a value list.
//
// The list is defined by formatting all text so far again with every value: what an earlier value
// or a name brought in is read as a format by the later ones. "%%" thus becomes "%" at each later
// value. Any other conversion in that text would take an argument that nobody passed, or make the
// formatter stop and cut the statement, so that the next value would stand outside its quotes; it
// is refused before it is formatted.
// Text without a percent sign does not change by being formatted: then the new value is only
// appended, which keeps the work linear.

#ifndef VORN_SQL_ACCUMULATED_FORMAT_H
#define VORN_SQL_ACCUMULATED_FORMAT_H

#include <json/json.h>

#include "../base/TextBuffer.h"
#include "../schema/MemberType.h"

namespace vornjsondb {

class AccumulatedFormat {
  public:
    // Starts from a copy of the caller's text.
    explicit AccumulatedFormat(std::string_view Text);

    // Whether the text so far holds a conversion, so that no further value can be formatted.
    bool HoldsConversion() const;

    // Formats the text so far, which holds no conversion, together with one value of a type that
    // can be stored. Throws what the type's pfnAppend throws; the text is of no use then.
    void Format(const MemberType& Type, const Json::Value& jValue);

    // Appends text that later values format too; it holds no percent sign.
    void Append(const char* szText) { m_Text.Append(szText); }

    TextBuffer& Text() { return m_Text; }

  private:
    void FormatAgain(const MemberType& Type, const Json::Value& jValue);

    TextBuffer m_Text;
    bool m_blLiteral;  // neither percent sign nor NUL: formatting the text leaves it as it is
};

}  // namespace vornjsondb

#endif  // VORN_SQL_ACCUMULATED_FORMAT_H
