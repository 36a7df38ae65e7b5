// Operands, checked against what they are compared with.

#ifndef VORN_TABLE_OPERAND_H
#define VORN_TABLE_OPERAND_H

#include <cstdint>
#include <forward_list>
#include <string>
#include <string_view>
#include <vector>

#include <json/json.h>

#include "../src/base/JsonText.h"
#include "Fit.h"
#include "PathSql.h"

namespace vornjsondb {

// What a condition tells apart inside of JSON, where each value has a kind of its own.
enum class ValueKind : std::uint8_t { kNull, kNumber, kText, kTrue, kFalse, kObject, kList };
constexpr size_t kValueKinds = 7;

struct Operand {
    ValueKind eKind = ValueKind::kNull;
    BoundValue Value;  // kNull where the kind says it all
};

// Points to the text.
BoundValue BoundText(std::string_view strText);

class OperandReader {
  public:
    OperandReader(const Members& Of, JsonCodec& Codec, std::forward_list<std::string>& listTexts)
        : m_Of(Of), m_Codec(Codec), m_listTexts(listTexts) {}

    // A value that can be at that place, or null for NULL.
    bool Read(const Place& Where, const Json::Value& jValue, Operand& Out, Problem& Why);

    // Any JSON, as a path leads to it and a list holds it.
    bool ReadJson(const Json::Value& jValue, Operand& Out, Problem& Why);

    // A text that lives as long as the others.
    BoundValue Keep(std::string strText);

  private:
    bool ReadColumn(const Member& Of, const Json::Value& jValue, Operand& Out, Problem& Why);

    const Members& m_Of;
    JsonCodec& m_Codec;
    std::forward_list<std::string>& m_listTexts;
};

// The list of "$in", kind by kind. What JSON text carries exactly becomes one such text, so that
// lists of any length make the same statement. The rest is bound value by value: fractions, which
// SQLite's JSON reader may round, and texts that are not plain.
struct ListOperand {
    struct OneKind {
        bool blBare = false;  // values of which the kind says it all
        std::string strJson;  // "[1,2]"; empty: none
        std::vector<BoundValue> vecValues;
    };
    OneKind Kinds[kValueKinds];
};
bool ReadList(const Place& Where, const Json::Value& jList, bool blOneByOne, OperandReader& Reader,
              ListOperand& Out, Problem& Why);

// Whether the text goes through JSON and SQL unchanged: UTF-8 without a NUL byte.
bool IsPlainText(std::string_view strText);

}  // namespace vornjsondb

#endif  // VORN_TABLE_OPERAND_H
