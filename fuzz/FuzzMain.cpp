// What libFuzzer calls: the target that the environment names.
#include "fuzz/Targets.hpp"

#include <cstdio>
#include <cstdlib>
#include <string_view>

extern "C" const char* __asan_default_options(); // NOLINT(bugprone-reserved-identifier): the name that is looked up
extern "C" int LLVMFuzzerInitialize(int* argc, char*** argv);
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);

namespace {

const VT::Fuzz::Target* chosen = nullptr;

} // namespace

/// Freed memory is kept back as much as many inputs take, not the usual 256 MB, which would hide what the inputs
/// themselves take.
extern "C" const char* __asan_default_options() {
    return "quarantine_size_mb=16:malloc_context_size=1";
}

extern "C" int LLVMFuzzerInitialize(int* /*argc*/, char*** /*argv*/) {
    const char* const name = std::getenv("VTSYM_FUZZ_TARGET");
    for (const VT::Fuzz::Target& target : VT::Fuzz::targets())
        if (name != nullptr && std::string_view(name) == target.name)
            chosen = &target;
    if (chosen != nullptr)
        return 0;
    std::fputs("VTSYM_FUZZ_TARGET has to be one of:", stderr);
    for (const VT::Fuzz::Target& target : VT::Fuzz::targets())
        std::fprintf(stderr, " %s", target.name);
    std::fputs("\n", stderr);
    std::exit(2);
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    try {
        chosen->run({data, size});
    } catch (const VT::Fuzz::Broken& broken) {
        std::fprintf(stderr, "%s\n", broken.what());
        std::abort();
    }
    return 0;
}
