// A signal that ends the command as a wish to end at the next good place.

#ifndef VORNJSONDB_CLI_INPUT_INTERRUPT_H
#define VORNJSONDB_CLI_INPUT_INTERRUPT_H

#include <csignal>
#include <iterator>

namespace VORN_JSON_DB::Cli {

// While it lives the first SIGINT, SIGTERM or SIGHUP is noted, and interrupts what waits for input.
// A second one of its kind does what it did before. A pipe that nobody reads is an error of who
// writes.
class Interrupt {
  public:
    Interrupt();
    ~Interrupt();
    Interrupt(const Interrupt&) = delete;
    Interrupt& operator=(const Interrupt&) = delete;

    static bool Came() { return Signal() != 0; }
    static int Signal();  // the one that came, or 0

    // A file that can be read from then on, for those who wait for something else as well: a signal
    // may come just before they begin to wait. -1: there is no Interrupt.
    static int File();

  private:
    static constexpr int kSignals[] = {SIGINT, SIGTERM, SIGHUP, SIGPIPE};
    struct sigaction m_aBefore[std::size(kSignals)] = {};
};

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_INTERRUPT_H
