// The input is CSV, behind two bytes of options. Cells that are written again in quotes are read as
// they were.

#include "FuzzHost.h"
#include "InputHost.h"

using namespace fuzzhost;
using namespace VORN_JSON_DB::Cli;

namespace {

// Good records with all cells in quotes; a null stays bare.
std::string Written(const ReadInput& From, char cDelimiter) {
    std::string strAll;
    for (const ReadRecord& Each : From.vecRecords) {
        for (const ReadCell& Cell : Each.vecCells) {
            if (Cell.eKind == Value::Kind::kText) {
                strAll += '"';
                for (const char c : Cell.strText) {
                    strAll.append(c == '"' ? 2 : 1, c);
                }
                strAll += '"';
            }
            strAll += cDelimiter;
        }
        if (!Each.vecCells.empty()) {
            strAll.back() = '\n';
        }
    }
    return strAll;
}

void RequireSameCells(const ReadInput& Found, const ReadInput& Again) {
    size_t nAgain = 0;
    for (const ReadRecord& Each : Found.vecRecords) {
        const bool blOneNull =
            Each.vecCells.size() == 1 && Each.vecCells[0].eKind == Value::Kind::kNull;
        if (Each.vecCells.empty() || blOneNull) {
            continue;  // an empty line is no record
        }
        Require(nAgain < Again.vecRecords.size(), "no record is lost");
        const ReadRecord& There = Again.vecRecords[nAgain++];
        Require(!There.blBad && There.vecCells.size() == Each.vecCells.size(), "cells are there");
        for (size_t i = 0; i < Each.vecCells.size(); ++i) {
            Require(Each.vecCells[i].strText == There.vecCells[i].strText &&
                        Each.vecCells[i].eKind == There.vecCells[i].eKind,
                    "cells are the same");
        }
    }
    Require(nAgain == Again.vecRecords.size(), "no record is made up");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* pData, size_t nSize) {
    if (nSize < kOptionBytes || nSize > kMaxInput) {
        return 0;
    }
    const std::string strText(reinterpret_cast<const char*>(pData) + kOptionBytes,
                              nSize - kOptionBytes);
    ReadOptions How = GuessFormat(strText);
    How.eFormat = Format::kSeparated;
    How.blKeepText = (pData[0] & 1) != 0;
    How.blHeader = (pData[0] & 2) != 0;
    How.blQuotes = (pData[0] & 4) == 0;
    How.blEmptyIsText = (pData[0] & 8) != 0;
    const ReadInput Found = ReadTwice(strText, pData[1], How);
    const bool blMark = !strText.empty() && static_cast<unsigned char>(strText[0]) >= 0x80;
    // All rows of one width, so that each line of what is written has as many cells.
    for (const ReadRecord& Each : Found.vecRecords) {
        if (Each.blBad || blMark) {
            return 0;
        }
    }
    ReadOptions Plain = How;
    Plain.blHeader = false;
    Plain.blQuotes = true;
    const std::string strAgain = Written(Found, How.cDelimiter);
    const bool blEncoding = strAgain.find('\0') < 4;  // zeros in the begin tell one
    if (!blEncoding) {
        RequireSameCells(Found, Read(strAgain, 0, Plain));
    }
    return 0;
}
