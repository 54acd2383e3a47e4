// The service as the program uses it.
#pragma once

#include "base/VCService.hpp"
#include "tools/vtsym/Texts.hpp"

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

namespace vtsym {

/// The condition service, renewed when it has collected much, so that input without end takes memory with an end.
/// Identifiers hold until the next makeRoomFor().
class Conditions {
public:
    /// `bits32`: decisions are over signed 32-bit integers.
    explicit Conditions(bool bits32 = false) : bits32_(bits32) { renew(); }

    [[nodiscard]] VT::VCService& service() const { return **handle_; }

    /// To be called before the service is given a text.  True where the service was renewed.
    bool makeRoomFor(const std::string& text);

    /// The condition of a text in the language of the options, as it stands or simplified.
    [[nodiscard]] VT::SymbolicExprId parse(const TextOptions& options, const std::string& text) const;
    [[nodiscard]] VT::SymbolicExprId simplify(const TextOptions& options, const std::string& text) const;
    /// The symbols of a condition as Quill writes them, each once; the truth constants are none.
    [[nodiscard]] std::vector<std::string> symbols(VT::SymbolicExprId condition, const VT::VCSymbolTypes& kinds) const;
    /// The text of a condition in the shape of the language that the options ask for.  Unlike the service it writes
    /// `true` for TRUE, 1 in a directive, so that no answer is invisible.
    [[nodiscard]] std::string print(const TextOptions& options, VT::SymbolicExprId condition) const;
    /// What C or a preprocessor would decide differently, where the options ask for the one or the other.
    [[nodiscard]] std::vector<std::string> warnings(const TextOptions& options, VT::SymbolicExprId condition) const;
    /// The same as print() without a change of shape.
    [[nodiscard]] std::string printAsItStands(VT::SymbolicExprId condition, bool quill) const;

private:
    void renew();

    bool bits32_;
    std::optional<VT::VCServiceHandle> handle_;
    std::size_t textBytes_ = 0; ///< of what the service may have kept
};

} // namespace vtsym
