// One condition on one member, as SQL. The class's lists and texts have a file of their own each.

#ifndef VORN_TABLE_LEAF_SQL_H
#define VORN_TABLE_LEAF_SQL_H

#include <string>
#include <vector>

#include "ConditionNode.h"
#include "Operand.h"
#include "Operators.h"

namespace vornjsondb {

// A statement that is being written, and its values.
struct BoundSql {
    // Writes a value where a statement that binds has a question mark.
    using WriteLiteral = void (*)(const BoundValue& Value, std::string& strSql);

    std::string strSql;
    std::vector<BoundValue> vecValues;         // in the order of the question marks
    std::forward_list<std::string> listTexts;  // that values point to
    WriteLiteral pfnLiteral = nullptr;         // nullptr: values are bound
    bool blReadsJson = false;                  // a path or "$contains" is in it
    bool blNoIndex = false;                    // a condition is in it that no index serves for the
                                               // affinity of its column

    void Add(const BoundValue& Value);
};

class LeafSql {
  public:
    LeafSql(const Members& Of, JsonCodec& Codec, BoundSql& Out)
        : m_Of(Of), m_Reader(Of, Codec, Out.listTexts), m_Out(Out), m_strSql(Out.strSql) {}

    // Appends the condition. False, with Why and part of it appended, when it makes no sense.
    bool Write(const VORN_JSON_DB::Condition::Node& Leaf, Problem& Why);

  private:
    bool WriteOperator(const Operator& Row, const Json::Value& jOperand, Problem& Why);
    bool WriteEqual(const Operator& Row, const Json::Value& jOperand, Problem& Why);
    bool WriteOrdered(const Operator& Row, const Json::Value& jOperand, Problem& Why);
    bool WriteBetween(const Operator& Row, const Json::Value& jPair, Problem& Why);
    bool ReadOrdered(const Operator& Row, const Json::Value& jValue, Operand& Out, Problem& Why);
    bool WriteIn(const Operator& Row, const Json::Value& jList, Problem& Why);
    bool WriteContains(const Json::Value& jElement, Problem& Why);
    bool WriteLike(const Json::Value& jPattern, Problem& Why);
    void WritePrefix(const Json::Value& jPrefix);

    void AddLeft(ValueKind eKind);
    void AddOrdered(const Operand& What);
    void AddKindTest(ValueKind eKind);
    void AddValue(ValueKind eKind, const BoundValue& Value);
    void AddJsonEqual(const Operand& What);
    void OpenJson();
    void CloseJson(ValueKind eKind);

    const Members& m_Of;
    OperandReader m_Reader;
    BoundSql& m_Out;
    std::string& m_strSql;
    Place m_Where;  // of the leaf
    const Member* m_pMember = nullptr;
    bool m_blPath = false;
};

// Whether the order of a column's values is that of their bytes.
bool IsOrderedAsText(const Member& Of);

// What follows json_type where a value is of that kind: " = 'text'".
const char* JsonTypeTest(ValueKind eKind);

}  // namespace vornjsondb

#endif  // VORN_TABLE_LEAF_SQL_H
