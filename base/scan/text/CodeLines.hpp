// Passes over lines of code that hold nothing a reader of directives looks at.
#pragma once

#include "base/scan/text/SourceText.hpp"

#include <cstddef>

namespace VT {

/// Where lines of code may hold something: a #, an import declaration, a name that hints at a pragma operator, a splice
/// or a quote whose meaning depends on what precedes it.
class CodeLines {
public:
    explicit CodeLines(const SourceText& text) : text_(text) {}

    /// Returns the beginning of the first logical line, from the one that begins at `line` on, that may hold something;
    /// the end of the text where no line does.  Linear in the lines passed.
    [[nodiscard]] std::size_t pass(std::size_t line) const;

private:
    const SourceText& text_;
};

/// Names in code that hint at a pragma operator: a macro may make one from arguments with any of the others.
inline constexpr std::string_view pragmaHints[] = {"_Pragma", "__pragma", "pop_macro", "GCC", "clang"};

/// Whether a text may begin something within code, by its first bytes.
[[nodiscard]] bool mayMatter(std::string_view text);

/// Returns the first place from `from` on where something may begin, as mayMatter() has it.  Compares many bytes at a
/// time.
[[nodiscard]] std::size_t nextThatMayMatter(std::string_view text, std::size_t from);

} // namespace VT
