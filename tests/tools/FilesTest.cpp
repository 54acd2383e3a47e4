// Files that the program reads and writes: bounds, what is not a file, and failures.
#include "tests/tools/Program.hpp"

#include <gtest/gtest.h>

namespace VT::Testing {
namespace {

TEST(Files, AreReadUpToABoundAndNotLost) {
    expectTranscript("program-files.txt", {{"c.c", "#if A\n#if A\n#endif\n#endif\n"}, // 27 bytes
                                           {"m", R"({"blocks": [{"name": "b", "condition": "A && !A"}]})"}});
}

} // namespace
} // namespace VT::Testing
