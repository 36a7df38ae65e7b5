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

  private:
    struct sigaction m_Before = {};
};

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_INTERRUPT_H
