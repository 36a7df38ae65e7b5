// CSV and TSV. NULL is nothing at all and the empty text is "", so that both can be told apart.

#include "Output.h"

namespace VORN_JSON_DB::Cli {

namespace {

class SeparatedWriter : public RecordOutput {
  public:
    SeparatedWriter(char cBetween, bool blHeader) : m_cBetween(cBetween), m_blHeader(blHeader) {}

    void Begin(const std::vector<Column>& vecColumns) override {
        m_strLine.clear();
        for (const Column& Shown : vecColumns) {
            AppendField(Shown.strName);
        }
        if (m_blHeader) {
            PutLine();
        }
    }

    void Record(const std::vector<Cell>& vecCells) override {
        // A reader takes it for no record at all.
        if (vecCells.size() == 1 && vecCells[0].eKind == Row::Kind::kNull) {
            Fail(kExitBadData,
                 "standard output: one column with NULL cannot be written in this format; take "
                 "--format jsonl, or more members");
        }
        m_strLine.clear();
        for (const Cell& Value : vecCells) {
            if (Value.eKind == Row::Kind::kNull) {
                m_strLine += m_cBetween;
                continue;
            }
            m_strField.clear();
            AppendPlain(m_strField, Value);
            AppendField(m_strField);
        }
        PutLine();
    }

    void End() override {}

  private:
    void AppendField(const std::string& strField) {
        const char szSpecial[] = {m_cBetween, '"', '\n', '\r', '\0'};
        if (!strField.empty() && strField.find_first_of(szSpecial) == std::string::npos) {
            m_strLine += strField;
        } else {
            m_strLine += '"';
            for (const char c : strField) {
                m_strLine.append(c == '"' ? 2U : 1U, c);
            }
            m_strLine += '"';
        }
        m_strLine += m_cBetween;
    }

    void PutLine() {
        m_strLine.back() = '\n';
        Put(m_strLine);
    }

    char m_cBetween;
    bool m_blHeader;
    std::string m_strLine;
    std::string m_strField;
};

}  // namespace

std::unique_ptr<RecordOutput> SeparatedOutput(char cBetween, bool blHeader) {
    return std::make_unique<SeparatedWriter>(cBetween, blHeader);
}

}  // namespace VORN_JSON_DB::Cli
