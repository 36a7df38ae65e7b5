// Words of the command line as members' values, keys and queries.

#ifndef VORNJSONDB_CLI_CONDITIONS_H
#define VORNJSONDB_CLI_CONDITIONS_H

#include <string>
#include <vector>

#include "Command.h"

namespace VORN_JSON_DB::Cli {

// What is typed means a value of the member's type: text as it stands for a text member, else
// JSON. "member:=JSON" is JSON for every type, and so can say null.
struct Assignment {
    std::string strMember;
    Json::Value jValue;
};
bool IsAssignment(const std::string& strWord);
Assignment ParseAssignment(const Table& Of, const std::string& strWord);
Json::Value ParseAssignments(const Table& Of, const std::vector<std::string>& vecWords);

// A key of one member as typed; of several members as a JSON object.
Json::Value ParseKey(const Table& Of, const std::string& strWord);
Query KeyQuery(const Table& Of, const Json::Value& jKey);

void TakeMembers(const Context& Call, Query& Which);  // of --members, if it is given

// member=value words and --where; with --sort, --limit, --offset and --members as far as the
// subcommand has them.
Query ParseQuery(const Context& Call, const Table& Of, const std::vector<std::string>& vecWords);

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_CONDITIONS_H
