// Member access that no JSON kind makes throw.

#ifndef VORN_BASE_JSON_MEMBER_H
#define VORN_BASE_JSON_MEMBER_H

#include <cstring>
#include <string>
#include <string_view>

#include <json/json.h>

namespace vornjsondb {

// A member's name where the JSON value keeps it; followed by a NUL, which it may also hold.
struct MemberName {
    const char* pBegin;
    const char* pEnd;

    size_t Length() const { return static_cast<size_t>(pEnd - pBegin); }
    std::string_view View() const { return {pBegin, Length()}; }

    bool Is(const char* szName) const { return View() == szName; }
};

inline MemberName NameOf(const char* szName) {
    return MemberName{szName, szName + std::strlen(szName)};
}

inline MemberName NameOf(const std::string& strName) {
    return MemberName{strName.data(), strName.data() + strName.length()};
}

template <typename Iterator>
MemberName NameOf(const Iterator& It) {
    MemberName Name = {};
    Name.pBegin = It.memberName(&Name.pEnd);
    return Name;
}

// The order of JSON objects: by bytes, a name before its continuations. Negative, 0 or positive.
inline int Compare(const MemberName& Left, const MemberName& Right) {
    const int nLeft = static_cast<unsigned char>(*Left.pBegin);
    const int nRight = static_cast<unsigned char>(*Right.pBegin);
    // Most names differ here, which needs no call. Behind an empty name there is a NUL, too.
    // mutate(false): the comparison of the whole gives the same.
    if (nLeft != nRight) {
        return nLeft - nRight;
    }
    return Left.View().compare(Right.View());
}

// The member of that name, or nullptr: also when jValue is no object.
inline const Json::Value* FindMember(const Json::Value& jValue, const MemberName& Name) {
    return jValue.isObject() ? jValue.find(Name.pBegin, Name.pEnd) : nullptr;
}

inline const Json::Value* FindMember(const Json::Value& jValue, const char* szName) {
    return FindMember(jValue, NameOf(szName));
}

inline const Json::Value* FindMember(const Json::Value& jValue, const std::string& strName) {
    return FindMember(jValue, NameOf(strName));
}

// The member of that name of an object, or of a null value, which becomes one; made where there is
// none.
inline Json::Value& MakeMember(Json::Value& jObject, const MemberName& Name) {
    return *jObject.demand(Name.pBegin, Name.pEnd);
}

// How many members the value has: none when it is no object.
inline size_t CountMembers(const Json::Value& jValue) {
    return jValue.isObject() ? jValue.size() : 0;
}

// One member after the other, in key order; none when the value is no object. They are counted: to
// compare JsonCpp's iterators is a call for each, and to ask for the last of them another one.
class MemberWalk {
  public:
    explicit MemberWalk(const Json::Value& jValue)
        : m_it(jValue.begin()), m_nLeft(CountMembers(jValue)) {}

    bool IsDone() const { return m_nLeft == 0; }
    bool IsLast() const { return m_nLeft == 1; }
    void Next() {
        // mutate(true, > to >=, sunk, hoisted): nobody looks behind the last one.
        if (--m_nLeft > 0) {
            ++m_it;
        }
    }

    MemberName Name() const { return NameOf(m_it); }
    const Json::Value& Value() const { return *m_it; }

  private:
    Json::Value::const_iterator m_it;
    size_t m_nLeft;
};

// Finds members of one value by names that are asked for in ascending order, each once, which is
// how JSON objects keep theirs: one step a member instead of a search for each.
class MemberCursor {
  public:
    explicit MemberCursor(const Json::Value& jValue) : m_Walk(jValue) {}

    // As FindMember, for a name behind all that were asked for before.
    const Json::Value* Find(const MemberName& Name);

  private:
    MemberWalk m_Walk;
};

}  // namespace vornjsondb

#endif  // VORN_BASE_JSON_MEMBER_H
