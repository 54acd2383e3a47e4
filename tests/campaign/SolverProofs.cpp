// Random conditions and what the library makes of them, proven equal by Z3: over the integers, and over vectors of 32
// bits where no form adds, subtracts, multiplies or shifts to the left, so that none can overflow.
#include "base/VCService.hpp"
#include "tests/campaign/Campaign.hpp"
#include "tests/campaign/VectorSolver.hpp"
#include "tests/support/generators/AnyNode.hpp"
#include "tests/support/generators/RandomCondition.hpp"
#include "tests/support/generators/RandomLinear.hpp"
#include "tests/support/oracles/Solver.hpp"

#include <optional>
#include <string>

namespace VT::Campaign {

namespace {

/// A comparison of bits, quotients and remainders of a name by a literal; with `ofNames` also of bits of two names,
/// which are an unknown over the integers.
std::string bitsComparison(std::mt19937_64& random, bool ofNames) {
    static const char* const comparisons[] = {"==", "!=", "<", "<=", ">", ">="};
    static const char* const bits[] = {"&", "|", "^", "/", "%", ">>"};
    static const int literals[] = {1, 2, 3, 4, 7, 8, 12, 30};
    const auto name = [&] { return std::string(1, "ABC"[random() % 3]); };
    std::string left = name();
    if (random() % 3 != 0)
        left = "(" + left + bits[random() % 6] + std::to_string(literals[random() % 8]) + ")";
    if (ofNames && random() % 8 == 0)
        left = "(" + left + "&" + name() + ")";
    const int constant = static_cast<int>(random() % 12) - 4;
    return left + comparisons[random() % 6] + (random() % 8 == 0 ? name() : std::to_string(constant));
}

std::string bitsCondition(std::mt19937_64& random, bool ofNames) {
    std::string text = bitsComparison(random, ofNames);
    for (std::size_t more = random() % 4; more > 0; --more)
        text = (random() % 4 == 0 ? "!(" : "(") + text + (random() % 2 == 0 ? ") && " : ") || ") +
               bitsComparison(random, ofNames);
    return text;
}

class SolverProofs final : public Job {
public:
    explicit SolverProofs(bool vectors) : areVectors_(vectors) {}

    void run(std::uint64_t seed, std::uint64_t item) override {
        if (item % 256 == 0)
            session_.reset();
        if (!session_)
            session_.emplace();
        VCService& service = session_->service;
        std::mt19937_64 random = randomOf(seed, item);
        const Testing::ConditionShape shape{.symbolPairs = true, .truthValues = true};
        const std::string text = areVectors_     ? bitsCondition(random, true)
                                 : item % 3 == 0 ? bitsCondition(random, false)
                                 : item % 3 == 1 ? Testing::randomLinear(random)
                                                 : Testing::randomCondition(random, 1 + random() % 7, shape);
        const SymbolicExprId id = service.parseC(text);
        prove(id, service.simplify(id, false).id(), text);
        prove(id, service.shortestCondition(id, false).id(), text);
    }

    [[nodiscard]] std::string figure() const override {
        return std::to_string(proofs_) + " proofs, " + std::to_string(unchanged_) + " forms unchanged, " +
               std::to_string(leftOut_) + " left out because a form may overflow, " + std::to_string(unknown_) +
               " the solver gave up";
    }

private:
    void prove(SymbolicExprId id, SymbolicExprId form, const std::string& text) {
        if (form == id) {
            ++unchanged_;
            return;
        }
        const std::optional<bool> differ = areVectors_ ? differAsVectors(id, form) : differAsIntegers(id, form);
        if (!differ)
            return;
        ++proofs_;
        Fuzz::demand(!*differ, "a form equals its condition", text + "\n" + session_->service.printCExpr(form));
    }

    std::optional<bool> differAsIntegers(SymbolicExprId id, SymbolicExprId form) {
        Testing::Solver& solver = session_->solver;
        solver.limit(20'000'000);
        const Z3_ast a = solver.truth(id);
        const Z3_ast b = solver.truth(form);
        const auto one = solver.tryHold(a, solver.negated(b));
        const auto other = solver.tryHold(solver.negated(a), b);
        if (!one || !other) {
            ++unknown_;
            return std::nullopt;
        }
        return *one || *other;
    }

    std::optional<bool> differAsVectors(SymbolicExprId id, SymbolicExprId form) {
        VectorSolver& solver = session_->vectors;
        if (!solver.canTranslate(id) || !solver.canTranslate(form)) {
            ++leftOut_;
            return std::nullopt;
        }
        const std::optional<bool> differ = solver.differ(id, form);
        unknown_ += differ ? 0U : 1U;
        return differ;
    }

    /// A service and solvers over its table; a fresh one now and then.
    struct Session {
        Session() : solver(service.table()), vectors(service.table()) { service.setSolver(false); }

        VCService service;
        Testing::Solver solver;
        VectorSolver vectors;
    };

    bool areVectors_;
    std::optional<Session> session_;
    std::uint64_t proofs_ = 0;
    std::uint64_t unchanged_ = 0;
    std::uint64_t leftOut_ = 0;
    std::uint64_t unknown_ = 0;
};

} // namespace

std::unique_ptr<Job> makeSolverProofs(const std::string& name) {
    return std::make_unique<SolverProofs>(name == "vectors");
}

} // namespace VT::Campaign
