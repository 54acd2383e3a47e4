// The table of all targets.
#include "fuzz/Targets.hpp"
#include "fuzz/targets/All.hpp"

#include <array>

namespace VT::Fuzz {

std::span<const Target> targets() {
    static constexpr auto all = std::to_array<Target>({
        {"c_grammar", fuzzCGrammar},
        {"quill_parser", fuzzQuillParser},
        {"quill_dimensions", fuzzQuillDimensions},
        {"quill_conditions", fuzzQuillConditions},
        {"simplify", fuzzSimplify},
        {"shortest", fuzzShortest},
        {"read_back_c", fuzzReadBackC},
        {"read_back_quill", fuzzReadBackQuill},
        {"conversion", fuzzConversion},
        {"evaluate", fuzzEvaluate},
        {"decide", fuzzDecide},
        {"decide_32_bits", fuzzDecide32Bits},
        {"given", fuzzGiven},
        {"check", fuzzCheck},
        {"scan", fuzzScan},
        {"scan_bytes", fuzzScanBytes},
        {"service_calls", fuzzServiceCalls},
        {"host_tables", fuzzHostTables},
    });
    return all;
}

} // namespace VT::Fuzz
