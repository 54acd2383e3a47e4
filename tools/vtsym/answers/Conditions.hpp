// The service as the program uses it.
#pragma once

#include "base/VCService.hpp"
#include "tools/vtsym/io/Texts.hpp"

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

    /// The condition of a text in the language of the options, as it stands or as the service simplifies it.
    [[nodiscard]] VT::SymbolicExprId parse(const TextOptions& options, const std::string& text) const;
    [[nodiscard]] VT::SymbolicExprId simplify(const TextOptions& options, const std::string& text) const;
    /// A condition with the operators of the language that the options answer in.
    [[nodiscard]] VT::SymbolicExprId inAnswerShape(const TextOptions& options, VT::SymbolicExprId condition) const;
    /// The shortest form found of a condition, which is never longer as print() writes it.  `forms` receives what was
    /// looked at on the way.
    [[nodiscard]] VT::SymbolicExprId shortest(const TextOptions& options, VT::SymbolicExprId condition,
                                              std::vector<VT::ShortForm>* forms = nullptr) const;
    /// The same where a known condition holds.
    [[nodiscard]] VT::SymbolicExprId shortestGiven(const TextOptions& options, VT::SymbolicExprId condition,
                                                   VT::SymbolicExprId known) const;
    /// The text of a shortest form: print(), but for 1 and 0 where `true` or `false` would be longer than the condition
    /// that it is of.
    [[nodiscard]] std::string printShortest(const TextOptions& options, VT::SymbolicExprId shortest,
                                            VT::SymbolicExprId condition) const;
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
    [[nodiscard]] VT::SymbolicExprId notLonger(const TextOptions& options, VT::SymbolicExprId result,
                                               VT::SymbolicExprId condition) const;

    bool bits32_;
    std::optional<VT::VCServiceHandle> handle_;
    std::size_t textBytes_ = 0; ///< of what the service may have kept
};

} // namespace vtsym
