#include "LintCodes.h"

namespace vornjsondb {

namespace {

constexpr char kLintTexts[] = VORN_LINT_CODES(VORN_FINDING_TEXTS);
constexpr std::uint8_t kLintSeverities[] = {VORN_LINT_CODES(VORN_FINDING_SEVERITY)};

}  // namespace

Finding RowOf(LintCode eCode) {
    return RowAt(static_cast<size_t>(eCode), kLintTexts, kLintSeverities);
}

void Report(FindingList& vecFindings, LintCode eCode, std::string_view strPath,
            std::string_view strMessage) {
    Report(vecFindings, RowOf(eCode), strPath, strMessage);
}

}  // namespace vornjsondb
