// One random sequence of steps, run against the library and against the model.
#ifndef VORNJSONDB_TESTS_CAMPAIGNS_MODEL_SEQUENCE_H
#define VORNJSONDB_TESTS_CAMPAIGNS_MODEL_SEQUENCE_H

#include <cstdint>

namespace campaign {

// Names the figures, so that they are printed in this order.
void NameSequenceFigures();

void RunSequence(std::uint64_t nSeed);

}  // namespace campaign

#endif  // VORNJSONDB_TESTS_CAMPAIGNS_MODEL_SEQUENCE_H
