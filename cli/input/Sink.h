// What readers hand to those who want records, whatever the input's format.

#ifndef VORNJSONDB_CLI_INPUT_SINK_H
#define VORNJSONDB_CLI_INPUT_SINK_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace VORN_JSON_DB::Cli {

struct Value {
    enum class Kind {
        kNull,
        kBoolean,  // nInteger is 0 or 1
        kInteger,
        kReal,
        kWide,  // strText: a number that neither 64 bits nor a double can hold
        kText,
        kJson  // strText: an object or a list, as compact JSON
    };
    Kind eKind = Kind::kNull;
    std::int64_t nInteger = 0;
    double dReal = 0;
    std::string_view strText;  // lives as long as the call that it is passed to
};

// What JSON has no values for, as list and dump write it: bytes, texts that are no UTF-8 (how these
// begin; base64 follows), and the numbers beyond all others.
constexpr std::string_view kBlobBegin = R"({"$base64":true,"encoded":")";
constexpr std::string_view kTextBegin = R"({"$text":true,"encoded":")";
constexpr std::string_view kInfinity = R"({"$real":"inf"})";
constexpr std::string_view kMinusInfinity = R"({"$real":"-inf"})";

// Where a record is.
struct Place {
    std::int64_t nRecord = 0;  // from 1 in each input
    std::int64_t nLine = 0;    // from 1, of its first character
    std::string_view strText;  // as it was read, if that was asked for
};

// Is told of one record after the other. What was told of a record that turns out to be bad does
// not count.
class Sink {
  public:
    Sink() = default;
    virtual ~Sink() = default;
    Sink(const Sink&) = delete;
    Sink& operator=(const Sink&) = delete;

    // Comes before the first value of a member, which is then called by its number: how many came
    // before. A name may come without any value.
    virtual void NewMember(std::string_view strName) = 0;

    virtual void Take(size_t nMember, const Value& Given) = 0;

    // Both return whether to go on reading.
    virtual bool EndRecord(const Place& Where) = 0;
    virtual bool BadRecord(const Place& Where, const std::string& strReason) = 0;
};

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_SINK_H
