#include "Interrupt.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>

namespace VORN_JSON_DB::Cli {

namespace {

volatile std::sig_atomic_t g_nCame = 0;
int g_anPipe[2] = {-1, -1};

void OnInterrupt(int) {
    const int nError = errno;
    g_nCame = 1;
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
    struct sigaction Action = {};
    Action.sa_handler = OnInterrupt;
    // Without SA_RESTART: a read from a pipe that is silent has to end, too.
    Action.sa_flags = static_cast<int>(SA_RESETHAND);
    sigaction(SIGINT, &Action, &m_Before);
}

Interrupt::~Interrupt() {
    sigaction(SIGINT, &m_Before, nullptr);
    for (int& nFile : g_anPipe) {
        close(nFile);
        nFile = -1;
    }
}

int Interrupt::File() {
    return g_anPipe[0];
}

bool Interrupt::Came() {
    return g_nCame != 0;
}

}  // namespace VORN_JSON_DB::Cli
