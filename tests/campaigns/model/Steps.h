// The steps of a sequence: every public operation, called on both sides with arguments of their
// own.
#ifndef VORNJSONDB_TESTS_CAMPAIGNS_MODEL_STEPS_H
#define VORNJSONDB_TESTS_CAMPAIGNS_MODEL_STEPS_H

#include <VornJsonDbApi.h>

#include <string>
#include <vector>

#include "Generator.h"
#include "Model.h"

namespace campaign {

// What one call is given, and what it leaves.
struct Given {
    Json::Value j;
    Json::Value jOut;
    std::string str;
    std::string strOut;
    std::vector<std::string> vec;
    long n = 0;
    int nType = 0;
    bool bl = false;
    bool blNull = false;  // a null pointer in the place of the key, or of the result

    const char* Key() const { return blNull ? nullptr : str.c_str(); }
    bool operator==(const Given& other) const;
    std::string Text() const;
};

// What is wrong with a row that is handed to the row callback.
enum RowFault { kLastNameMissing, kNoValues, kNoNames, kFewerThanNone, kRowFaults };

// One way to make arguments.
using Prepare = void (*)(Generator&, Random&, Given&);
namespace prepare {
void Nothing(Generator& generator, Random& random, Given& given);
void FirstRecord(Generator& generator, Random& random, Given& given);
void Record(Generator& generator, Random& random, Given& given);
void Refused(Generator& generator, Random& random, Given& given);
void RecordWithPart(Generator& generator, Random& random, Given& given);
void PartOfRecord(Generator& generator, Random& random, Given& given);
void Query(Generator& generator, Random& random, Given& given);
void QueryForOne(Generator& generator, Random& random, Given& given);
void QueryWithPart(Generator& generator, Random& random, Given& given);
void QueryInArray(Generator& generator, Random& random, Given& given);
void Change(Generator& generator, Random& random, Given& given);
void Value(Generator& generator, Random& random, Given& given);
void KeyAndValues(Generator& generator, Random& random, Given& given);
void Statement(Generator& generator, Random& random, Given& given);
void TwoValues(Generator& generator, Random& random, Given& given);
void Row(Generator& generator, Random& random, Given& given);
void Definition(Generator& generator, Random& random, Given& given);
void Time(Generator& generator, Random& random, Given& given);
}  // namespace prepare

struct StepKind {
    const char* szName;
    int nWeight;
    Prepare pfnPrepare;
    int (*pfnLibrary)(VornJsonDbApi& handle, Given& given);
    int (*pfnModel)(Model& model, Given& given);
};

const StepKind& AnyStep(Random& random);

// A create of its own that mostly succeeds.
const StepKind& FirstStep();

// The library's row callback, which it shows to sqlite3_exec only: a statement of a first handle is
// run to see it.
void LearnRowCallback();

}  // namespace campaign

#endif  // VORNJSONDB_TESTS_CAMPAIGNS_MODEL_STEPS_H
