#include "Output.h"

#include <algorithm>

#include "JsonCells.h"
#include "Sql.h"
#include "Terminal.h"
#include "input/JsonText.h"

namespace VORN_JSON_DB::Cli {

namespace {

// As the real table has them; a Table knows its members in byte order.
std::vector<std::string> MembersInColumnOrder(const Table& Of) {
    std::vector<std::string> vecLeft = Of.Members();
    std::vector<std::string> vecOrdered;
    for (const std::string& strColumn : Texts(
             Of.Connection(), "SELECT name FROM pragma_table_xinfo(?1) ORDER BY cid", Of.Name())) {
        const auto itMember = std::find(vecLeft.begin(), vecLeft.end(), strColumn);
        if (itMember != vecLeft.end()) {
            vecOrdered.push_back(*itMember);
            vecLeft.erase(itMember);
        }
    }
    vecOrdered.insert(vecOrdered.end(), vecLeft.begin(), vecLeft.end());
    return vecOrdered;
}

std::vector<Column> ColumnsOf(const Context& Call, const Table& Of,
                              const std::vector<std::string>& vecMembers) {
    const Json::Value& jMembers = Of.Definition()[Of.Name()]["member"];
    const std::string strNulls = Call.Text("--nulls");
    std::vector<Column> vecColumns;
    for (const std::string& strMember : vecMembers) {
        const Json::Value& jSeen = jMembers[strMember]["nullSeen"];
        const bool blSeen = jSeen.isBool() && jSeen.asBool();
        vecColumns.push_back({strMember, strNulls.empty() ? blSeen : strNulls == "keep"});
    }
    return vecColumns;
}

Cell CellOf(const Row& From, int nColumn) {
    Cell Value;
    Value.eKind = From.KindOf(nColumn);
    switch (Value.eKind) {
        case Row::Kind::kNull:
            break;
        case Row::Kind::kBoolean:
        case Row::Kind::kInteger:
            Value.nValue = From.Integer(nColumn);
            break;
        case Row::Kind::kReal:
            Value.dValue = From.Real(nColumn);
            break;
        default:
            Value.strText = From.Text(nColumn);
    }
    return Value;
}

// Where in a row the members stand; rows have an order of their own.
std::vector<int> PlacesIn(const Row& Of, const std::vector<std::string>& vecMembers) {
    std::vector<int> vecPlaces;
    for (const std::string& strMember : vecMembers) {
        int nPlace = 0;
        while (nPlace < Of.Size() - 1 && Of.Name(nPlace) != strMember) {
            ++nPlace;
        }
        vecPlaces.push_back(nPlace);
    }
    return vecPlaces;
}

std::string Listed(const Json::Value& jTexts) {
    std::string strList;
    for (const Json::Value& jText : jTexts) {
        strList += (strList.empty() ? "" : ", ") + jText.asString();
    }
    return strList;
}

// A list of texts, such as the members of an index, is one only where a format has lists.
Cell CellOf(const Json::Value& jValue, bool blJson, std::string& strText) {
    Cell Value;
    if (jValue.isBool()) {
        Value.eKind = Row::Kind::kBoolean;
        Value.nValue = jValue.asBool() ? 1 : 0;
    } else if (jValue.isInt64()) {
        Value.eKind = Row::Kind::kInteger;
        Value.nValue = jValue.asInt64();
    } else if (!jValue.isNull()) {
        const bool blList = jValue.isArray();
        Value.eKind = blList && blJson ? Row::Kind::kJson : Row::Kind::kText;
        strText = !blList ? jValue.asString() : blJson ? CompactJson(jValue) : Listed(jValue);
        Value.strText = strText;
    }
    return Value;
}

std::string FormatOf(const Context& Call, bool blForPeople) {
    return Call.Text("--format", blForPeople && !Call.Json() ? "table" : "json");
}

std::unique_ptr<RecordOutput> OutputFor(const Context& Call, const std::string& strFormat,
                                        bool blOne) {
    const bool blHeader = !Call.Has("--no-headers");
    if (strFormat == "csv" || strFormat == "tsv") {
        return SeparatedOutput(strFormat == "csv" ? ',' : '\t', blHeader);
    }
    if (strFormat == "table") {
        return TableOutput(blHeader);
    }
    if (blOne) {
        return JsonOutput(JsonShape::kOne);
    }
    return JsonOutput(strFormat == "jsonl" ? JsonShape::kLines : JsonShape::kList);
}

}  // namespace

void AppendPlain(std::string& strOut, const Cell& Value) {
    switch (Value.eKind) {
        case Row::Kind::kNull:
            return;
        case Row::Kind::kBoolean:
            strOut += Value.nValue != 0 ? "true" : "false";
            return;
        case Row::Kind::kInteger:
            return AppendInteger(strOut, Value.nValue);
        case Row::Kind::kReal:
            return AppendReal(strOut, Value.dValue);
        case Row::Kind::kBlob:
            return AppendBase64(strOut, Value.strText);
        default:
            strOut += Value.strText;
    }
}

std::int64_t WriteRecords(const Context& Call, Table& From, Query Which, bool blOne) {
    const std::unique_ptr<RecordOutput> pTo =
        OutputFor(Call, FormatOf(Call, IsTerminal(stdout)), blOne);
    if (Which.vecMembers.empty()) {
        Which.Members(MembersInColumnOrder(From));
    }
    const std::vector<Column> vecColumns = ColumnsOf(Call, From, Which.vecMembers);
    std::vector<Cell> vecCells(vecColumns.size());
    std::vector<int> vecPlaces;
    std::int64_t nRecords = 0;
    // The query may be wrong, so nothing is written before it runs.
    const Status Read = From.ForEachRow(Which, [&](const Row& Found) {
        if (nRecords++ == 0) {
            vecPlaces = PlacesIn(Found, Which.vecMembers);
            pTo->Begin(vecColumns);
        }
        for (std::size_t nColumn = 0; nColumn < vecCells.size(); ++nColumn) {
            vecCells[nColumn] = CellOf(Found, vecPlaces[nColumn]);
        }
        pTo->Record(vecCells);
        return true;
    });
    Check(Read, Call.Db());
    if (nRecords == 0 && !blOne) {
        pTo->Begin(vecColumns);
    }
    pTo->End();
    return nRecords;
}

void WriteObjects(const Context& Call, const Json::Value& jObjects,
                  const std::vector<std::string>& vecColumns) {
    std::vector<Column> vecShown;
    vecShown.reserve(vecColumns.size());
    for (const std::string& strName : vecColumns) {
        vecShown.push_back({strName, false});
    }
    // Read by people, unless a format is asked for.
    const std::string strFormat = FormatOf(Call, true);
    const std::unique_ptr<RecordOutput> pTo = OutputFor(Call, strFormat, false);
    const bool blJson = strFormat.compare(0, 4, "json") == 0;
    pTo->Begin(vecShown);
    for (const Json::Value& jObject : jObjects) {
        std::vector<std::string> vecTexts(vecColumns.size());
        std::vector<Cell> vecCells(vecColumns.size());
        for (std::size_t nColumn = 0; nColumn < vecColumns.size(); ++nColumn) {
            vecCells[nColumn] = CellOf(jObject[vecColumns[nColumn]], blJson, vecTexts[nColumn]);
        }
        pTo->Record(vecCells);
    }
    pTo->End();
}

namespace {

class JsonWriter : public RecordOutput {
  public:
    explicit JsonWriter(JsonShape eShape) : m_eShape(eShape) {}

    void Begin(const std::vector<Column>& vecColumns) override {
        for (const Column& Shown : vecColumns) {
            std::string strName;
            AppendJsonString(strName, Shown.strName);
            m_vecNames.push_back(strName + ":");
            m_vecShowNull.push_back(Shown.blShowNull);
        }
    }

    void Record(const std::vector<Cell>& vecCells) override {
        m_strLine.clear();
        if (m_eShape == JsonShape::kList) {
            m_strLine += m_blFirst ? "[" : ",\n ";
        }
        m_blFirst = false;
        m_strLine += '{';
        const char* szBetween = "";
        for (std::size_t nColumn = 0; nColumn < vecCells.size(); ++nColumn) {
            const Cell& Value = vecCells[nColumn];
            if (Value.eKind != Row::Kind::kNull || m_vecShowNull[nColumn]) {
                m_strLine += szBetween;
                m_strLine += m_vecNames[nColumn];
                AppendCell(Value);
                szBetween = ",";
            }
        }
        m_strLine += m_eShape == JsonShape::kList ? "}" : "}\n";
        Put(m_strLine);
    }

    void End() override {
        if (m_eShape == JsonShape::kList) {
            Put(m_blFirst ? "[]\n" : "]\n");
        }
    }

  private:
    void AppendCell(const Cell& Value) {
        switch (Value.eKind) {
            case Row::Kind::kNull:
                m_strLine += "null";
                return;
            case Row::Kind::kText:
                return AppendExactText(m_strLine, Value.strText);
            case Row::Kind::kReal:
                return AppendExactReal(m_strLine, Value.dValue);
            case Row::Kind::kJson:
                // Whoever made the table may have put any text there.
                return IsJson(Value.strText) ? AppendJson(m_strLine, Value.strText)
                                             : AppendExactText(m_strLine, Value.strText);
            case Row::Kind::kBlob:
                return AppendBlob(m_strLine, Value.strText);
            default:
                AppendPlain(m_strLine, Value);
        }
    }

    JsonShape m_eShape;
    bool m_blFirst = true;
    std::vector<std::string> m_vecNames;
    std::vector<bool> m_vecShowNull;
    std::string m_strLine;
};

}  // namespace

std::unique_ptr<RecordOutput> JsonOutput(JsonShape eShape) {
    return std::make_unique<JsonWriter>(eShape);
}

}  // namespace VORN_JSON_DB::Cli
