// What tests of queries ask: which records, which SQL, which findings.

#ifndef VORN_TESTS_TABLE_QUERY_FIXTURE_H
#define VORN_TESTS_TABLE_QUERY_FIXTURE_H

#include <string>
#include <vector>

#include "../../table/QueryPlan.h"
#include "TableFixture.h"

namespace VORN_JSON_DB {

using vornjsondb::QueryUse;

constexpr char kDocs[] = R"({"doc": {"key": "id", "member": {
    "id": {"cpptype": "int"}, "name": {"cpptype": "string"}, "size": {"cpptype": "long long"},
    "rate": {"cpptype": "double"}, "done": {"cpptype": "bool"}, "small": {"cpptype": "unsigned int"},
    "tags": {"cpptype": "Json::arrayValue"}, "map": {"cpptype": "Json::objectValue"},
    "json": {"cpptype": "Json::Value"}, "any": {"cpptype": "any"}}}})";

inline std::string Text(const vornjsondb::BoundValue& Value) {
    using Kind = vornjsondb::BoundValue::Kind;
    switch (Value.eKind) {
        case Kind::kInteger:
            return std::to_string(Value.nValue);
        case Kind::kReal:
            return "real " + Text(Json::Value(Value.dValue));
        case Kind::kText:
            return "'" + std::string(Value.strBytes) + "'";
        case Kind::kBlob:
            return "blob '" + std::string(Value.strBytes) + "'";
        default:
            return "NULL";
    }
}

// "code path: message" of each.
inline std::string Text(const FindingList& vecFindings) {
    std::string strText;
    for (const Finding& Found : vecFindings) {
        strText += (strText.empty() ? "" : "; ") + std::string(Found.szCode) + " " + Found.strPath +
                   ": " + Found.strMessage;
    }
    return strText;
}

inline std::string Replaced(std::string strText, const std::string& strOld,
                            const std::string& strNew) {
    for (size_t n = strText.find(strOld); n != std::string::npos;
         n = strText.find(strOld, n + strNew.size())) {
        strText.replace(n, strOld.size(), strNew);
    }
    return strText;
}

class QueryTest : public TableTest {
  protected:
    QueryTest() {
        Options How;
        How.blCompatible = false;
        Open(kDocs, How);
    }

    // Records 1, 2, ... of which each has one member more.
    void Fill(const std::string& strMember, const std::vector<std::string>& vecValues) {
        int nId = 0;
        for (const std::string& strValue : vecValues) {
            Json::Value jRecord;
            jRecord["id"] = ++nId;
            jRecord[strMember] = Parse(strValue);
            EXPECT_EQ("ok", Text(m_Table.Create(jRecord)));
        }
    }

    // Writes a value into the statement, so that tests see which goes where.
    static void WriteShown(const vornjsondb::BoundValue& Value, std::string& strSql) {
        strSql += "{" + Text(Value) + "}";
    }

    // The statement behind the table's name, names of columns without it; or what is wrong.
    static std::string Sql(const Query& Which, QueryUse eUse = QueryUse::kRead,
                           vornjsondb::BoundSql::WriteLiteral pfnLiteral = nullptr) {
        FindingList vecFindings;
        const vornjsondb::Members Of("doc", Parse(kDocs), vecFindings);
        vornjsondb::JsonCodec Codec;
        vornjsondb::QueryPlan Plan(Of, Codec, pfnLiteral);
        Plan.Resolve(Which, eUse, vecFindings);
        if (vornjsondb::HasError(vecFindings)) {
            return Text(vecFindings);
        }
        std::string strSql;
        Plan.AppendWhere(strSql);
        Plan.AppendTail(strSql);
        return Replaced(strSql, "\"doc\".", "");
    }

    static std::string Where(const std::string& strWhere) {
        const std::string strSql = Sql(Query(Parse("{\"where\": " + strWhere + "}")));
        return strSql.compare(0, 7, " WHERE ") == 0 ? strSql.substr(7) : strSql;
    }

    // The ids of what a query selects, in its order; or why it does not run.
    std::string Ids(const Query& Which) {
        Json::Value jRecords;
        const Status Outcome = m_Table.List(Which, jRecords);
        if (!Outcome.Ok()) {
            return Text(Outcome);
        }
        std::string strIds;
        for (const Json::Value& jRecord : jRecords) {
            strIds += (strIds.empty() ? "" : ",") + Text(jRecord["id"]);
        }
        return strIds;
    }
    std::string Ids(const std::string& strQuery) { return Ids(Query(Parse(strQuery))); }
    std::string IdsWhere(const std::string& strWhere) {
        return Ids("{\"where\": " + strWhere + ", \"sort\": [\"id\"]}");
    }
};

}  // namespace VORN_JSON_DB

#endif  // VORN_TESTS_TABLE_QUERY_FIXTURE_H
