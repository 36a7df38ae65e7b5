// Tables, members and definitions.

#include "Generator.h"

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

// A name as the definition has it, and as CREATE must write it so that the column is made.
struct OddName {
    std::string strName;
    const char* szInCreate;
};

const OddName& AnyOddName(Random& random) {
    static const OddName s_aNames[] = {{"gr\xc3\xbcn", "gr\xc3\xbcn"},
                                       {"b\xffx", "b\xffx"},
                                       {"limit", "\"limit\""},
                                       {"sort_by", "sort_by"},
                                       {"vornSqlWhereFilter", "vornSqlWhereFilter"},
                                       {"O'Neil", "\"O'Neil\""},
                                       {"\"it's\"", "\"it's\""},
                                       {"\"100%%\"", "\"100%\""},
                                       {"per%cent", "\"per%cent\""},
                                       {"%s", "\"%s\""},
                                       {std::string("n\0ul", 4), "n"},
                                       {std::string("\0", 1), "nul"},
                                       {"", "\"\""}};
    return random.Of(s_aNames);
}

}  // namespace

Generator::Generator(Random& random, const std::string& strBareName) : m_random(random) {
    ChooseNames(strBareName);
    ChooseColumns();
}

void Generator::ChooseNames(const std::string& strBareName) {
    m_strTable = strBareName;
    m_strInCreate = strBareName;
    if (!m_random.OneIn(8)) {
        return;
    }
    switch (m_random.Below(6)) {
        case 0:
            m_strTable = m_strInCreate = "\"" + strBareName + " it's\"";
            break;
        case 1:
            m_strTable = "\"" + strBareName + "100%%\"";
            m_strInCreate = "\"" + strBareName + "100%\"";
            break;
        case 2:
            m_strTable = m_strInCreate = "[" + strBareName + "%s]";
            break;
        case 3:
            m_strTable += std::string("\0nul", 4);
            break;
        case 4:
            m_strTable += "'";
            break;
        default:
            m_strTable = m_strInCreate = strBareName + "\xc3\xbc";
    }
}

void Generator::ChooseColumns() {
    const bool blUsual = m_random.OneIn(2);  // every step can succeed
    std::string strColumns;
    const auto Add = [&](const std::string& strName, const std::string& strInCreate) {
        static constexpr const char* kExtras[] = {" UNIQUE", " NOT NULL", " DEFAULT 'd'", "", "",
                                                  "",        ""};
        const std::string strType =
            !blUsual && m_random.OneIn(8) ? m_random.Of(kRareTypes) : m_random.Of(kUsualTypes);
        const bool blText = strType == "string" || strType.compare(0, 6, "Json::") == 0;
        std::string strColumn = strInCreate + (blText ? " TEXT" : " INTEGER");
        strColumn += m_vecMembers.empty() ? (m_random.OneIn(3) ? "" : " PRIMARY KEY")
                                          : std::string(m_random.Of(kExtras));
        strColumns += (strColumns.empty() ? "" : ", ") + strColumn;
        m_vecMembers.push_back({strName, strType});
    };
    for (const char* szName : kNames) {
        if (m_random.OneIn(2)) {
            Add(szName, szName);
        }
    }
    if (!blUsual && m_random.OneIn(4)) {
        const OddName& name = AnyOddName(m_random);
        Add(name.strName, name.szInCreate);
    }
    if (!blUsual && m_random.OneIn(8)) {
        strColumns += std::string(strColumns.empty() ? "" : ", ") + "unknown TEXT";
    }
    m_strCreate = (m_random.OneIn(2) ? "CREATE TABLE " : "CREATE TABLE IF NOT EXISTS ") +
                  m_strInCreate + " (" + strColumns + ")" + (m_random.OneIn(2) ? ";" : "");
    if (m_random.OneIn(40)) {
        m_strCreate = m_random.OneIn(2) ? "" : "CREATE nonsense";
    }
}

std::string Generator::MemberName() {
    if (m_vecMembers.empty() || m_random.OneIn(8)) {
        return m_random.OneIn(3)   ? ""
               : m_random.OneIn(4) ? AnyOddName(m_random).strName
                                   : m_random.Of(kNames);
    }
    const int nMembers = static_cast<int>(m_vecMembers.size());
    return m_vecMembers[static_cast<std::size_t>(m_random.Below(nMembers))].strName;
}

// ---- definitions --------------------------------------------------------------------------------

Json::Value Generator::Definition() {
    Json::Value jDefinition;
    Json::Value& jMember = jDefinition[m_strTable]["member"] = Json::Value(Json::objectValue);
    for (const Member& member : m_vecMembers) {
        jMember[member.strName]["cpptype"] = member.strType;
        jMember[member.strName]["ignored"] = true;
        if (m_random.OneIn(2) || &member == &m_vecMembers.back()) {
            jMember[member.strName]["cppDefaultValue"] =
                m_random.OneIn(25) ? AnyValue() : Fitting(member.strType);
        }
    }
    if (m_random.OneIn(8)) {
        Spoil(jDefinition);
    }
    return jDefinition;
}

void Generator::Spoil(Json::Value& jDefinition) {
    Json::Value& jTable = jDefinition[m_strTable];
    switch (m_random.Below(11)) {
        case 0:
            jDefinition = Json::Value();
            break;
        case 1:
            jTable = Json::Value();
            break;
        case 2:
            jTable = AnyValue();
            break;
        case 3:
            jTable.removeMember("member");
            break;
        case 4:
            jTable["member"] = AnyValue();
            break;
        case 5:
            jTable["member"] = Json::Value(Json::objectValue);
            break;
        case 6:
            jTable["member"][MemberName()] = AnyValue();
            break;
        case 7:
            jTable["member"][MemberName()]["cpptype"] = AnyValue();
            break;
        case 8:  // the member that comes last
            jTable["member"]["~last"]["cpptype"] = 1;
            break;
        case 9:
            jDefinition = Json::Value(Json::objectValue);
            jDefinition["another table"] = 1;
            break;
        default:
            jDefinition = AnyValue();
    }
}

}  // namespace campaign
