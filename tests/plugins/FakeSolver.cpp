// A plugin that is not to be trusted: it says that everything can hold, each time for larger values.
// VTSYM_FAKE_ENTRY is the symbol that it exports.
#include "base/decide/external/SolverInterface.h"

#include <string>

struct vtsym_problem {
    unsigned unknowns;
    unsigned checks = 0;
};

namespace {

vtsym_problem* openProblem(const char*, const vtsym_problem_options* options) {
    return new vtsym_problem{options->unknowns};
}

vtsym_verdict check(vtsym_problem* problem, const char*, vtsym_value value, void* to) {
    ++problem->checks;
    for (unsigned i = 0; i < problem->unknowns; ++i)
        value(to, i, std::to_string(1000 + problem->checks).c_str());
    value(to, problem->unknowns, "1"); // of no unknown
    if (problem->checks % 2 == 0)
        value(to, 0, "123456789012345678901234567890");
    return VTSYM_SATISFIABLE;
}

void closeProblem(vtsym_problem* problem) {
    delete problem;
}

constexpr vtsym_solver_functions functions{openProblem, check, closeProblem};

} // namespace

extern "C" __attribute__((visibility("default"))) const vtsym_solver_functions* VTSYM_FAKE_ENTRY();

extern "C" const vtsym_solver_functions* VTSYM_FAKE_ENTRY() {
    return &functions;
}
