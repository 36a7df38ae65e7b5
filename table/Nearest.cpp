#include "Nearest.h"

#include <algorithm>
#include <utility>

#include "Concat.h"
#include "FindingCodes.h"

namespace vornjsondb {

namespace {

constexpr size_t kLongestCompared = 64;

char Lower(char c) {
    return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
}

// How many single slips lie between the two: a letter that is wrong, missing, too many, or has
// changed places with its neighbour. Letter case is none. nTooMany, or more, where it is not less:
// looked for no further, as a record from the network may have any number of unknown names.
size_t Slips(std::string_view strLeft, std::string_view strRight, size_t nTooMany) {
    const auto [nShorter, nLonger] = std::minmax({strLeft.size(), strRight.size()});
    if (nLonger > kLongestCompared || nLonger - nShorter >= nTooMany) {
        return nTooMany;
    }
    size_t nLeastUp = 0;
    size_t nRows[3][kLongestCompared + 1] = {};
    size_t* pTwoUp = nRows[0];
    size_t* pUp = nRows[1];
    size_t* pRow = nRows[2];
    for (size_t j = 0; j <= strRight.size(); ++j) {
        pUp[j] = j;
    }
    for (size_t i = 1; i <= strLeft.size(); ++i) {
        pRow[0] = i;
        size_t nLeast = i;
        for (size_t j = 1; j <= strRight.size(); ++j) {
            const bool blSame = Lower(strLeft[i - 1]) == Lower(strRight[j - 1]);
            pRow[j] = std::min({pUp[j] + 1, pRow[j - 1] + 1, pUp[j - 1] + (blSame ? 0 : 1)});
            const bool blSwapped = i > 1 && j > 1 &&
                                   Lower(strLeft[i - 1]) == Lower(strRight[j - 2]) &&
                                   Lower(strLeft[i - 2]) == Lower(strRight[j - 1]);
            // mutate(exchanged): the row between has no more slips than this one then.
            if (blSwapped) {
                pRow[j] = std::min(pRow[j], pTwoUp[j - 2] + 1);
            }
            nLeast = std::min(nLeast, pRow[j]);
        }
        if (std::min(nLeast, std::exchange(nLeastUp, nLeast)) >= nTooMany) {
            return nTooMany;
        }
        std::swap(pTwoUp, pUp);
        std::swap(pUp, pRow);
    }
    return pUp[strRight.size()];
}

}  // namespace

std::string Nearest(std::string_view strTyped, const std::vector<std::string>& vecCandidates) {
    const std::string* pNearest = nullptr;
    size_t nFewest = 1 + std::min<size_t>(3, 1 + strTyped.size() / 4);
    for (const std::string& strCandidate : vecCandidates) {
        const size_t nSlips = Slips(strTyped, strCandidate, nFewest);
        if (nSlips < nFewest && nSlips < strCandidate.size()) {
            nFewest = nSlips;
            pNearest = &strCandidate;
        }
    }
    return pNearest != nullptr ? *pNearest : std::string();
}

std::string Suggestion(std::string_view strTyped, const std::vector<std::string>& vecCandidates) {
    const std::string strNearest = Nearest(strTyped, vecCandidates);
    if (strNearest.empty()) {
        return {};
    }
    return Concat({" (did you mean ", Quoted(strNearest), "?)"});
}

}  // namespace vornjsondb
