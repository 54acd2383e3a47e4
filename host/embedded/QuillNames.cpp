// The names of the codes in parse trees, for people.
//
// Expanded from host/QuillCodes.def into switches, so a code is looked up in constant time.
#include "host/QuillParser.hpp"

const char* vtuQParserTerminalName(std::int32_t code) noexcept {
    switch (code) {
#define VTSYM_QUILL_TOKEN(Code, Name, Text)                                                                            \
    case Code:                                                                                                         \
        return Text;
#include "host/QuillCodes.def"
    default:
        return "unknown";
    }
}

const char* vtuQParserNonTerminalName(std::int32_t code) noexcept {
    switch (code) {
#define VTSYM_QUILL_RULE(Code, Name, Text, Children)                                                                   \
    case Code:                                                                                                         \
        return Text;
#include "host/QuillCodes.def"
    default:
        return "unknown";
    }
}
