// Random definitions, records, query objects and values: mostly fitting, so that operations
// succeed, and now and then of any kind at all.
#ifndef VORNJSONDB_TESTS_CAMPAIGNS_MODEL_GENERATOR_H
#define VORNJSONDB_TESTS_CAMPAIGNS_MODEL_GENERATOR_H

#include <string>
#include <vector>

#include <json/json.h>

#include "../support/Campaign.h"

namespace campaign {

class Generator {
  public:
    Generator(Random& random, std::string strTable);

    const std::string& TableName() const { return m_strTable; }
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

    Json::Value Fitting(const std::string& strType);
    void ChooseMembers();

    Random& m_random;
    std::string m_strTable;
    std::string m_strCreate;
    std::vector<Member> m_vecMembers;
};

}  // namespace campaign

#endif  // VORNJSONDB_TESTS_CAMPAIGNS_MODEL_GENERATOR_H
