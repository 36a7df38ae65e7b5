#include "Inference.h"

#include <algorithm>

#include "Numbers.h"

namespace VORN_JSON_DB::Cli {

namespace {

// First those of Value::Kind, in its order.
constexpr unsigned kNull = 1;
constexpr unsigned kBoolean = 2;
constexpr unsigned kInteger = 4;
constexpr unsigned kReal = 8;
constexpr unsigned kWide = 16;
constexpr unsigned kText = 32;
constexpr unsigned kObject = 64;
constexpr unsigned kList = 128;
constexpr unsigned kInexact = 256;  // an integer that no double equals for sure
constexpr unsigned kBlob = 512;

unsigned OfInteger(std::int64_t nValue) {
    return nValue > kMostExact || nValue < -kMostExact ? kInteger | kInexact : kInteger;
}

unsigned KindOfJson(std::string_view strJson) {
    if (strJson.substr(0, kBlobBegin.size()) == kBlobBegin) {
        return kBlob;
    }
    if (strJson.substr(0, kTextBegin.size()) == kTextBegin) {
        return kText;
    }
    if (strJson == kInfinity || strJson == kMinusInfinity) {
        return kReal;
    }
    return strJson[0] == '{' ? kObject : kList;
}

unsigned KindsOf(const Value& Given) {
    if (Given.eKind == Value::Kind::kJson) {
        return KindOfJson(Given.strText);
    }
    const unsigned nKind = 1U << static_cast<unsigned>(Given.eKind);
    return nKind == kInteger ? OfInteger(Given.nInteger) : nKind;
}

struct TypeRow {
    unsigned nMost;  // the kinds that the type has room for
    const char* szType;
};

// The first that fits. A list, an object or a boolean beside something else is kept as JSON text,
// so that 5, "5" and true stay apart.
constexpr unsigned kTextsAndNumbers = kText | kWide | kInteger | kInexact | kReal | kBlob;
constexpr TypeRow kTypes[] = {
    {0, "string"},
    {kText | kWide, "string"},
    {kBoolean, "bool"},
    {kInteger | kInexact, "long long"},
    {kInteger | kReal, "double"},
    {kObject, "Json::objectValue"},
    {kList, "Json::arrayValue"},
    {kTextsAndNumbers, "any"},
};

const char* TypeFor(unsigned nKinds, bool blCells) {
    const unsigned nValues = nKinds & ~kNull;
    for (const TypeRow& Row : kTypes) {
        if ((nValues & ~Row.nMost) == 0) {
            // A cell of CSV is a text as long as not all of its column are numbers.
            const bool blText = blCells && Row.nMost == kTextsAndNumbers;
            return blText ? "string" : Row.szType;
        }
    }
    return "Json::Value";
}

}  // namespace

void Inference::BeginInput(bool blCells) {
    m_vecInput.clear();
    m_vecNow.clear();
    m_blCells = blCells;
    m_blOnlyCells = m_blOnlyCells && blCells;
}

void Inference::NewMember(std::string_view strName) {
    auto itFound = m_mapSeen.find(strName);
    if (itFound == m_mapSeen.end()) {
        itFound = m_mapSeen.emplace(strName, m_vecSeen.size()).first;
        m_vecSeen.emplace_back();
        m_vecSeen.back().strName = strName;
    }
    m_vecInput.push_back(itFound->second);
}

void Inference::Take(size_t nMember, const Value& Given) {
    const bool blCell = m_blCells && Given.eKind == Value::Kind::kText;
    m_vecNow.push_back({m_vecInput[nMember], KindsOf(blCell ? CellNumber(Given.strText) : Given)});
}

bool Inference::EndRecord(const Place&) {
    ++m_nRecords;
    for (const Now& Each : m_vecNow) {
        m_vecSeen[Each.nSeen].nKinds |= Each.nKinds;
        ++m_vecSeen[Each.nSeen].nValues;
    }
    m_vecNow.clear();
    return true;
}

bool Inference::BadRecord(const Place&, const std::string&) {
    m_vecNow.clear();
    return true;
}

Json::Value Inference::Members() const {
    Json::Value jMembers(Json::objectValue);
    for (const Seen& Each : m_vecSeen) {
        if (Each.nValues > 0) {
            Json::Value& jMember = jMembers[Each.strName];
            jMember["cpptype"] = TypeFor(Each.nKinds, m_blOnlyCells);
            if ((Each.nKinds & kNull) != 0) {
                jMember["nullSeen"] = true;
            }
        }
    }
    return jMembers;
}

bool Inference::AllHaveValues() const {
    return std::all_of(m_vecSeen.begin(), m_vecSeen.end(),
                       [](const Seen& Each) { return (Each.nKinds & ~kNull) != 0; });
}

std::vector<std::string> Inference::Names() const {
    std::vector<std::string> vecNames;
    vecNames.reserve(m_vecSeen.size());
    for (const Seen& Each : m_vecSeen) {
        vecNames.push_back(Each.strName);
    }
    return vecNames;
}

std::vector<std::string> Inference::Notes() const {
    std::vector<std::string> vecNotes;
    for (const Seen& Each : m_vecSeen) {
        const std::string strMember = "member \"" + Each.strName + "\": ";
        const std::string strType = TypeFor(Each.nKinds, m_blOnlyCells);
        if ((Each.nKinds & kWide) != 0) {
            vecNotes.push_back(strMember + "numbers beyond 64 bits are kept as texts");
        }
        const bool blBlobs = (Each.nKinds & ~kNull) == kBlob;
        if ((strType == "any" && !blBlobs) || strType == "Json::Value") {
            vecNotes.push_back(strMember + "values of several kinds");
        }
        if (Each.nValues > 0 && Each.nValues < m_nRecords && (Each.nKinds & kNull) != 0) {
            vecNotes.push_back(strMember +
                               "null in some records and missing in others; all come back as null");
        }
    }
    return vecNotes;
}

}  // namespace VORN_JSON_DB::Cli
