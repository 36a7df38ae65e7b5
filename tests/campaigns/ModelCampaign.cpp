// Model check: random sequences of all public operations, run against the library and against the
// model. After each step results, arguments, message slot, stored rows, log lines, statements and
// pauses are compared.

#include <cstdlib>
#include <ctime>

#include "model/Sequence.h"
#include "model/Steps.h"
#include "support/Campaign.h"

namespace campaign {

namespace {

// The type cache grows with each sequence, and a failed look-up logs it as a whole: a process runs
// a part of them.
constexpr int kBatch = 25;

int RunModelCampaign(const Options& options) {
    setenv("TZ", "XXX-1", 1);
    tzset();
    NameSequenceFigures();
    const int nSequences = options.Count(400, 10000);
    for (int nFirst = 0; nFirst < nSequences; nFirst += kBatch) {
        InChild("sequences from " + std::to_string(nFirst), [&] {
            LearnRowCallback();
            for (int i = nFirst; i < nFirst + kBatch && i < nSequences; ++i) {
                // The printed number of a sequence is the seed that runs it alone.
                RunSequence(options.nSeed + static_cast<std::uint64_t>(i));
            }
        });
    }
    return Finish("model");
}

}  // namespace

}  // namespace campaign

int main(int argc, char** argv) {
    return campaign::RunModelCampaign(campaign::ParseOptions(argc, argv, "model"));
}
