// vornjsondb(1), made from the table of subcommands.

#include "Commands.h"
#include "Parse.h"

namespace VORN_JSON_DB::Cli {

namespace {

// A text of the manual: a backslash or a leading point would be a request to its formatter.
std::string Manual(const std::string& strText) {
    std::string strOut;
    for (const char c : strText) {
        const bool blLineBegins = strOut.empty() || strOut.back() == '\n';
        strOut += blLineBegins && (c == '.' || c == '\'') ? "\\&" : "";
        strOut += c == '\\' ? "\\e" : c == '-' ? "\\-" : std::string(1, c);
    }
    return strOut;
}

void PutManualOptions(const std::vector<Option>& vecOptions) {
    Put(".Bl -tag -width Ds\n");
    for (const Option& Row : vecOptions) {
        Put(".It ");
        Put(*Row.szShort == '\0' ? "" : std::string("Fl ") + (Row.szShort + 1) + " , ");
        Put("Fl " + Manual(Row.szName + 1) + (*Row.szValue == '\0' ? "" : " Ar ") + Row.szValue +
            "\n" + Manual(Row.szHelp) + "\n");
    }
    Put(".El\n");
}

}  // namespace

void PutManual() {
    Put(".Dd November 21, 2026\n.Dt VORNJSONDB 1\n.Os\n"
        ".Sh NAME\n.Nm vornjsondb\n.Nd JSON records in SQLite tables\n"
        ".Sh SYNOPSIS\n.Nm\n.Ar SUBCOMMAND DB\n.Op Ar TABLE\n.Op Ar ...\n"
        ".Sh DESCRIPTION\nReads, changes and describes the records of any SQLite database.\n"
        "Options of every subcommand:\n");
    PutManualOptions(SharedOptions());
    for (const Command& Of : AllCommands()) {
        Put(".Ss " + std::string(Of.szName) + "\n" + Manual(Of.szHelp) +
            ".\n.Bd -literal\nvornjsondb " + Manual(std::string(Of.szName) + " " + Of.szWords) +
            "\n\n" + Manual(Of.szExamples) + ".Ed\n");
        if (*Of.szText != '\0') {
            Put(".Bd -literal\n" + Manual(Of.szText) + ".Ed\n");
        }
        if (!Of.vecOptions.empty()) {
            PutManualOptions(Of.vecOptions);
        }
    }
    Put(".Sh ENVIRONMENT\n.Bl -tag -width Ds\n"
        ".It Ev COLUMNS\nThe width of tables, where the terminal does not tell.\n"
        ".It Ev NO_COLOR\nIf set and not empty, there are no colours.\n"
        ".It Ev TMPDIR\nWhere standard input is copied to be read twice, instead of\n.Pa /tmp .\n"
        ".El\n"
        ".Sh FILES\nA database keeps definitions in its table\n.Ql vornjsondb_definition .\n"
        ".Sh EXIT STATUS\n"
        ".Bl -tag -width Ds\n");
    for (const ExitMeaning& Row : AllExits()) {
        Put(".It " + std::to_string(Row.nExit) + "\n" + Manual(Row.szMeaning) + "\n");
    }
    Put(".El\n"
        ".Sh EXAMPLES\nImport, search, correct, export:\n.Bd -literal\n" +
        Manual(kOverviewExamples) +
        ".Ed\n"
        ".Sh SEE ALSO\n.Xr sqlite3 1\n");
}

}  // namespace VORN_JSON_DB::Cli
