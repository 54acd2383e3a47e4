// What directives other than conditions do to macros.
#pragma once

#include "base/scan/DirectiveReader.hpp"
#include "base/scan/MacroStates.hpp"

#include <vector>

namespace VT {

/// Follows the definitions, inclusions and pragmas of one file, in its order.
class MacroChanges {
public:
    /// With `strictIncludes`, an included file may change any macro, not only undefined ones.
    MacroChanges(MacroStates& states, bool strictIncludes) : states_(states), strictIncludes_(strictIncludes) {}

    /// Takes a directive: #define, #undef, #include or a pragma.  Its text outlives the states.
    void take(const Directive& directive);

    /// Comes before a condition: where a macro of the file expands to a pragma, any line of code may change macros.
    void beforeCondition() {
        if (expandsToPragma_)
            states_.changeAll();
    }

private:
    MacroStates& states_;
    bool strictIncludes_;
    bool expandsToPragma_ = false;
    std::vector<MacroStates::Name> names_; ///< in the definition that is read
};

} // namespace VT
