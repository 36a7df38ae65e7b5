// Two pieces of work measured in turns, so that both are slowed down alike when the machine is.

#ifndef VORN_BENCH_SUPPORT_INTERLEAVE_H
#define VORN_BENCH_SUPPORT_INTERLEAVE_H

#include <cstdlib>
#include <vector>

#include "Bench.h"

namespace bench {

struct Timing {
    double dOurs = 0;   // median of the rounds, nanoseconds for one call
    double dOther = 0;  // likewise
    double dRatio = 0;  // median of the rounds' ratios
};

constexpr int kWarmUpRounds = 2;

struct Rounds {
    int nRounds;  // 7 or more for a steady median
    int nCalls;   // calls of each work in a round
};

// Time of nCalls calls of fnWork with the running numbers from nFirst, per call.
template <class Work>
double TimeCalls(Work&& fnWork, int nFirst, int nCalls) {
    const double dStart = CpuNow();
    for (int i = nFirst; i < nFirst + nCalls; ++i) {
        fnWork(i);
    }
    return (CpuNow() - dStart) / nCalls;
}

// Small pieces of memory that were given back are put together when the next large one is asked
// for. For a long list that takes a third of the time in which it was made, and would be measured
// as part of whatever comes next.
inline void PutFreedMemoryTogether() {
    void* volatile pLarge = std::malloc(65536);
    std::free(pLarge);
}

// Both works are called with running numbers, the same ones. Round by round the other goes first.
// fnBetween runs before each turn, unmeasured, with the turn's first number, to remove what the
// other one has left. The first two rounds only warm up.
template <class Ours, class Other, class Between>
Timing Interleave(const Rounds& How, Ours&& fnOurs, Other&& fnOther, Between&& fnBetween) {
    std::vector<double> vecOurs;
    std::vector<double> vecOther;
    std::vector<double> vecRatio;
    for (int n = 0; n < How.nRounds + kWarmUpRounds; ++n) {
        double dOurs = 0;
        double dOther = 0;
        for (const bool blOurs : {n % 2 == 0, n % 2 != 0}) {
            fnBetween(n * How.nCalls);
            PutFreedMemoryTogether();
            if (blOurs) {
                dOurs = TimeCalls(fnOurs, n * How.nCalls, How.nCalls);
            } else {
                dOther = TimeCalls(fnOther, n * How.nCalls, How.nCalls);
            }
        }
        if (n >= kWarmUpRounds) {
            vecOurs.push_back(dOurs);
            vecOther.push_back(dOther);
            vecRatio.push_back(dOurs / dOther);
        }
    }
    return {Median(vecOurs), Median(vecOther), Median(vecRatio)};
}

template <class Ours, class Other>
Timing Interleave(const Rounds& How, Ours&& fnOurs, Other&& fnOther) {
    return Interleave(How, fnOurs, fnOther, [](int) {});
}

// Highest running number that such a measurement asks for, plus one.
inline int CallsOf(const Rounds& How) {
    return (How.nRounds + kWarmUpRounds) * How.nCalls;
}

}  // namespace bench

#endif  // VORN_BENCH_SUPPORT_INTERLEAVE_H
