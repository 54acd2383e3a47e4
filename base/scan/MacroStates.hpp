// The states of macros in the course of a file.
//
// A macro's state is a number that is new whenever its value may be.  Two readings of a macro in one state are equal;
// nothing is known of readings in different states.
//
// A macro that the file defines or undefines has a new state in all that follows, in the other branches of a chain too.
// A macro that the file defines by other macros changes with them.  One that is made by joining tokens, or that depends
// on the line where it is read, changes between any two readings, and so do macros that it defines.  An included file
// may define a macro that is not defined.  The epoch records that: it grows with each #include, but not in other
// branches of its chain, where the file was not included.
#pragma once

#include "base/scan/MacroBody.hpp"
#include "base/util/IdMap.hpp"

#include <cstddef>
#include <cstdint>
#include <deque>
#include <functional>
#include <span>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace VT {

/// The states of all macros of one file.
class MacroStates {
public:
    using Name = std::uint32_t;

    struct State {
        std::uint64_t version; ///< new with every definition that concerns the macro
        std::uint64_t epoch;   ///< new with every #include
        bool derived;          ///< the file defines the macro by others
        bool varies = false;   ///< the value may differ with each reading
        bool operator==(const State&) const = default;
    };

    /// Names macros that no included file changes, before the first of them is read.
    void settle(std::function<bool(std::string_view)> isSettled) { isSettled_ = std::move(isSettled); }

    /// Returns the number of a name.  With `lasting`, the text outlives this object and is not copied.
    Name nameOf(std::string_view text, bool lasting = false);

    [[nodiscard]] std::string_view textOf(Name name) const { return texts_[name]; }

    /// Records that the file defines or undefines the macro here.
    void change(Name name);
    /// Adds a definition of the macro, which holds these names.
    void addBody(Name name, const MacroBody& body, std::span<const Name> names);

    /// Records that any macro may have changed.
    void changeAll() { floor_ = latestFloor_ = ++latest_; }

    /// Records an #include: macros that are not defined may be from here on.
    void include() { epoch_ = ++latestEpoch_; }

    /// A chain of branches begins; goes on with its next branch; ends.
    void open();
    void nextBranch();
    void close();

    /// Returns the state of a macro.  Linear in the macros that define it, up to limits::macrosFollowed; beyond the
    /// bound it varies.
    State stateOf(Name name);

    /// Whether the macro may stand for operators that others around it take apart: `B || C` in `A == 1`.  Costs the
    /// same; true beyond the bound.
    bool isOpen(Name name);

private:
    struct Chain { ///< the numbers where it began
        std::uint64_t floor;
        std::uint64_t epoch;
        std::uint64_t latestFloor;
        std::uint64_t latestEpoch;
    };

    struct Macro { ///< with all its definitions so far
        std::uint64_t version;
        std::vector<Name> names{};   ///< in definitions
        std::vector<Name> aliases{}; ///< definitions as a whole
        bool varies;                 ///< by itself
        bool open = false;           ///< by itself
        bool settled = false;        ///< before the file begins
    };

    template <class Names>
    bool reach(Name name, Names namesOf);

    IdMap<Name> byHash_;                  ///< the latest name of a hash
    std::vector<Name> sameHash_;          ///< by name: the one before of its hash, or itself
    std::vector<std::string_view> texts_; ///< by name
    std::deque<std::string> copies_;
    std::vector<Macro> macros_; ///< by name
    std::function<bool(std::string_view)> isSettled_;
    std::vector<Chain> chains_; ///< open
    std::vector<Name> reached_; ///< by reach()
    std::uint64_t latest_ = 0;
    std::uint64_t floor_ = 0; ///< the least version of any macro
    std::uint64_t latestFloor_ = 0;
    std::uint64_t epoch_ = 0;
    std::uint64_t latestEpoch_ = 0;
};

} // namespace VT
