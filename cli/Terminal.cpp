#include "Terminal.h"

#include <sys/ioctl.h>
#include <unistd.h>

#include <cstdlib>
#include <cstring>

namespace VORN_JSON_DB::Cli {

namespace {

constexpr long kWidest = 10000;

}  // namespace

bool IsTerminal(std::FILE* pStream) {
    return isatty(fileno(pStream)) != 0;
}

bool IsAnimated(std::FILE* pStream) {
    const char* const szTerm = std::getenv("TERM");
    return IsTerminal(pStream) && szTerm != nullptr && std::strcmp(szTerm, "dumb") != 0;
}

bool HasColour(std::FILE* pStream) {
    const char* const szNoColour = std::getenv("NO_COLOR");
    return IsAnimated(pStream) && (szNoColour == nullptr || *szNoColour == '\0');
}

int TerminalWidth(std::FILE* pStream) {
    winsize Size{};
    if (ioctl(fileno(pStream), TIOCGWINSZ, &Size) == 0 && Size.ws_col > 0) {
        return Size.ws_col;
    }
    const char* const szColumns = std::getenv("COLUMNS");
    const long nColumns = szColumns == nullptr ? 0 : std::strtol(szColumns, nullptr, 10);
    return nColumns > 0 && nColumns <= kWidest ? static_cast<int>(nColumns) : 80;
}

}  // namespace VORN_JSON_DB::Cli
