// Asks the plugin of the process whether a solver is there; ./run names the packages that bring one.
#include "tools/vtsym/findings/UndecidedText.hpp"

#include "base/decide/external/SolverPlugin.hpp"

#include <cstdlib>

namespace vtsym {

std::string undecidedText(VT::DecisionBound bound, bool isCommandOver) {
    if (isCommandOver)
        return "takes more steps than one run may; ask it in a run of its own";
    return (bound == VT::DecisionBound::Steps ? "takes too many steps" : "depends on arithmetic beyond linear terms") +
           solverAdvice();
}

std::string solverAdvice() {
    VT::SolverPlugin& plugin = VT::SolverPlugin::installed();
    if (plugin.functions() != nullptr)
        return "";
    if (!plugin.fault().empty())
        return "; " + plugin.fault();
    const char* const packages = std::getenv("VTSYM_SOLVER_PACKAGES"); // set by ./run
    return std::string("; a solver may decide it: apt install ") + (packages != nullptr ? packages : "libvtsym-z3") +
           ", then run this again";
}

} // namespace vtsym
