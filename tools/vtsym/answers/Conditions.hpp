// The condition service as the commands use it: reading, simplifying and printing in the languages of the options.
// Relies on the library only through VCService and the printers.
#pragma once

#include "base/VCService.hpp"
#include "tools/vtsym/io/Texts.hpp"

#include <cstddef>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace vtsym {

/// A condition service that is renewed when its caches have grown large, so that endless input takes bounded memory.
/// Identifiers are valid until the next makeRoomFor() or begin().  Each thread has its own.
class Conditions {
public:
    /// `bits32` makes decisions over signed integers of 32 bits.
    explicit Conditions(bool bits32 = false) : bits32_(bits32) { renew(); }

    /// Answers for the values for which assumptions hold, in the language of the options, which outlive the object.
    /// Throws UsageError for an assumption that cannot be read, and for assumptions that contradict each other.
    Conditions(bool bits32, const TextOptions& options, std::vector<std::string> assumptions);

    [[nodiscard]] VT::VCService& service() const { return *service_; }

    /// Goes on as if nothing had been read, with so many steps for all questions to come.  Returns whether the service
    /// was renewed for that.
    bool begin(std::uint64_t steps);

    [[nodiscard]] std::uint64_t stepsLeft() const { return budget_->left(); }

    /// To be called before the service reads a text.  Returns whether the service was renewed.
    bool makeRoomFor(const std::string& text);

    /// Whether the steps of all questions are used up: those that follow are undecided, unless the next text brings
    /// enough.
    [[nodiscard]] bool stepsUsedUp() const { return budget_->left() == 0; }

    /// The condition of a text in the language of the options: as written, or as the service simplifies it.
    [[nodiscard]] VT::SymbolicExprId parse(const TextOptions& options, const std::string& text) const;
    [[nodiscard]] VT::SymbolicExprId simplify(const TextOptions& options, const std::string& text) const;
    /// A condition with the operators of the language that the options answer in.
    [[nodiscard]] VT::SymbolicExprId inAnswerShape(const TextOptions& options, VT::SymbolicExprId condition) const;
    /// The shortest form found of a condition; as print() writes it, it is never longer.  `forms` receives the forms
    /// that were considered.
    [[nodiscard]] VT::SymbolicExprId shortest(const TextOptions& options, VT::SymbolicExprId condition,
                                              std::vector<VT::ShortForm>* forms = nullptr) const;
    /// The shortest form found that is equal wherever a known condition holds.
    [[nodiscard]] VT::SymbolicExprId shortestGiven(const TextOptions& options, VT::SymbolicExprId condition,
                                                   VT::SymbolicExprId known) const;
    /// The text of a shortest form: as print() writes it, or 1 or 0 where `true` or `false` would be longer than the
    /// condition itself.
    [[nodiscard]] std::string printShortest(const TextOptions& options, VT::SymbolicExprId shortest,
                                            VT::SymbolicExprId condition) const;
    /// The symbols of a condition as Quill writes them, each once, without the truth constants.
    [[nodiscard]] std::vector<std::string> symbols(VT::SymbolicExprId condition, const VT::VCSymbolTypes& kinds) const;
    /// The text of a condition in the language that the options ask for.  The service prints nothing for TRUE; this
    /// writes `true`, or 1 in a directive, so that every answer is visible.
    [[nodiscard]] std::string print(const TextOptions& options, VT::SymbolicExprId condition) const;
    /// Warnings about what C or a preprocessor would decide differently, where the options ask for its language.
    [[nodiscard]] std::vector<std::string> warnings(const TextOptions& options, VT::SymbolicExprId condition) const;
    /// The text of a condition with its own operators, whichever language they are from.
    [[nodiscard]] std::string printUnconverted(VT::SymbolicExprId condition, bool quill) const;

private:
    void renew();
    void assume(const std::string& text) const;
    [[nodiscard]] VT::SymbolicExprId notLonger(const TextOptions& options, VT::SymbolicExprId result,
                                               VT::SymbolicExprId condition) const;

    bool bits32_;
    const TextOptions* assumedIn_ = nullptr;
    std::vector<std::string> assumptions_;
    std::unique_ptr<VT::Budget> budget_ = std::make_unique<VT::Budget>(VT::limits::commandSteps); ///< of all services
    std::unique_ptr<VT::VCService> service_;
    bool isFresh_ = true;       ///< nothing was read but assumptions
    std::size_t textBytes_ = 0; ///< that the service may have kept
};

/// The answers of `worker->answer(text, out)`, which uses `worker->conditions` and may leave `worker->warnings`.
template <class Worker>
Answering answeringBy(const std::shared_ptr<Worker>& worker) {
    Answering answering;
    answering.answer = [worker](const std::string& text, std::string& out) { worker->answer(text, out); };
    answering.begin = [worker](std::uint64_t steps) { worker->conditions.begin(steps); };
    answering.steps = {VT::limits::commandSteps, VT::limits::settableSteps, VT::limits::commandStepsAhead,
                       [worker] { return worker->conditions.stepsLeft(); }};
    if constexpr (requires { worker->warnings; })
        answering.warnings = &worker->warnings;
    return answering;
}

} // namespace vtsym
