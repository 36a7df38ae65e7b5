// A table for people. On a terminal it is cut to the width; elsewhere nothing is cut.

#include <utf8proc.h>

#include <algorithm>
#include <climits>
#include <cstdio>
#include <utility>

#include "Output.h"
#include "Terminal.h"
#include "input/Utf8.h"

namespace VORN_JSON_DB::Cli {

namespace {

// Widths are taken from so many records; later ones are cut to them, or stick out of them.
constexpr std::size_t kMeasured = 1000;
constexpr int kLeastWidth = 4;
constexpr int kGap = 2;
const char kEllipsis[] = "\xE2\x80\xA6";

struct Shown {
    std::string strText;
    int nWidth = 0;
    bool blRight = false;
};

std::string Escaped(utf8proc_int32_t nCode) {
    if (nCode == '\n' || nCode == '\t' || nCode == '\r') {
        return nCode == '\n' ? "\\n" : nCode == '\t' ? "\\t" : "\\r";
    }
    char szEscape[16];
    static_cast<void>(std::snprintf(szEscape, sizeof szEscape,
                                    nCode < 0x100 ? "\\x%02x" : "\\u%04x",
                                    static_cast<unsigned>(nCode)));
    return szEscape;
}

// One character at a time, so that a cut falls between two of what a reader calls a letter.
class Cutter {
  public:
    explicit Cutter(int nMost) : m_nMost(nMost) {}

    void Take(std::string_view strText) {
        utf8proc_int32_t nState = 0;
        utf8proc_int32_t nBefore = -1;
        for (std::size_t nAt = 0; nAt < strText.size() && !m_blFull;) {
            utf8proc_int32_t nCode = 0;
            const std::size_t nLength = ReadCharacter(strText.substr(nAt), nCode);
            nCode = nCode < 0 ? 0xFFFD : nCode;
            if (nBefore < 0 || utf8proc_grapheme_break_stateful(nBefore, nCode, &nState)) {
                CloseLetter();
            }
            AddCharacter(nCode);
            nBefore = nCode;
            nAt += nLength;
        }
        CloseLetter();
    }

    Shown Result() {
        if (m_blFull) {
            m_All.strText.replace(m_nFitting, std::string::npos, kEllipsis);
            m_All.nWidth = m_nFittingWidth + 1;
        }
        return std::move(m_All);
    }

  private:
    // The letter that was collected is whole: it is kept if an ellipsis still fits behind it.
    void CloseLetter() {
        if (m_All.nWidth > m_nMost) {
            m_blFull = true;
        } else if (m_All.nWidth < m_nMost) {
            m_nFitting = m_All.strText.size();
            m_nFittingWidth = m_All.nWidth;
        }
    }

    void AddCharacter(utf8proc_int32_t nCode) {
        if (Steers(nCode)) {
            const std::string strEscape = Escaped(nCode);
            m_All.strText += strEscape;
            m_All.nWidth += static_cast<int>(strEscape.size());
            return;
        }
        utf8proc_uint8_t szBytes[4];
        const utf8proc_ssize_t nBytes = utf8proc_encode_char(nCode, szBytes);
        m_All.strText.append(reinterpret_cast<const char*>(szBytes),
                             static_cast<std::size_t>(nBytes));
        m_All.nWidth += utf8proc_charwidth(nCode);
    }

    int m_nMost;
    bool m_blFull = false;
    Shown m_All;                 // as far as it was read
    std::size_t m_nFitting = 0;  // its longest beginning that leaves room for the ellipsis
    int m_nFittingWidth = 0;
};

class TableWriter : public RecordOutput {
  public:
    explicit TableWriter(bool blHeader)
        : m_blHeader(blHeader),
          m_nScreen(IsTerminal(stdout) ? TerminalWidth(stdout) : 0),
          m_blColour(HasColour(stdout)) {}

    void Begin(const std::vector<Column>& vecColumns) override {
        std::vector<Shown> vecNames;
        vecNames.reserve(vecColumns.size());
        for (const Column& Named : vecColumns) {
            vecNames.push_back(Show(Named.strName));
        }
        m_vecWidths.resize(vecColumns.size(), 0);
        m_vecWaiting.push_back(std::move(vecNames));
    }

    void Record(const std::vector<Cell>& vecCells) override {
        std::vector<Shown> vecLine;
        for (const Cell& Value : vecCells) {
            m_strPlain.clear();
            AppendPlain(m_strPlain, Value);
            vecLine.push_back(Show(m_strPlain));
            vecLine.back().blRight =
                Value.eKind == Row::Kind::kInteger || Value.eKind == Row::Kind::kReal;
        }
        if (m_blMeasured) {
            PutLine(vecLine);
            return;
        }
        m_vecWaiting.push_back(std::move(vecLine));
        if (m_vecWaiting.size() > kMeasured) {
            PutWaiting();
        }
    }

    void End() override {
        if (!m_blMeasured) {
            PutWaiting();
        }
    }

  private:
    // No cell needs more than the screen has; elsewhere a cell may take what it needs.
    Shown Show(const std::string& strText) const {
        Cutter Cut(m_nScreen > 0 ? m_nScreen : INT_MAX);
        Cut.Take(strText);
        return Cut.Result();
    }

    void PutWaiting() {
        m_blMeasured = true;
        for (std::size_t nLine = m_blHeader ? 0 : 1; nLine < m_vecWaiting.size(); ++nLine) {
            for (std::size_t nColumn = 0; nColumn < m_vecWidths.size(); ++nColumn) {
                m_vecWidths[nColumn] =
                    std::max(m_vecWidths[nColumn], m_vecWaiting[nLine][nColumn].nWidth);
            }
        }
        if (m_nScreen > 0) {
            FitScreen();
        }
        for (std::size_t nLine = m_blHeader ? 0 : 1; nLine < m_vecWaiting.size(); ++nLine) {
            if (nLine == 0) {
                PutHeader(m_vecWaiting[nLine]);
            } else {
                PutLine(m_vecWaiting[nLine]);
            }
        }
        m_vecWaiting.clear();
    }

    int WidthWith(int nCap) const {
        int nSum = -kGap;
        for (const int nWidth : m_vecWidths) {
            nSum += std::min(nWidth, nCap) + kGap;
        }
        return nSum;
    }

    // The widest columns give way first. Columns that have no room even so are left out.
    void FitScreen() {
        while (m_vecWidths.size() > 1 && WidthWith(kLeastWidth) > m_nScreen) {
            m_vecWidths.pop_back();
        }
        int nCap = m_nScreen;
        while (nCap > 1 && WidthWith(nCap) > m_nScreen) {
            --nCap;
        }
        for (int& nWidth : m_vecWidths) {
            nWidth = std::min(nWidth, nCap);
        }
    }

    void PutHeader(const std::vector<Shown>& vecNames) {
        Put(m_blColour ? "\033[1m" : "");
        PutLine(vecNames);
        Put(m_blColour ? "\033[0m" : "");
        std::string strLine;
        for (const int nWidth : m_vecWidths) {
            strLine += strLine.empty() ? "" : "  ";
            strLine.append(static_cast<std::size_t>(nWidth), '-');
        }
        Put(strLine + "\n");
    }

    void PutLine(const std::vector<Shown>& vecLine) {
        std::string strLine;
        int nOwed = 0;  // blanks that are written only when something follows
        for (std::size_t nColumn = 0; nColumn < m_vecWidths.size(); ++nColumn) {
            Shown Value = vecLine[nColumn];
            if (m_nScreen > 0 && Value.nWidth > m_vecWidths[nColumn]) {
                Cutter Cut(m_vecWidths[nColumn]);
                Cut.Take(Value.strText);
                const bool blRight = Value.blRight;
                Value = Cut.Result();
                Value.blRight = blRight;
            }
            const int nPad = std::max(0, m_vecWidths[nColumn] - Value.nWidth);
            if (Value.nWidth > 0) {
                const int nBlanks = nOwed + (Value.blRight ? nPad : 0);
                strLine.append(static_cast<std::size_t>(nBlanks), ' ');
                strLine += Value.strText;
                nOwed = kGap + (Value.blRight ? 0 : nPad);
            } else {
                nOwed += kGap + nPad;
            }
        }
        Put(strLine + "\n");
    }

    bool m_blHeader;
    int m_nScreen;  // 0: no terminal
    bool m_blColour;
    bool m_blMeasured = false;
    std::vector<int> m_vecWidths;
    std::vector<std::vector<Shown>> m_vecWaiting;  // the names first
    std::string m_strPlain;
};

}  // namespace

std::unique_ptr<RecordOutput> TableOutput(bool blHeader) {
    return std::make_unique<TableWriter>(blHeader);
}

}  // namespace VORN_JSON_DB::Cli
