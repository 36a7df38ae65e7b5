// The first byte says how to load; the rest is a list of setters with their values, of which many
// take any bytes.

#include <algorithm>
#include <array>
#include <cstring>

#include "JsonValues.h"
#include "TableHost.h"
#include "TableMembers.h"

using namespace fuzzhost;
using VORN_JSON_DB::Loader;
using VORN_JSON_DB::LoadOptions;
using VORN_JSON_DB::OnDuplicate;
using VORN_JSON_DB::Status;
using VORN_JSON_DB::StatusCode;
using VORN_JSON_DB::Table;
using Use = TableHost::Use;

namespace {

constexpr int kMembers = 11;
constexpr int kNumbers = kMembers + 1;  // the last is none of theirs

class Bytes {
  public:
    Bytes(const uint8_t* pData, size_t nSize)
        : m_pNext(reinterpret_cast<const char*>(pData)), m_nLeft(nSize) {}

    bool AtEnd() const { return m_nLeft == 0; }
    unsigned One() {
        const std::string strOne = Take(1);
        return strOne.empty() ? 0U : static_cast<unsigned char>(strOne[0]);
    }
    std::string Some() { return Take(One()); }
    template <typename Number>
    Number As() {
        Number nMade = {};
        const std::string strBytes = Take(sizeof(nMade));
        std::memcpy(&nMade, strBytes.data(), strBytes.size());
        return nMade;
    }

  private:
    std::string Take(size_t nWanted) {
        const size_t nTaken = std::min(nWanted, m_nLeft);
        std::string strTaken(m_pNext, nTaken);
        m_pNext += nTaken;
        m_nLeft -= nTaken;
        return strTaken;
    }

    const char* m_pNext;
    size_t m_nLeft;
};

// Plays the list into a loader and knows which records cannot be good ones.
class Player {
  public:
    Player(Loader& Into, Bytes& From) : m_Into(Into), m_From(From) {}

    // False when a call has failed in a way that ends the load.
    Status Step() {
        const unsigned nKind = m_From.One() % 10;
        if (nKind == 7) {
            return EndRecord();
        }
        if (nKind == 8) {
            return m_Into.Commit();
        }
        const int nMember = static_cast<int>(m_From.One() % kNumbers);
        m_aNoJson[static_cast<size_t>(nMember)] = false;
        Set(nKind, nMember);
        return {};
    }

    Status EndRecord() {
        const bool blNoJson = std::count(m_aNoJson.begin(), m_aNoJson.end(), true) > 0;
        m_aNoJson.fill(false);
        Status Outcome = m_Into.EndRecord();
        Require(!blNoJson || !Outcome.Ok(), "what is no JSON is not stored");
        return Outcome;
    }

  private:
    void Set(unsigned nKind, int nMember) {
        switch (nKind) {
            case 0:
                return m_Into.SetNull(nMember);
            case 1:
                return m_Into.SetBoolean(nMember, m_From.One() % 2 == 1);
            case 2:
                return m_Into.SetInteger(nMember, m_From.As<std::int64_t>());
            case 3:
                return m_Into.SetReal(nMember, m_From.As<double>());
            case 4:
                return m_Into.SetText(nMember, m_From.Some());
            case 5:
                return SetJson(nMember);
            case 6: {
                const std::string strBytes = m_From.Some();
                return m_Into.SetBlob(nMember, strBytes.data(), strBytes.size());
            }
            case 9:
                return m_Into.SetInteger(nMember, static_cast<int>(m_From.One()) - 8);
            default:
                return m_Into.Reject(m_From.Some());
        }
    }

    void SetJson(int nMember) {
        const std::string strJson = m_From.Some();
        Json::Value jIgnored;
        m_aNoJson[static_cast<size_t>(nMember)] = !jsonhelpers::Parse(strJson, jIgnored);
        m_Into.SetJson(nMember, strJson);
    }

    Loader& m_Into;
    Bytes& m_From;
    std::array<bool, kNumbers> m_aNoJson = {};
};

// Each stored text of JSON is JSON, in the form that both handles write.
void CheckJson(TableHost& Host) {
    for (const char* szMember : {"d", "e", "f"}) {
        const std::string strText = Host.Ask(std::string("SELECT max(") + szMember + ") FROM t");
        if (!strText.empty()) {
            Require(Compact(jsonhelpers::ReadLeniently(strText)) == strText, "JSON is stored");
        }
    }
}

LoadOptions How(unsigned nByte) {
    LoadOptions Made;
    Made.eOnDuplicate = static_cast<OnDuplicate>(nByte % 4);
    Made.nRowsPerTransaction = nByte / 4 % 4;
    Made.blGoOnAfterBad = nByte / 16 % 2 == 1;
    return Made;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* pData, size_t nSize) {
    if (nSize < 3 || nSize > kMaxInput) {
        return 0;
    }
    VORN_JSON_DB::Options HowToOpen;
    HowToOpen.blCompatible = false;
    static TableHost s_Host(kTableMembers, kTableKey, "", HowToOpen);
    Table& Of = s_Host.Begin();
    VORN_JSON_DB::LoadCounts Counts;
    Status Last;
    const LoadOptions HowToLoad = How(pData[0]);
    s_Host
        .Call(Use::kChange,
              [&] {
                  Loader Into;
                  Last = Into.Start(Of, HowToLoad);
                  Require(Last.Ok(), "a loader starts");
                  Bytes From(pData + 1, nSize - 1);
                  Player Plays(Into, From);
                  while (!From.AtEnd() && (Last.Ok() || HowToLoad.blGoOnAfterBad)) {
                      Last = Plays.Step();
                  }
                  if (Last.Ok() || HowToLoad.blGoOnAfterBad) {
                      Last = Into.Commit();
                  }
                  Counts = Into.Counts();
                  return Last;
              })
        .Ignore();
    Require(s_Host.Ask("SELECT count(*) FROM t") == std::to_string(Counts.nInserted),
            "what is counted as inserted is there, and nothing else");
    Require(!Last.Ok() || Counts.nRecords == Counts.nInserted + Counts.nReplaced + Counts.nSkipped +
                                                 Counts.nFailed,
            "each record is counted once");
    Require(!Last.Ok() || Counts.nCommitted == Counts.nRecords, "a commit deals with all");
    CheckJson(s_Host);
    return 0;
}
