#include "Interrupt.h"

namespace VORN_JSON_DB::Cli {

namespace {

volatile std::sig_atomic_t g_nCame = 0;

void OnInterrupt(int) {
    g_nCame = 1;
}

}  // namespace

Interrupt::Interrupt() {
    g_nCame = 0;
    struct sigaction Action = {};
    Action.sa_handler = OnInterrupt;
    // Without SA_RESTART: a read from a pipe that is silent has to end, too.
    Action.sa_flags = static_cast<int>(SA_RESETHAND);
    sigaction(SIGINT, &Action, &m_Before);
}

Interrupt::~Interrupt() {
    sigaction(SIGINT, &m_Before, nullptr);
}

bool Interrupt::Came() {
    return g_nCame != 0;
}

}  // namespace VORN_JSON_DB::Cli
