// Texts in JSON whose encoding was checked before.

#ifndef VORNJSONDB_CLI_INPUT_CHECKED_TEXT_H
#define VORNJSONDB_CLI_INPUT_CHECKED_TEXT_H

#include <rapidjson/encodings.h>
#include <rapidjson/stream.h>

#include <cstring>

#include "EightBytes.h"

namespace VORN_JSON_DB::Cli {

// As RapidJSON's reader takes an encoding, of a text that is read in place. It asks for the next
// character, if that is no quote, no backslash and no control character, and here gets all up to
// the next of these, of which a NUL comes last.
struct CheckedText : rapidjson::UTF8<> {
    static bool Pass(rapidjson::InsituStringStream& Text) {
        const char* const pBegin = Text.src_;
        EightBytes nEnds = 0;
        while ((nEnds = MarkEnds(LoadEight(Text.src_))) == 0) {
            Text.src_ += sizeof(EightBytes);
        }
        Text.src_ += BeforeMark(nEnds);
        const auto nLength = static_cast<size_t>(Text.src_ - pBegin);
        // Behind an escape, which is shorter where it is written.
        if (Text.dst_ != pBegin) {
            std::memmove(Text.dst_, pBegin, nLength);
        }
        Text.dst_ += nLength;
        return true;
    }

    static EightBytes MarkEnds(EightBytes nBytes) {
        // A quote is the one other byte that is not above a blank once this bit is turned.
        constexpr unsigned char kTurned = '"' ^ ' ';
        return MarkBelow(nBytes ^ Each(kTurned), ' ' + 1) | MarkEqual(nBytes, '\\');
    }
};

}  // namespace VORN_JSON_DB::Cli

// What the reader calls; both are the same stream.
template <>
struct rapidjson::Transcoder<VORN_JSON_DB::Cli::CheckedText, VORN_JSON_DB::Cli::CheckedText> {
    static bool Transcode(InsituStringStream& Text, InsituStringStream&) {
        return VORN_JSON_DB::Cli::CheckedText::Pass(Text);
    }
    static bool Validate(InsituStringStream& Text, InsituStringStream& Same) {
        return UTF8<>::Validate(Text, Same);
    }
};

#endif  // VORNJSONDB_CLI_INPUT_CHECKED_TEXT_H
