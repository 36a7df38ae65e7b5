// Random definitions, records, query objects and values: mostly fitting, so that operations
// succeed, and now and then of any kind at all.
#ifndef VORNJSONDB_TESTS_CAMPAIGNS_MODEL_GENERATOR_H
#define VORNJSONDB_TESTS_CAMPAIGNS_MODEL_GENERATOR_H

#include <string>
#include <vector>

#include <json/json.h>

#include "../support/Campaign.h"
#include "ModelHost.h"

namespace campaign {

// A condition that gives the rows of these numbers, and fails at the first other one.
constexpr char kFailsMidway[] = "rowid < 3 or abs(-9223372036854775807 - 1 + 0 * rowid)";

// What belongs to one table. strBareName is a plain SQL name that no other table has.
class Generator {
  public:
    Generator(Random& random, const std::string& strBareName);

    const std::string& TableName() const { return m_strTable; }
    const std::string& NameInSql() const { return m_strInCreate; }
    const std::string& Create() const { return m_strCreate; }

    // The definition that fits the table, or now and then one that is faulty.
    Json::Value Definition();

    Json::Value AnyValue(int nDepth = 0);
    Json::Value Record();
    Json::Value Changes();
    Json::Value Query();
    std::string Condition();
    std::string Statement();
    std::string Text();
    std::string MemberName();

  private:
    struct Member {
        std::string strName;
        std::string strType;
    };

    Json::Value Array(int nDepth);
    Json::Value Fitting(const std::string& strType);
    void ChooseNames(const std::string& strBareName);
    void ChooseColumns();
    void Spoil(Json::Value& jDefinition);

    Random& m_random;
    std::string m_strTable;
    std::string m_strInCreate;  // the table's name as the CREATE statement has it
    std::string m_strCreate;
    std::vector<Member> m_vecMembers;
};

// What the host does during one step. Without a connection no statement is answered with success.
Plan AnyPlan(Random& random, bool blConnected);

}  // namespace campaign

#endif  // VORNJSONDB_TESTS_CAMPAIGNS_MODEL_GENERATOR_H
