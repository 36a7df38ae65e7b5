#include "Affinity.h"

#include <sqlite3.h>

namespace vornjsondb {

namespace {

struct PartRow {
    const char* szPart;  // a pattern of LIKE
    Affinity eAffinity;
};

// The first part that is found decides, in the order in which SQLite looks.
constexpr PartRow kParts[] = {
    {"%INT%", Affinity::kInteger}, {"%CHAR%", Affinity::kText}, {"%CLOB%", Affinity::kText},
    {"%TEXT%", Affinity::kText},   {"%BLOB%", Affinity::kNone}, {"%REAL%", Affinity::kReal},
    {"%FLOA%", Affinity::kReal},   {"%DOUB%", Affinity::kReal},
};

}  // namespace

Affinity AffinityOf(const std::string& strDeclared) {
    for (const PartRow& Row : kParts) {
        if (sqlite3_strlike(Row.szPart, strDeclared.c_str(), 0) == 0) {
            return Row.eAffinity;
        }
    }
    return strDeclared.empty() ? Affinity::kNone : Affinity::kNumeric;
}

bool Keeps(Affinity eAffinity, BoundKind eKind) {
    if (eAffinity == Affinity::kNone) {
        return true;
    }
    switch (eKind) {
        case BoundKind::kBoolean:
        case BoundKind::kInteger:
            return eAffinity == Affinity::kInteger || eAffinity == Affinity::kNumeric;
        case BoundKind::kReal:
            return eAffinity == Affinity::kReal;
        case BoundKind::kAny:
            return false;
        default:
            return eAffinity == Affinity::kText;
    }
}

const char* NameOf(Affinity eAffinity) {
    static constexpr const char* kNames[] = {"no", "text", "numeric", "integer", "real"};
    return kNames[static_cast<size_t>(eAffinity)];
}

}  // namespace vornjsondb
