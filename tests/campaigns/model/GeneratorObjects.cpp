// Records, query objects, statements.

#include "Generator.h"

namespace campaign {

Json::Value Generator::Record() {
    if (m_random.OneIn(25)) {
        return AnyValue();
    }
    Json::Value jRecord(Json::objectValue);
    for (const Member& member : m_vecMembers) {
        if (!m_random.OneIn(9)) {
            jRecord[member.strName] = m_random.OneIn(40) ? AnyValue() : Fitting(member.strType);
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
            jChanges[member.strName] = m_random.OneIn(6) ? AnyValue() : Fitting(member.strType);
        }
    }
    if (m_random.OneIn(10)) {
        jChanges["vornSqlWhereFilter"] = m_random.OneIn(5) ? AnyValue() : Json::Value(Condition());
    }
    return jChanges;
}

std::string Generator::Condition() {
    if (m_vecMembers.empty() || m_random.OneIn(12)) {
        return m_random.OneIn(2) ? "1" : Text();
    }
    static constexpr const char* kForms[] = {" is not null", " > 2",     " <> 'x'",  " like '%e%'",
                                             " in (1,2,3)",  " is null", " = 1 or 1"};
    if (m_random.OneIn(8)) {
        return kFailsMidway;
    }
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
            if (m_random.OneIn(8)) {
                jList[1U] = jValue;  // a hole before it
            } else {
                jList.append(jValue);
            }
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
            jQuery[szKey] = m_random.OneIn(6) ? AnyValue()
                            : blText ? Json::Value(m_random.OneIn(2) ? "desc" : MemberName())
                                     : Json::Value(m_random.Below(4));
        }
    }
    return jQuery;
}

std::string Generator::Statement() {
    static constexpr const char* kColumnTexts[] = {"NULL",
                                                   "'{\"k\":[1,2.5]}'",
                                                   "'[1,2'",
                                                   "'{\"k\":1} tail'",
                                                   "99999999999999999999",
                                                   "' 12x'",
                                                   "2",
                                                   "'true'",
                                                   "x'00ff'",
                                                   "3.5"};
    const std::string strSet = "UPDATE " + m_strInCreate + " SET " + MemberName() + " = ";
    switch (m_random.Below(12)) {
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
            return "DELETE FROM " + m_strTable + " WHERE " + Condition() + ";;";
        case 7:
            return strSet + "'" + std::string(1500, '[') + "'";
        case 8:
            return Text();
        case 9:
            return "SELECT " + MemberName() + ", rowid FROM " + m_strInCreate;
        default:
            return strSet + m_random.Of(kColumnTexts) + " WHERE " + Condition() +
                   "; -- and no more";
    }
}

}  // namespace campaign
