#include "Generator.h"

#include <utility>

namespace campaign {

namespace {

constexpr const char* kNames[] = {"a", "b", "id", "name", "text", "z9", "Up", "limit_to"};
constexpr const char* kUsualTypes[] = {
    "string", "string", "int", "int", "long long", "bool", "Json::objectValue", "Json::arrayValue"};
constexpr const char* kRareTypes[] = {"unsigned int",
                                      "unsigned long long",
                                      "Json::Value",
                                      "long",
                                      "unsigned long",
                                      "unsigned",
                                      "double",
                                      "float",
                                      "uid_t",
                                      "time_t",
                                      "INT",
                                      "no such type",
                                      ""};
constexpr const char* kTexts[] = {"",
                                  "x",
                                  "y",
                                  "name",
                                  "O'Neil",
                                  "''",
                                  "100%% sure",
                                  "50% off",
                                  "%",
                                  "%%",
                                  "%%%%",
                                  "%d",
                                  "1",
                                  "-7",
                                  "7abc",
                                  "null",
                                  "{\"a\":[1]}",
                                  "[1,2]",
                                  "{broken",
                                  "gr\xc3\xbc\xc3\x9f",
                                  "tab\tline\nend",
                                  "\x01",
                                  "\\",
                                  "a \"quote\"",
                                  "; drop table x; --"};
constexpr Json::Int64 kNumbers[] = {0,
                                    1,
                                    2,
                                    3,
                                    4,
                                    5,
                                    -1,
                                    42,
                                    2147483647,
                                    2147483648,
                                    4294967295,
                                    -2147483649,
                                    9007199254740993,
                                    9223372036854775807,
                                    -9223372036854775807 - 1};
constexpr double kReals[] = {0.5, 1.0, 3.0, -2.25, 1e10, 1e300, 0.1};

}  // namespace

Generator::Generator(Random& random, std::string strTable)
    : m_random(random), m_strTable(std::move(strTable)) {
    ChooseMembers();
}

void Generator::ChooseMembers() {
    std::string strColumns;
    for (const char* szName : kNames) {
        if (!m_random.OneIn(2)) {
            continue;
        }
        const std::string strType =
            m_random.OneIn(10) ? m_random.Of(kRareTypes) : m_random.Of(kUsualTypes);
        static constexpr const char* kExtras[] = {" UNIQUE", " NOT NULL", " DEFAULT 'd'", "", "",
                                                  "",        ""};
        const bool blText = strType == "string" || strType.compare(0, 6, "Json::") == 0;
        std::string strColumn = std::string(szName) + (blText ? " TEXT" : " INTEGER");
        strColumn += m_vecMembers.empty() ? (m_random.OneIn(3) ? "" : " PRIMARY KEY")
                                          : std::string(m_random.Of(kExtras));
        strColumns += (strColumns.empty() ? "" : ", ") + strColumn;
        m_vecMembers.push_back({szName, strType});
    }
    if (m_random.OneIn(15)) {
        strColumns += std::string(strColumns.empty() ? "" : ", ") + "unknown TEXT";
    }
    m_strCreate = (m_random.OneIn(2) ? "CREATE TABLE " : "CREATE TABLE IF NOT EXISTS ") +
                  m_strTable + " (" + strColumns + ")" + (m_random.OneIn(2) ? ";" : "");
    if (m_random.OneIn(40)) {
        m_strCreate = m_random.OneIn(2) ? "" : "CREATE nonsense";
    }
}

Json::Value Generator::Definition() {
    Json::Value jDefinition;
    Json::Value& jTable = jDefinition[m_strTable];
    Json::Value& jMember = jTable["member"] = Json::Value(Json::objectValue);
    for (const Member& member : m_vecMembers) {
        jMember[member.strName]["cpptype"] = member.strType;
        jMember[member.strName]["ignored"] = true;
        if (m_random.OneIn(2) || &member == &m_vecMembers.back()) {
            jMember[member.strName]["cppDefaultValue"] =
                m_random.OneIn(12) ? AnyValue() : Fitting(member.strType);
        }
    }
    if (!m_random.OneIn(12)) {
        return jDefinition;
    }
    switch (m_random.Below(7)) {
        case 0:
            return Json::Value();
        case 1:
            jTable = AnyValue();
            break;
        case 2:
            jTable.removeMember("member");
            break;
        case 3:
            jTable["member"] = AnyValue();
            break;
        case 4:
            jMember[MemberName()] = AnyValue();
            break;
        case 5:
            jMember[MemberName()]["cpptype"] = AnyValue();
            break;
        default:
            jDefinition = AnyValue();
    }
    return jDefinition;
}

// ---- values -------------------------------------------------------------------------------------

std::string Generator::Text() {
    if (m_random.OneIn(60)) {
        return std::string("cut\0here", 8);
    }
    if (m_random.OneIn(30)) {
        return std::string(static_cast<std::size_t>(m_random.Below(3000)), 'l');
    }
    return m_random.Of(kTexts);
}

std::string Generator::MemberName() {
    if (m_vecMembers.empty() || m_random.OneIn(8)) {
        return m_random.OneIn(3) ? "" : m_random.Of(kNames);
    }
    return m_vecMembers[static_cast<std::size_t>(
                            m_random.Below(static_cast<int>(m_vecMembers.size())))]
        .strName;
}

Json::Value Generator::AnyValue(int nDepth) {
    Json::Value jValue;
    const int nParts = m_random.Below(4);
    switch (m_random.Below(nDepth < 3 ? 9 : 6)) {
        case 0:
            return jValue;
        case 1:
            return m_random.OneIn(2);
        case 2:
            return m_random.Of(kNumbers);
        case 3:
            return m_random.Of(kReals);
        case 4:
            return static_cast<Json::UInt64>(m_random.Next());
        case 5:
            return Text();
        case 6:
        case 7:
            jValue = Json::Value(Json::arrayValue);
            for (int i = 0; i < nParts; ++i) {
                jValue.append(AnyValue(nDepth + 1));
            }
            return jValue;
        default:
            jValue = Json::Value(Json::objectValue);
            for (int i = 0; i < nParts; ++i) {
                jValue[m_random.OneIn(2) ? m_random.Of(kNames) : "key'%"] = AnyValue(nDepth + 1);
            }
            return jValue;
    }
}

Json::Value Generator::Fitting(const std::string& strType) {
    if (strType == "string") {
        return Text();
    }
    if (strType == "bool") {
        return m_random.OneIn(2);
    }
    if (strType.compare(0, 6, "Json::") == 0) {
        Json::Value jValue = AnyValue();
        const bool blList = strType == "Json::arrayValue";
        if (blList ? !jValue.isArray() : !jValue.isObject()) {
            jValue = Json::Value(blList ? Json::arrayValue : Json::objectValue);
        }
        return jValue;
    }
    if (strType == "double" || strType == "float") {
        return m_random.Of(kReals);
    }
    return m_random.OneIn(5) ? m_random.Of(kNumbers) : static_cast<Json::Int64>(m_random.Below(9));
}

// ---- objects ------------------------------------------------------------------------------------

Json::Value Generator::Record() {
    if (m_random.OneIn(25)) {
        return AnyValue();
    }
    Json::Value jRecord(Json::objectValue);
    for (const Member& member : m_vecMembers) {
        if (!m_random.OneIn(9)) {
            jRecord[member.strName] = m_random.OneIn(20) ? AnyValue() : Fitting(member.strType);
        }
    }
    if (m_random.OneIn(6)) {
        jRecord["extra"] = AnyValue();
    }
    return jRecord;
}

Json::Value Generator::Changes() {
    if (m_random.OneIn(25)) {
        return AnyValue();
    }
    Json::Value jChanges(Json::objectValue);
    for (const Member& member : m_vecMembers) {
        if (m_random.OneIn(3)) {
            jChanges[member.strName] = m_random.OneIn(15) ? AnyValue() : Fitting(member.strType);
        }
    }
    if (m_random.OneIn(10)) {
        jChanges["vornSqlWhereFilter"] = Condition();
    }
    return jChanges;
}

std::string Generator::Condition() {
    if (m_vecMembers.empty() || m_random.OneIn(12)) {
        return m_random.OneIn(2) ? "1" : Text();
    }
    static constexpr const char* kForms[] = {" is not null", " > 2",     " <> 'x'",  " like '%e%'",
                                             " in (1,2,3)",  " is null", " = 1 or 1"};
    return MemberName() + m_random.Of(kForms);
}

Json::Value Generator::Query() {
    if (m_random.OneIn(20)) {
        return AnyValue();
    }
    Json::Value jQuery(Json::objectValue);
    for (const Member& member : m_vecMembers) {
        if (!m_random.OneIn(5)) {
            continue;
        }
        Json::Value jValue = m_random.OneIn(10) ? AnyValue() : Fitting(member.strType);
        if (m_random.OneIn(3) && !jValue.isArray()) {
            Json::Value jList(Json::arrayValue);
            jList.append(jValue);
            if (m_random.OneIn(4)) {
                jList.append(Fitting(member.strType));
            }
            jValue = jList;
        }
        jQuery[member.strName] = jValue;
    }
    if (m_random.OneIn(3)) {
        jQuery["vornSqlWhereFilter"] = m_random.OneIn(20) ? AnyValue() : Json::Value(Condition());
    }
    for (const char* szKey : {"sort_by", "sort_direction", "limit", "offset"}) {
        if (m_random.OneIn(4)) {
            const bool blText = szKey[0] == 's';
            jQuery[szKey] = m_random.OneIn(12) ? AnyValue()
                            : blText ? Json::Value(m_random.OneIn(2) ? "desc" : MemberName())
                                     : Json::Value(m_random.Below(4));
        }
    }
    return jQuery;
}

std::string Generator::Statement() {
    switch (m_random.Below(10)) {
        case 0:
            return "BEGIN";
        case 1:
            return "COMMIT";
        case 2:
            return "ROLLBACK";
        case 3:
            return "";
        case 4:
            return "SELECT * FROM " + m_strTable;
        case 5:
            return "INSERT INTO " + m_strTable + " DEFAULT VALUES; DELETE FROM nowhere; COMMIT";
        case 6:
            return "UPDATE " + m_strTable + " SET " + MemberName() + " = NULL";
        case 7:
            return "UPDATE " + m_strTable + " SET " + MemberName() + " = '{\"k\":[1,2.5]}' WHERE " +
                   Condition() + "; -- and no more";
        case 8:
            return "DELETE FROM " + m_strTable + " WHERE " + Condition() + ";;";
        default:
            return Text();
    }
}

}  // namespace campaign
