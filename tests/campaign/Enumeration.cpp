// Every small condition, by its number.  Numbers are taken in an order that leaps through all of them, so that a run
// that is cut short was a sample of all.
//
// Trees of n operators are counted as T(0) = leaves, T(n) = unary T(n-1) + binary (the sum of T(i) T(n-1-i)), and a
// number is taken apart in the same way.
#include "base/VCService.hpp"
#include "tests/campaign/Campaign.hpp"
#include "tests/support/generators/AnyNode.hpp"
#include "tests/support/oracles/Agreement.hpp"

#include <algorithm>
#include <array>
#include <numeric>
#include <optional>

namespace VT::Campaign {

namespace {

using Op = SymbolicOp;
using Testing::Assignment;

constexpr std::size_t mostOperators = 3;
constexpr std::uint64_t itemsOfService = 512;

/// The conditions over a few leaves with a number of operators.
class SmallConditions {
public:
    SmallConditions() {
        for (const Op op : Testing::valueOperators())
            if (op != Op::SingleAnd && op != Op::SingleOr) // which C spells as bits
                (Testing::operandCount(op) == 1 ? unary_ : binary_).push_back(op);
        counts_[0] = leaves;
        for (std::size_t n = 1; n <= mostOperators; ++n) {
            counts_[n] = unary_.size() * counts_[n - 1];
            for (std::size_t i = 0; i < n; ++i)
                counts_[n] += binary_.size() * counts_[i] * counts_[n - 1 - i];
        }
    }

    [[nodiscard]] std::uint64_t count(std::size_t operators) const { return counts_[operators]; }

    /// Those with at most so many operators.
    [[nodiscard]] std::uint64_t countUpTo(std::size_t operators) const {
        return std::accumulate(counts_.begin(), counts_.begin() + static_cast<std::ptrdiff_t>(operators) + 1,
                               std::uint64_t{0});
    }

    /// The condition of a number, those with fewer operators first.
    SymbolicExprId make(SymbolicExprTable& table, std::uint64_t number) const {
        std::size_t operators = 0;
        for (; number >= counts_[operators]; ++operators)
            number -= counts_[operators];
        return make(table, operators, number);
    }

    SymbolicExprId make(SymbolicExprTable& table, std::size_t operators, // NOLINT(misc-no-recursion): three deep
                        std::uint64_t number) const {
        const Testing::Trees tree{table};
        if (operators == 0) {
            static constexpr std::array names{"A", "B", "true", "(sim)"};
            return number < names.size() ? tree.name(names[number])
                                         : tree.integer(static_cast<int>(number - names.size()));
        }
        const std::uint64_t below = counts_[operators - 1];
        if (number < unary_.size() * below)
            return tree(unary_[number / below], make(table, operators - 1, number % below));
        number -= unary_.size() * below;
        for (std::size_t left = 0;; ++left) {
            const std::uint64_t right = counts_[operators - 1 - left];
            const std::uint64_t all = binary_.size() * counts_[left] * right;
            if (number >= all) {
                number -= all;
                continue;
            }
            const Op op = binary_[number / (counts_[left] * right)];
            number %= counts_[left] * right;
            const SymbolicExprId first = make(table, left, number / right);
            return tree(op, first, make(table, operators - 1 - left, number % right));
        }
    }

private:
    static constexpr std::size_t leaves = 6;
    std::vector<Op> unary_;
    std::vector<Op> binary_;
    std::array<std::uint64_t, mostOperators + 1> counts_{};
};

/// Values of A and B around zero, with each of the variant keywords in force.
std::vector<Assignment> smallAssignments() {
    std::vector<Assignment> all;
    for (int sim = 0; sim < 2; ++sim)
        Testing::forEachAssignment({"A", "B"}, -2, 3, [&](Assignment values) {
            values["(sim)"] = sim;
            values["(codegen)"] = 1 - sim;
            all.push_back(std::move(values));
        });
    return all;
}

/// Leaps through `items` numbers.
std::uint64_t leap(std::uint64_t item, std::uint64_t items) {
    std::uint64_t step = items / 2 + items / 9 + 1;
    while (std::gcd(step, items) != 1)
        ++step;
    return item * step % items; // both are far below 2^32
}

class Enumeration final : public Job {
public:
    void run(std::uint64_t /*seed*/, std::uint64_t item) override {
        if (!service_ || item % itemsOfService == 0)
            service_.emplace().setSolver(false);
        VCService& service = *service_;
        service.table().addBoolSymbols();
        const std::uint64_t number = leap(item, items());
        const SymbolicExprId id = conditions_.make(service.table(), number);
        ++done_;
        try {
            const Testing::Agreement agreement(service, id, world_, assignments_);
            const std::string c = service.printCExprNoConversion(id);
            const std::string quill = service.printQExprWithConversion(id);
            Fuzz::demand(service.printCExprNoConversion(service.parseC(c)) == c || c.empty(), "C text settles", c);
            agreement.demandReadBack(false);
            agreement.demandReadBack(true);
            agreement.demandSimplified();
            agreement.demandDecided(service.table().getIdTRUE());
            if (number < conditions_.countUpTo(2)) {
                agreement.demandShortest();
                const Decision apart = service.isDisjoint(id, service.NOT(id, false));
                Fuzz::demand(!apart.isNo(), "a condition and its negation never hold together", c);
                undecided_ += apart.isUndecided() ? 1U : 0U;
                const Decision same = service.isEquivalent(id, service.simplify(id, false).id());
                undecided_ += same.isUndecided() ? 1U : 0U;
            }
        } catch (const Testing::Disagreement& disagreement) {
            throw Broken(disagreement.what());
        }
    }

    [[nodiscard]] std::string figure() const override {
        return std::to_string(done_) + " of " + std::to_string(items()) + " conditions, " + std::to_string(undecided_) +
               " questions undecided";
    }

    [[nodiscard]] std::uint64_t items() const override { return conditions_.countUpTo(mostOperators); }

private:
    SmallConditions conditions_;
    const Testing::ConditionWorld world_{.names = {"A", "B"}, .reals = false, .calls = false};
    const std::vector<Assignment> assignments_ = smallAssignments();
    std::optional<VCService> service_;
    std::uint64_t done_ = 0;
    std::uint64_t undecided_ = 0;
};

/// Pairs of conditions of at most one operator, all of them; beyond these, random pairs of two.
class Pairs final : public Job {
public:
    void run(std::uint64_t seed, std::uint64_t item) override {
        if (!service_ || item % itemsOfService == 0)
            service_.emplace().setSolver(false);
        SymbolicExprTable& table = service_->table();
        const std::uint64_t few = conditions_.countUpTo(1);
        std::array<SymbolicExprId, 2> ids{};
        if (item < few * few) {
            const std::uint64_t number = leap(item, few * few);
            ids = {conditions_.make(table, number / few), conditions_.make(table, number % few)};
            ++enumerated_;
        } else {
            std::mt19937_64 random = randomOf(seed, item);
            for (SymbolicExprId& id : ids)
                id = conditions_.make(table, 2, random() % conditions_.count(2));
            ++chosen_;
        }
        const Relation relation = service_->compare(ids[0], ids[1]);
        undecided_ += relation.kind == RelationKind::Undecided ? 1U : 0U;
        const Testing::ExactValue first(table, ids[0]);
        const Testing::ExactValue second(table, ids[1]);
        for (const Assignment& assignment : assignments_) {
            const auto a = first.under(assignment);
            const auto b = second.under(assignment);
            if (!a || !b)
                continue;
            const bool isWrong = (a->holds() && !b->holds() && relation.onlyA.isNo()) ||
                                 (b->holds() && !a->holds() && relation.onlyB.isNo()) ||
                                 (a->holds() && b->holds() && relation.both.isNo());
            Fuzz::demand(!isWrong, "a relation holds for every assignment",
                         service_->printCExprNoConversion(ids[0]) + "\n" + service_->printCExprNoConversion(ids[1]));
        }
    }

    [[nodiscard]] std::string figure() const override {
        const std::uint64_t few = conditions_.countUpTo(1);
        return std::to_string(enumerated_) + " of " + std::to_string(few * few) + " pairs of at most 1 operator, " +
               std::to_string(chosen_) + " random pairs of 2, " + std::to_string(undecided_) + " undecided";
    }

private:
    SmallConditions conditions_;
    const std::vector<Assignment> assignments_ = smallAssignments();
    std::optional<VCService> service_;
    std::uint64_t enumerated_ = 0;
    std::uint64_t chosen_ = 0;
    std::uint64_t undecided_ = 0;
};

} // namespace

std::unique_ptr<Job> makeEnumeration(const std::string& name) {
    if (name == "pairs")
        return std::make_unique<Pairs>();
    return std::make_unique<Enumeration>();
}

} // namespace VT::Campaign
