#include "Interrupt.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>

namespace VORN_JSON_DB::Cli {

namespace {

volatile std::sig_atomic_t g_nCame = 0;
int g_anPipe[2] = {-1, -1};

void OnInterrupt(int nSignal) {
    const int nError = errno;
    g_nCame = nSignal;
    // A full pipe, too, can be read from.
    if (write(g_anPipe[1], "", 1) < 0) {
        errno = nError;
    }
}

}  // namespace

Interrupt::Interrupt() {
    g_nCame = 0;
    if (pipe2(g_anPipe, O_CLOEXEC | O_NONBLOCK) != 0) {
        g_anPipe[0] = g_anPipe[1] = -1;
    }
    for (size_t i = 0; i < std::size(kSignals); ++i) {
        struct sigaction Action = {};
        Action.sa_handler = kSignals[i] == SIGPIPE ? SIG_IGN : OnInterrupt;
        // Without SA_RESTART: a read from a pipe that is silent has to end, too.
        Action.sa_flags = static_cast<int>(SA_RESETHAND);
        sigaction(kSignals[i], &Action, &m_aBefore[i]);
        // Who starts it by nohup means that.
        if (kSignals[i] == SIGHUP && m_aBefore[i].sa_handler == SIG_IGN) {
            sigaction(SIGHUP, &m_aBefore[i], nullptr);
        }
    }
}

Interrupt::~Interrupt() {
    for (size_t i = 0; i < std::size(kSignals); ++i) {
        sigaction(kSignals[i], &m_aBefore[i], nullptr);
    }
    for (int& nFile : g_anPipe) {
        close(nFile);
        nFile = -1;
    }
}

int Interrupt::File() {
    return g_anPipe[0];
}

int Interrupt::Signal() {
    return g_nCame;
}

}  // namespace VORN_JSON_DB::Cli
