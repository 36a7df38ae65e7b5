#include "LeafSql.h"

#include "Concat.h"

namespace vornjsondb {

namespace {

using VORN_JSON_DB::Op;

bool IsLess(const Json::Value& jLeft, const Json::Value& jRight) {
    if (jLeft.isString() || (jLeft.isInt64() && jRight.isInt64())) {
        return jLeft < jRight;
    }
    return jLeft.asDouble() < jRight.asDouble();
}

bool IsOfForm(OperandForm eForm, const Json::Value& jOperand) {
    switch (eForm) {
        case OperandForm::kPair:
            return jOperand.isArray() && jOperand.size() == 2;
        case OperandForm::kList:
            return jOperand.isArray();
        case OperandForm::kText:
            return jOperand.isString();
        case OperandForm::kFlag:
            return jOperand.isBool();
        default:
            return true;
    }
}

// Whether SQLite may read a number in the text. A date, with its signs behind digits, is none.
bool MayBeNumber(std::string_view strText) {
    const size_t nSign = strText.find_last_of("+-");
    // mutate(exchanged): both only look.
    return strText.find_first_not_of("0123456789.+-eE \t\n\v\f\r") == std::string_view::npos &&
           (nSign == std::string_view::npos || nSign == 0 || strText[nSign - 1] > '9' ||
            strText[nSign - 1] < '0');
}

bool RefuseOperand(const Operator& Row, const Json::Value& jOperand, Problem& Why) {
    return Why.Tell(
        FindingCode::kWrongOperand,
        Concat({Quoted(Row.szName), " takes ", Expected(Row.eForm), ", not ", Shown(jOperand)}));
}

}  // namespace

bool IsOrderedAsText(const Member& Of) {
    return !Of.IsNumber() && Of.Kind() != BoundKind::kBoolean;
}

const char* JsonTypeTest(ValueKind eKind) {
    static constexpr const char* kTests[kValueKinds] = {" = 'null'",  " IN ('integer', 'real')",
                                                        " = 'text'",  " = 'true'",
                                                        " = 'false'", " = 'object'",
                                                        " = 'array'"};
    return kTests[static_cast<size_t>(eKind)];
}

void BoundSql::Add(const BoundValue& Value) {
    // mutate(sunk): who writes literals binds nothing.
    if (pfnLiteral != nullptr) {
        pfnLiteral(Value, strSql);
    } else {
        strSql += '?';
        vecValues.push_back(Value);
    }
}

bool LeafSql::Write(const VORN_JSON_DB::Condition::Node& Leaf, Problem& Why) {
    if (!IsOperator(Leaf.eOp)) {
        return Why.Tell(FindingCode::kUnknownOperator, "there is no operator of this number");
    }
    if (!FindPlace(m_Of, Leaf.strMember, m_Where, Why)) {
        return false;
    }
    m_pMember = &m_Of.At(m_Where.nMember);
    m_blPath = !m_Where.strPath.empty();
    const Operator& Row = RowOf(Leaf.eOp);
    if ((Row.nKinds & (m_blPath ? kPathBit : BitOf(m_pMember->Kind()))) == 0) {
        return Why.Tell(
            FindingCode::kWrongOperator,
            Concat({Quoted(Row.szName), " is not for member ", Quoted(m_pMember->strName),
                    " of type ", Quoted(m_pMember->pType->szName)}));
    }
    m_Out.blReadsJson = m_Out.blReadsJson || m_blPath || Leaf.eOp == Op::kContains;
    return IsOfForm(Row.eForm, Leaf.jOperand) ? WriteOperator(Row, Leaf.jOperand, Why)
                                              : RefuseOperand(Row, Leaf.jOperand, Why);
}

bool LeafSql::WriteOperator(const Operator& Row, const Json::Value& jOperand, Problem& Why) {
    switch (Row.eForm) {
        case OperandForm::kValue:
            return WriteEqual(Row, jOperand, Why);
        case OperandForm::kOrdered:
            return WriteOrdered(Row, jOperand, Why);
        case OperandForm::kPair:
            return WriteBetween(Row, jOperand, Why);
        case OperandForm::kList:
            return WriteIn(Row, jOperand, Why);
        case OperandForm::kText:
            if (Row.eOp == Op::kLike) {
                return WriteLike(jOperand, Why);
            }
            WritePrefix(jOperand);
            return true;
        case OperandForm::kElement:
            return WriteContains(jOperand, Why);
        default:
            AddLeft(ValueKind::kNull);
            m_strSql += jOperand.asBool() ? " IS NULL" : " IS NOT NULL";
            return true;
    }
}

// Texts are compared by their bytes, whatever the table says of the column. So are numbers where
// texts may be, too: the index has one order for both.
void LeafSql::AddLeft(ValueKind eKind) {
    if (m_blPath) {
        m_strSql += ValueAt(m_pMember->strColumn, m_Where.strPath);
    } else {
        const bool blBoth = eKind == ValueKind::kNumber && m_pMember->Kind() == BoundKind::kAny;
        m_strSql += m_pMember->strColumn;
        m_strSql += eKind == ValueKind::kText || blBoth ? " COLLATE BINARY" : "";
    }
}

// The same where an order is asked for. Of two values SQLite makes one kind first, by the column's
// affinity, and all texts would be greater than the number that is made of the operand. The plus
// takes the affinity away, and with it the index.
void LeafSql::AddOrdered(const Operand& What) {
    const bool blText = What.eKind == ValueKind::kText;
    const bool blConverts =
        blText ? m_pMember->eAffinity > Affinity::kText && MayBeNumber(What.Value.strBytes)
               : m_pMember->eAffinity == Affinity::kText;
    m_Out.blNoIndex = m_Out.blNoIndex || (blConverts && !m_blPath);
    m_strSql += blConverts && !m_blPath ? "+" : "";
    AddLeft(What.eKind);
}

void LeafSql::AddKindTest(ValueKind eKind) {
    m_strSql += KindAt(m_pMember->strColumn, m_Where.strPath);
    m_strSql += JsonTypeTest(eKind);
}

// What is said of a value inside of JSON comes with its kind: true is 1 there, and a list a text.
void LeafSql::OpenJson() {
    m_strSql += m_blPath ? "(" : "";
}

void LeafSql::CloseJson(ValueKind eKind) {
    if (m_blPath) {
        m_strSql += " AND ";
        AddKindTest(eKind);
        m_strSql += ')';
    }
}

// A fraction inside of JSON is compared by its text, so that it becomes the number that SQLite
// makes of the same text in the record. The plus takes away the CAST's affinity, which would keep
// SQLite from using an index.
void LeafSql::AddValue(ValueKind eKind, const BoundValue& Value) {
    const bool blCast = eKind == ValueKind::kNumber && Value.eKind == BoundValue::Kind::kText;
    m_strSql += blCast ? "+CAST(" : "";
    m_Out.Add(Value);
    m_strSql += blCast ? " AS REAL)" : "";
}

// IS and IS NOT take NULL for a value, so that one statement serves both.
bool LeafSql::WriteEqual(const Operator& Row, const Json::Value& jOperand, Problem& Why) {
    Operand What;
    if (!m_Reader.Read(m_Where, jOperand, What, Why)) {
        return false;
    }
    const bool blNot = Row.eOp == Op::kNotEqual;
    if (m_blPath) {
        m_strSql += blNot ? "(" : "";
        AddJsonEqual(What);
        m_strSql += blNot ? ") IS NOT TRUE" : "";
        return true;
    }
    AddLeft(IsOrderedAsText(*m_pMember) ? ValueKind::kText : ValueKind::kNumber);
    m_strSql += Row.szSql;
    m_Out.Add(What.Value);
    return true;
}

void LeafSql::AddJsonEqual(const Operand& What) {
    if (What.eKind == ValueKind::kNull) {
        AddLeft(What.eKind);
        m_strSql += " IS NULL";
    } else if (What.Value.eKind == BoundValue::Kind::kNull) {
        AddKindTest(What.eKind);
    } else {
        OpenJson();
        AddLeft(What.eKind);
        m_strSql += " IS ";
        AddValue(What.eKind, What.Value);
        CloseJson(What.eKind);
    }
}

bool LeafSql::ReadOrdered(const Operator& Row, const Json::Value& jValue, Operand& Out,
                          Problem& Why) {
    // mutate(exchanged): nothing is both.
    if (jValue.isString() || jValue.isNumeric()) {
        return m_Reader.Read(m_Where, jValue, Out, Why);
    }
    if (jValue.isNull()) {
        return Why.Tell(FindingCode::kNullOperand,
                        Concat({Quoted(Row.szName), ": nothing is less or greater than null"}));
    }
    return RefuseOperand(Row, jValue, Why);
}

bool LeafSql::WriteOrdered(const Operator& Row, const Json::Value& jOperand, Problem& Why) {
    Operand What;
    if (!ReadOrdered(Row, jOperand, What, Why)) {
        return false;
    }
    const char* szEnd = What.eKind == ValueKind::kText ? Row.szTextsEnd : Row.szNumbersEnd;
    const bool blEnd = !m_blPath && szEnd != nullptr;
    OpenJson();
    m_strSql += blEnd ? "(" : "";
    AddOrdered(What);
    m_strSql += Row.szSql;
    AddValue(What.eKind, What.Value);
    // mutate(exchanged): only one of the two writes anything.
    if (blEnd) {
        m_strSql += " AND ";
        AddLeft(What.eKind);
        m_strSql += szEnd;
        m_strSql += ')';
    }
    CloseJson(What.eKind);
    return true;
}

bool LeafSql::WriteBetween(const Operator& Row, const Json::Value& jPair, Problem& Why) {
    const Json::Value& jFrom = jPair[0U];
    const Json::Value& jTo = jPair[1U];
    Operand Least, Most;
    if (!ReadOrdered(Row, jFrom, Least, Why) || !ReadOrdered(Row, jTo, Most, Why)) {
        return false;
    }
    if (Least.eKind != Most.eKind) {
        return RefuseOperand(Row, jPair, Why);
    }
    // mutate(exchanged): the SQL of what is refused is not run.
    if (IsLess(jTo, jFrom)) {
        return Why.Tell(FindingCode::kSwappedEnds,
                        Concat({"nothing lies between ", Shown(jFrom), " and ", Shown(jTo)}));
    }
    OpenJson();
    AddOrdered(MayBeNumber(Least.Value.strBytes) ? Least : Most);
    m_strSql += " BETWEEN ";
    AddValue(Least.eKind, Least.Value);
    m_strSql += " AND ";
    AddValue(Most.eKind, Most.Value);
    CloseJson(Least.eKind);
    return true;
}

}  // namespace vornjsondb
