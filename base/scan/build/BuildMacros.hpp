// The macros that a build defines before a file: options -D and -U, and files of definitions.
#pragma once

#include "base/core/Limits.hpp"
#include "base/scan/ConstantArithmetic.hpp"
#include "base/scan/DirectiveReader.hpp"

#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

namespace VT {

/// Where a build defines a macro, or does not.
struct BuildPlace {
    std::string file;       ///< of definitions; empty for an option
    std::uint64_t line = 0; ///< in the file
    std::string text;       ///< "-DN=4", "#define N 4"
};

/// The macros of one configuration of a build, in the order in which a compiler takes them.  What is not named here is
/// not known.
///
/// Const operations may run in several threads while none adds anything.  Copies share what they have in common.  The
/// value of a macro is computed as the preprocessor does, by expansion.
class VTSYM_API BuildMacros {
public:
    /// What the build says about a macro.
    struct Macro {
        bool isDefined = false;
        bool isFunction = false;            ///< with parameters, whose calls have no known value
        std::vector<DirectiveToken> body{}; ///< views of texts that the macros keep
        BuildPlace place{};
    };

    /// Defines a macro by the text after -D: `N`, which is 1, `N=4`, `F(x)=x+1`.  False, without effect, for a text
    /// that does not begin with a name.
    bool define(std::string_view text);
    /// Records that a macro is not defined; false for a text that is not a name.
    bool undefine(std::string_view name);
    /// Takes the definitions of a file over, as `-imacros` and `-include` do.  A branch counts where its condition has
    /// a value; a macro that a branch of unknown value changes is not known afterwards.  Included files are not read.
    /// Linear in the text.
    void addFile(const std::string& name, std::string_view text, bool isCpp);

    [[nodiscard]] bool empty() const noexcept { return macros_.empty(); }

    /// Leaves out what is not defined: an earlier file may have defined it.
    void forgetUndefined();

    /// What the build says about a macro; nullptr for nothing.
    [[nodiscard]] const Macro* find(std::string_view name) const;

    /// What is known of a macro at a place of a file; nullptr for nothing.
    using Lookup = std::function<const Macro*(std::string_view name)>;

    /// What computing values has cost, and may cost, in tokens.
    struct Budget {
        std::uint64_t left = limits::scanSteps;
    };

    /// Computes an expression of a directive.  Nothing where its value is not known, or the budget is used up.  Appends
    /// the names of the macros that were looked up to `used`, each once.  Linear in the tokens that the macros become,
    /// up to limits::expandedTokens.
    static std::optional<DirectiveConstant> valueOf(std::span<const DirectiveToken> tokens, const Lookup& lookup,
                                                    bool isCpp, Budget& budget,
                                                    std::vector<std::string_view>* used = nullptr);

    /// A text that is equal for equal macros.
    [[nodiscard]] const std::string& key() const noexcept { return key_; }

private:
    void set(std::string name, Macro macro);
    bool add(std::string_view definition, BuildPlace place);

    std::unordered_map<std::string, Macro> macros_;
    std::vector<std::shared_ptr<const std::string>> texts_; ///< that tokens are views of
    std::string key_;                                       ///< everything that was added
};

} // namespace VT
