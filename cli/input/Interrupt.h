// SIGINT as a wish to end at the next good place.

#ifndef VORNJSONDB_CLI_INPUT_INTERRUPT_H
#define VORNJSONDB_CLI_INPUT_INTERRUPT_H

#include <csignal>

namespace VORN_JSON_DB::Cli {

// While it lives the first SIGINT is noted, and interrupts what waits for input. The second one
// does what it did before.
class Interrupt {
  public:
    Interrupt();
    ~Interrupt();
    Interrupt(const Interrupt&) = delete;
    Interrupt& operator=(const Interrupt&) = delete;

    static bool Came();

    // A file that can be read from then on, for those who wait for something else as well: a signal
    // may come just before they begin to wait. -1: there is no Interrupt.
    static int File();

  private:
    struct sigaction m_Before = {};
};

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_INTERRUPT_H
