// Asks the question over integers first, and over bit vectors where bits of unknowns are combined.
//
// A model of the solver may have values that evaluation does not accept (a division by zero, bits of which only laws
// are stated): models that are not confirmed are excluded one by one, and the next one is asked for. A question has a
// context of its own in the solver, so that its answer does not depend on earlier ones.
#include "base/decide/external/ExternalSolver.hpp"

#include "base/core/Limits.hpp"
#include "base/decide/external/SolverInterface.h"
#include "base/integer/LinearForm.hpp"

#include <algorithm>
#include <charconv>
#include <memory>
#include <numeric>
#include <optional>
#include <string_view>

namespace VT {

namespace {

using Values = std::vector<std::int64_t>;

/// The values that a check reports; not complete where one is missing or does not fit 64 bits.
struct Reported {
    explicit Reported(std::size_t count) : values(count) {}

    static void receive(void* to, unsigned index, const char* decimal) {
        auto& self = *static_cast<Reported*>(to);
        if (index >= self.values.size() || decimal == nullptr)
            return;
        const std::string_view text(decimal);
        std::int64_t value = 0;
        const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), value);
        if (error == std::errc() && end == text.data() + text.size())
            self.values[index] = value;
    }

    [[nodiscard]] bool isComplete() const {
        return std::ranges::all_of(values, [](const auto& value) { return value.has_value(); });
    }

    std::vector<std::optional<std::int64_t>> values;
};

/// One text of the question in the solver, asked again and again with further assertions.
class Problem {
public:
    Problem(const vtsym_solver_functions& solver, const SmtQuestion& text)
        : solver_(solver),
          text_(text),
          problem_(nullptr, solver.close) {
        const vtsym_problem_options options{static_cast<unsigned>(text.unknowns.size()), text.width,
                                            limits::solverResources, limits::solverMegabytes};
        problem_.reset(solver.open(text.text.c_str(), &options));
    }

    /// The values that satisfy the assertions; without any, the verdict says why.
    std::optional<Values> check(const std::string& assertions, vtsym_verdict& verdict) {
        verdict = VTSYM_UNKNOWN;
        if (problem_ == nullptr || checksLeft_ == 0)
            return std::nullopt;
        --checksLeft_;
        Reported reported(text_.unknowns.size());
        verdict = solver_.check(problem_.get(), assertions.c_str(), Reported::receive, &reported);
        if (verdict != VTSYM_SATISFIABLE || !reported.isComplete())
            return std::nullopt;
        Values values;
        for (const auto& value : reported.values)
            values.push_back(*value);
        return values;
    }

    /// Terms about an unknown: that it has a value, and that its size is at most another.
    [[nodiscard]] std::string equal(std::size_t unknown, std::int64_t value) const {
        return joined({"(= ", name(unknown), " ", literal(value), ")"});
    }

    [[nodiscard]] std::string nearer(std::size_t unknown, std::int64_t size) const {
        const std::string_view most = text_.width == 0 ? "(<= " : "(bvsle ";
        return joined(
            {"(and ", most, literal(-size), " ", name(unknown), ") ", most, name(unknown), " ", literal(size), "))"});
    }

    [[nodiscard]] bool fits(std::uint64_t size) const {
        return text_.width == 0 || text_.width > 64 || size >> (text_.width - 1) == 0;
    }

private:
    static std::string name(std::size_t unknown) { return std::string(1, 'u').append(std::to_string(unknown)); }

    [[nodiscard]] std::string literal(std::int64_t value) const {
        const auto bits = static_cast<std::uint64_t>(value);
        std::string size = std::to_string(value < 0 ? ~bits + 1 : bits);
        if (text_.width != 0)
            size = joined({"(_ bv", size, " ", std::to_string(text_.width), ")"});
        return value < 0 ? joined({text_.width == 0 ? "(- " : "(bvneg ", size, ")"}) : size;
    }

    const vtsym_solver_functions& solver_;
    const SmtQuestion& text_;
    std::unique_ptr<vtsym_problem, void (*)(vtsym_problem*)> problem_;
    std::size_t checksLeft_ = limits::solverChecks;
};

class Asker {
public:
    Asker(const SolverQuestion& question, const SmtQuestion& text, const vtsym_solver_functions& solver)
        : question_(question),
          text_(text),
          problem_(solver, text),
          order_(text.unknowns.size()) {
        std::vector<std::string> names;
        for (const SymbolicExprId unknown : text.unknowns)
            names.push_back(question.nameOf(unknown));
        std::iota(order_.begin(), order_.end(), std::size_t{0});
        std::ranges::stable_sort(order_, {}, [&](std::size_t i) -> const std::string& { return names[i]; });
    }

    Decision answer() {
        vtsym_verdict verdict = VTSYM_UNKNOWN;
        std::string excluded;
        for (;;) {
            const auto values = problem_.check(excluded, verdict);
            if (verdict == VTSYM_UNSATISFIABLE && excluded.empty() && text_.isProof)
                return {Answer::No, DecisionBound::None, std::nullopt};
            if (!values)
                return {Answer::Undecided, DecisionBound::Terms, std::nullopt};
            if (question_.confirms(witnessOf(*values), text_.calls))
                return {Answer::Yes, DecisionBound::None, witnessOf(smallest(*values))};
            std::string same = "true";
            for (std::size_t i = 0; i < values->size(); ++i)
                same.append(" ").append(problem_.equal(i, (*values)[i]));
            excluded.append(joined({"(assert (not (and ", same, ")))\n"}));
        }
    }

private:
    [[nodiscard]] Witness witnessOf(const Values& values) const {
        Witness witness;
        for (const std::size_t i : order_)
            witness.push_back({text_.unknowns[i], values[i]});
        return witness;
    }

    /// Makes one unknown after the other small: 0, or else its size is halved again and again; of two values equally
    /// near to 0 the positive one.
    Values smallest(Values found) {
        std::string fixed;
        const auto accept = [&](const std::string& further) {
            vtsym_verdict verdict = VTSYM_UNKNOWN;
            auto values = problem_.check(joined({fixed, "(assert ", further, ")\n"}), verdict);
            if (!values || !question_.confirms(witnessOf(*values), text_.calls))
                return false;
            found = std::move(*values);
            return true;
        };
        const auto sizeOf = [&](std::size_t unknown) {
            const std::int64_t value = found[unknown];
            return value < 0 ? ~static_cast<std::uint64_t>(value) + 1 : static_cast<std::uint64_t>(value);
        };
        for (const std::size_t unknown : order_) {
            std::uint64_t low = 0; // sizes below it are not possible, as far as is known
            while (low < sizeOf(unknown)) {
                const std::uint64_t size = sizeOf(unknown);
                const std::uint64_t middle = low == 0 ? 0 : low + (size - low) / 2;
                if (!accept(problem_.nearer(unknown, static_cast<std::int64_t>(middle))))
                    low = middle + 1;
            }
            if (found[unknown] < 0 && found[unknown] != minusInfinite && problem_.fits(sizeOf(unknown)))
                accept(problem_.equal(unknown, -found[unknown]));
            fixed.append(joined({"(assert ", problem_.equal(unknown, found[unknown]), ")\n"}));
        }
        return found;
    }

    const SolverQuestion& question_;
    const SmtQuestion& text_;
    Problem problem_;
    std::vector<std::size_t> order_;
};

} // namespace

Decision decideExternally(SolverPlugin& plugin, const SolverQuestion& question) {
    Decision decision{Answer::Undecided, DecisionBound::Terms, std::nullopt};
    const vtsym_solver_functions* const solver = plugin.functions();
    if (solver == nullptr)
        return decision;
    Steps steps;
    const auto ask = [&](const auto& write) {
        steps.refill(limits::solverNodes);
        try {
            const std::optional<SmtQuestion> text =
                write(SmtSource{question.leaves, question.conditions, question.asked, question.bits32, steps});
            if (!text)
                return false;
            decision = Asker(question, *text, *solver).answer();
            return text->hasBits;
        } catch (const StepsUsedUp&) {
            return false;
        }
    };
    const bool hasBits = ask(writeIntegers);
    if (hasBits && decision.isUndecided())
        ask([](const SmtSource& source) { return writeBitVectors(source, limits::solverGuessedBits); });
    return decision;
}

} // namespace VT
