// vornjsondb: the command.

#include <fcntl.h>
#include <signal.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <exception>
#include <new>

#include "Command.h"
#include "Parse.h"
#include "Terminal.h"
#include "input/Interrupt.h"

namespace {

using namespace VORN_JSON_DB::Cli;  // NOLINT(google-build-using-namespace): main belongs to it

int Report(int nExit, const std::string& strLine) {
    const bool blColour = HasColour(stderr);
    // There is nobody else to tell.
    static_cast<void>(std::fprintf(stderr, "%serror:%s %s\n", blColour ? "\033[1;31m" : "",
                                   blColour ? "\033[0m" : "", strLine.c_str()));
    return nExit;
}

// A stream that the parent closed stays useless, but no file that is opened later may get its
// number and be read or written in its place: so input is opened for writing alone, outputs for
// reading.
void KeepClosed() {
    for (const int nFile : {STDIN_FILENO, STDOUT_FILENO, STDERR_FILENO}) {
        if (fcntl(nFile, F_GETFD) < 0) {
            // The lowest number that is free is this one.
            static_cast<void>(open("/dev/null", nFile == STDIN_FILENO ? O_WRONLY : O_RDONLY));
        }
    }
}

int Run(int nArguments, char** pszArguments) {
    try {
        Context Call;
        const bool blRun = Parse(nArguments, pszArguments, Call);
        const int nExit = blRun ? Call.pCommand->pfnRun(Call) : int{kExitFine};
        FlushOutput();
        return nExit;
    } catch (const Error& Failed) {
        return Report(Failed.nExit, Failed.strLine);
    } catch (const std::bad_alloc&) {
        return Report(kExitUnexpected, "out of memory; free some, or ask for fewer records");
    } catch (const std::exception& Failed) {
        return Report(kExitUnexpected,
                      std::string(Failed.what()) + "; this is a fault of vornjsondb");
    }
}

}  // namespace

int main(int nArguments, char** pszArguments) {
    KeepClosed();
    // There is one thread, which needs no locks, and nobody asks how much memory SQLite has.
    sqlite3_config(SQLITE_CONFIG_SINGLETHREAD);
    sqlite3_config(SQLITE_CONFIG_MEMSTATUS, 0);
    // A reader that goes away ends the command without a word, whatever the parent made of it; a
    // file that hits the limit of the shell is a write error like others.
    static_cast<void>(signal(SIGPIPE, SIG_DFL));
    static_cast<void>(signal(SIGXFSZ, SIG_IGN));
    const int nExit = Run(nArguments, pszArguments);
    // Some file systems report a failed write no sooner than here.
    if (std::fclose(stdout) != 0 && nExit == kExitFine) {
        return Report(kExitIo,
                      std::string("standard output: cannot write: ") + std::strerror(errno));
    }
    if (nExit == kExitInterrupted) {
        // A loop in a shell goes on unless the signal itself ended the command; the shell shows
        // 130 for Ctrl-C.
        const int nSignal = Interrupt::Signal();
        (void)signal(nSignal, SIG_DFL);
        (void)raise(nSignal);
    }
    return nExit;
}
