// How the arguments of the steps are made.

#include <limits>

#include "Steps.h"

namespace campaign {

bool Given::operator==(const Given& other) const {
    return j == other.j && jOut == other.jOut && str == other.str && strOut == other.strOut &&
           vec == other.vec && n == other.n;
}

std::string Given::Text() const {
    std::string strText = "j=" + ToText(j) + " jOut=" + ToText(jOut) + " str=[" + str +
                          "] strOut=[" + strOut + "] n=" + std::to_string(n) +
                          " nType=" + std::to_string(nType) + (bl ? " bl" : "") +
                          (blNull ? " blNull" : "") + " vec=";
    for (const std::string& strOne : vec) {
        strText += "[" + strOne + "]";
    }
    return strText;
}

namespace {

Json::Value PoorValue(Random& random) {
    static const Json::Value s_aValues[] = {
        Json::Value(),   Json::Value(Json::objectValue), Json::Value(Json::arrayValue),
        FromText("[1]"), FromText(R"({"nobody":1})"),    Json::Value("text"),
        Json::Value(5)};
    return random.Of(s_aValues);
}

// Now and then several arguments are of no use at once, so that the order of the checks shows.
void Impoverish(Random& random, Given& given) {
    if (!random.OneIn(6)) {
        return;
    }
    given.j = random.OneIn(3) ? given.j : PoorValue(random);
    given.jOut = random.OneIn(3) ? given.jOut : PoorValue(random);
    given.str = random.OneIn(2) ? given.str : "";
    given.strOut = random.OneIn(2) ? given.strOut : "";
    given.blNull = random.OneIn(3);
    if (random.OneIn(2)) {
        given.vec.clear();
    }
}

}  // namespace

namespace prepare {

void Nothing(Generator&, Random&, Given&) {}

void FirstRecord(Generator& generator, Random&, Given& given) {
    given.j = generator.Record();
}

void Record(Generator& generator, Random& random, Given& given) {
    given.j = generator.Record();
    given.jOut = generator.AnyValue();
    given.str = "text so far " + std::string(random.OneIn(20) ? "%" : "");
    given.bl = random.OneIn(2);
    Impoverish(random, given);
}

void Refused(Generator&, Random& random, Given& given) {
    given.j = PoorValue(random);
    given.jOut = PoorValue(random);
}

// The part "part" is inside the record. An object holds it, whatever else was chosen.
void RecordWithPart(Generator& generator, Random& random, Given& given) {
    Record(generator, random, given);
    if (!given.j.isObject()) {
        given.j = Json::Value(Json::objectValue);
    }
    given.j["part"] = generator.AnyValue();
}

void PartOfRecord(Generator& generator, Random& random, Given& given) {
    RecordWithPart(generator, random, given);
    given.j["part"] = random.OneIn(2) ? generator.Record() : generator.Query();
}

void Query(Generator& generator, Random& random, Given& given) {
    given.j = generator.Query();
    given.jOut = random.OneIn(12)  ? generator.AnyValue()
                 : random.OneIn(2) ? Json::Value()
                                   : Json::Value(Json::arrayValue);
    if (random.OneIn(5) && given.jOut.isArray()) {
        given.jOut.append("before");
    }
    given.str = random.OneIn(3) ? "text so far" : "";
    given.nType = random.OneIn(4) ? random.Below(9) - 4 : random.Below(3);
    Impoverish(random, given);
}

void QueryForOne(Generator& generator, Random& random, Given& given) {
    Query(generator, random, given);
    if (!random.OneIn(10)) {
        given.jOut = random.OneIn(2) ? Json::Value() : generator.Record();
    }
}

void QueryWithPart(Generator& generator, Random& random, Given& given) {
    given.j = generator.Query();
    if (!given.j.isObject()) {
        given.j = Json::Value(Json::objectValue);
    }
    if (random.OneIn(2)) {  // rows come, and then a failure
        given.j = Json::Value(Json::objectValue);
        given.j["vornSqlWhereFilter"] = kFailsMidway;
    }
    given.j["part"] = random.OneIn(2) ? Json::Value() : Json::Value(Json::arrayValue);
}

void QueryInArray(Generator& generator, Random&, Given& given) {
    given.j.append(generator.Query());
}

void Change(Generator& generator, Random& random, Given& given) {
    given.j = generator.Query();
    given.jOut = generator.Changes();
    given.str = random.OneIn(15) ? "" : generator.Condition();
    Impoverish(random, given);
}

void Value(Generator& generator, Random& random, Given& given) {
    given.j = generator.AnyValue();
    given.str = generator.MemberName();
    given.strOut = random.OneIn(2) ? "before " : "";
    given.blNull = random.OneIn(30);
    Impoverish(random, given);
}

void KeyAndValues(Generator& generator, Random& random, Given& given) {
    given.str = generator.MemberName();
    given.strOut = random.OneIn(10) ? generator.MemberName() : generator.Text();
    for (int i = random.OneIn(4) ? random.Below(4) : 1; i > 0; --i) {
        given.vec.push_back(generator.Text());
    }
    given.j = random.OneIn(2) ? Json::Value() : generator.Record();
    given.blNull = random.OneIn(30);
    Impoverish(random, given);
}

void Statement(Generator& generator, Random& random, Given& given) {
    given.str = generator.Statement();
    given.jOut = random.OneIn(5) ? generator.AnyValue() : Json::Value();
    given.bl = random.OneIn(3);
    given.blNull = random.OneIn(10);
}

void TwoValues(Generator& generator, Random& random, Given& given) {
    given.j = generator.Record();
    given.jOut = random.OneIn(5) ? generator.AnyValue() : generator.Record();
    given.bl = random.OneIn(2);
    Impoverish(random, given);
}

// Column names in vec; nType says what is wrong, if anything.
void Row(Generator& generator, Random& random, Given& given) {
    for (int i = random.Below(4); i > 0; --i) {
        given.vec.push_back(generator.MemberName());
    }
    given.jOut = random.OneIn(8) ? generator.AnyValue() : Json::Value();
    given.nType = random.Below(kRowFaults + 2);
    given.blNull = random.OneIn(10);
}

void Definition(Generator& generator, Random& random, Given& given) {
    given.j = generator.Definition();
    given.str = random.OneIn(8) ? "" : generator.TableName();
}

// Up to the largest number that 32 bits hold; now and then a year that no clock has.
void Time(Generator&, Random& random, Given& given) {
    given.n = static_cast<long>(random.Next() % 2147480000U);
    if (sizeof(long) > 4 && random.OneIn(4)) {
        given.n = std::numeric_limits<long>::max();
    }
    given.nType = random.Below(9);
    given.str = "before";
}

}  // namespace prepare

}  // namespace campaign
