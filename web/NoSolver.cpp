// The solver of a page, which has none: questions are decided by the library's own procedures alone.
// A module in WebAssembly cannot load a plugin of the system.
#include "base/decide/external/SolverPlugin.hpp"

namespace VT {

SolverPlugin::SolverPlugin(std::string path) : path_(std::move(path)) {}

SolverPlugin& SolverPlugin::installed() {
    static SolverPlugin none;
    return none;
}

const vtsym_solver_functions* SolverPlugin::functions() {
    return functions_;
}

const std::string& SolverPlugin::fault() {
    return fault_;
}

} // namespace VT
