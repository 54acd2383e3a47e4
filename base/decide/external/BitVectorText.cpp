// Numbers as bit vectors of one width, which is known when everything is written.
//
// Every term carries the bits that hold each of its values, so nothing overflows: an unknown as many as its bounds
// need, a sum one more than its operands, a product those of both.  Unknowns without bounds get a few bits, which finds
// assignments and proves nothing.
//
// Where all arithmetic is & | ^ ~ the question is decided for all integers: these work column by column, and a
// comparison depends on the highest column in which its sides differ.  Of the columns beyond the literals, one for each
// comparison and one for the sign suffice; the others can be left out without changing any comparison.
#include "base/core/Limits.hpp"
#include "base/core/Nodes.hpp"
#include "base/decide/external/SmtWriter.hpp"
#include "base/integer/ExactArithmetic.hpp"

#include <algorithm>
#include <bit>
#include <cstdlib>
#include <limits>
#include <map>

namespace VT {

namespace {

struct Bounds {
    std::int64_t low = minusInfinite;
    std::int64_t high = plusInfinite;

    void restrict(SymbolicOp op, std::int64_t value) {
        if (op == SymbolicOp::Equal || op == SymbolicOp::GreaterThanEqual)
            low = std::max(low, value);
        if (op == SymbolicOp::Equal || op == SymbolicOp::LessThanEqual)
            high = std::min(high, value);
        if (op == SymbolicOp::LessThan)
            high = std::min(high, value - 1); // a literal has 32 bits
        if (op == SymbolicOp::GreaterThan)
            low = std::max(low, value + 1);
    }
};

/// Bits that hold a value and its sign.
unsigned widthOf(std::int64_t value) {
    return static_cast<unsigned>(std::bit_width(static_cast<std::uint64_t>(value < 0 ? ~value : value))) + 1;
}

// NOLINTNEXTLINE(cppcoreguidelines-virtual-class-destructor): final
class BitVectorText final : SmtWriter {
public:
    /// `isColumnwise` writes & | ^ ~ alone.
    BitVectorText(const SmtSource& source, unsigned unknownBits, bool isColumnwise)
        : SmtWriter(source),
          unknownBits_(unknownBits),
          isColumnwise_(isColumnwise) {
        collectBounds();
    }

    std::optional<SmtQuestion> write() {
        if (!writeAll() || failed_)
            return std::nullopt;
        const std::size_t width = isColumnwise_ ? widest_ + comparisons_ + 1 : widest_ + 1;
        if (width > limits::solverBits || products_ * width * width > limits::solverProductBits)
            return std::nullopt;
        out_.width = static_cast<unsigned>(width);
        const std::string digits = std::to_string(width);
        std::string head = "(define-sort V () (_ BitVec " + digits + "))\n";
        for (const auto& [value, index] : literals_) {
            const std::string size = joined({"(_ bv", decimal(std::abs(value)), " ", digits, ")"});
            head += joined(
                {"(define-fun ", numbered('k', index), " () V ", value < 0 ? compound("bvneg", size) : size, ")\n"});
        }
        out_.text.insert(0, head);
        return std::move(out_);
    }

private:
    void collectBounds() {
        for (const AskedFact& fact : factsOf(table_, source_.asked, source_.conditions)) {
            source_.steps.take();
            const SymbolicExpr& node = *table_.get(fact.condition);
            if (!comparisonOps.contains(node.op()) || !table_.has(node.getInput(0)) || !table_.has(node.getInput(1)))
                continue;
            const LeafMeaning left = source_.leaves(node.getInput(0));
            const LeafMeaning right = source_.leaves(node.getInput(1));
            const SymbolicOp op = fact.holds ? node.op() : operatorInfo(node.op()).negated;
            if (left.kind == LeafMeaning::Kind::Free && right.kind == LeafMeaning::Kind::Integer)
                bounds_[left.node].restrict(op, right.integer);
            else if (right.kind == LeafMeaning::Kind::Free && left.kind == LeafMeaning::Kind::Integer)
                bounds_[right.node].restrict(operatorInfo(op).mirrored, left.integer);
        }
    }

    std::string literal(std::int64_t value) {
        const auto [at, isNew] = literals_.try_emplace(value, literals_.size());
        return numbered('k', at->second);
    }

    Term sized(std::string text, unsigned bits) {
        widest_ = std::max(widest_, bits);
        if (bits > limits::solverBits)
            failed_ = true;
        Term term{std::move(text), Sort::Number};
        term.bits = std::min(bits, limits::solverBits);
        return term;
    }

    Term integer(std::int64_t value) override { return sized(literal(value), widthOf(value)); }

    Term real(double) override { return {}; }

    void restrict(Term& unknown, SymbolicExprId node) override {
        Bounds bounds;
        if (const auto found = bounds_.find(node); found != bounds_.end())
            bounds = found->second;
        if (source_.bits32) {
            bounds.low = std::max<std::int64_t>(bounds.low, std::numeric_limits<std::int32_t>::min());
            bounds.high = std::min<std::int64_t>(bounds.high, std::numeric_limits<std::int32_t>::max());
        }
        if (isColumnwise_ && !source_.bits32) {
            unknown.bits = 1;
            return;
        }
        const std::int64_t reach = std::int64_t{1} << (unknownBits_ - 1);
        const bool isBounded = bounds.low != minusInfinite && bounds.high != plusInfinite;
        if (!isBounded) {
            out_.isProof = false;
            if (bounds.low == minusInfinite)
                bounds.low = (bounds.high == plusInfinite ? 0 : bounds.high) - reach;
            if (bounds.high == plusInfinite)
                bounds.high = bounds.low + 2 * reach;
        }
        unknown.bits = std::max(integer(bounds.low).bits, integer(bounds.high).bits);
        SmtWriter::write({"(assert (and (bvsle ", literal(bounds.low), " ", unknown.name, ") (bvsle ", unknown.name,
                          " ", literal(bounds.high), ")))\n"});
        comparisons_ += 2;
    }

    const char* sortName(Sort sort) const override { return sort == Sort::Truth ? "Bool" : "V"; }

    std::string nonZero(const Term& number) override {
        ++comparisons_;
        return compound("not", compound("=", number.name, literal(0)));
    }

    Term comparison(SymbolicOp op, const Term& a, const Term& b) override {
        ++comparisons_;
        const std::string_view name = op == SymbolicOp::NotEqual ? "=" : comparisonName(op);
        const std::string function = name == "="    ? "="
                                     : name == "<"  ? "bvslt"
                                     : name == "<=" ? "bvsle"
                                     : name == ">"  ? "bvsgt"
                                                    : "bvsge";
        std::string text = compound(function, a.name, b.name);
        return truth(op == SymbolicOp::NotEqual ? compound("not", text) : std::move(text));
    }

    Term negative(const Term& a) override {
        if (a.integer && *a.integer != minusInfinite) {
            Term term = integer(-*a.integer);
            term.integer = -*a.integer;
            return term;
        }
        failed_ = failed_ || isColumnwise_;
        return sized(compound("bvneg", a.name), a.bits + 1);
    }

    Term complement(const Term& a) override { return sized(compound("bvnot", a.name), a.bits); }

    Term arithmetic(SymbolicOp op, const Term& a, const Term& b) override {
        const unsigned larger = std::max(a.bits, b.bits);
        const auto of = [&](const char* function, unsigned bits) {
            return sized(compound(function, a.name, b.name), bits);
        };
        switch (op) {
        case SymbolicOp::BitAnd:
            return of("bvand", larger);
        case SymbolicOp::BitOr:
            return of("bvor", larger);
        case SymbolicOp::BitXOr:
            return of("bvxor", larger);
        default:
            break;
        }
        failed_ = failed_ || isColumnwise_;
        switch (op) {
        case SymbolicOp::Plus:
            return of("bvadd", larger + 1);
        case SymbolicOp::Minus:
            return of("bvsub", larger + 1);
        case SymbolicOp::Multiply:
        case SymbolicOp::DotMul:
            ++products_;
            return of("bvmul", a.bits + b.bits);
        case SymbolicOp::Divide:
        case SymbolicOp::Modulo:
            if (!b.integer || *b.integer == 0)
                only(compound("not", compound("=", b.name, literal(0))));
            ++products_;
            return of(op == SymbolicOp::Divide ? "bvsdiv" : "bvsrem", a.bits + 1);
        case SymbolicOp::ShiftLeft:
        case SymbolicOp::ShiftRight:
            return shift(op == SymbolicOp::ShiftLeft, a, b);
        default:
            return {};
        }
    }

    Term shift(bool isLeft, const Term& a, const Term& b) {
        constexpr unsigned most = 31;
        const bool isLiteral = b.integer && *b.integer >= 0 && *b.integer <= most;
        if (!isLiteral)
            only(joined({"(and (bvsle ", literal(0), " ", b.name, ") (bvsle ", b.name, " ", literal(most), "))"}));
        integer(most); // so that distances fit
        const unsigned distance = isLiteral ? static_cast<unsigned>(*b.integer) : most;
        return sized(compound(isLeft ? "bvshl" : "bvashr", a.name, b.name), isLeft ? a.bits + distance : a.bits);
    }

    /// Leaves out assignments for which something does not hold.
    void only(const std::string& condition) {
        out_.isProof = false;
        SmtWriter::write({compound("assert", condition), "\n"});
    }

    unsigned unknownBits_;
    bool isColumnwise_;
    bool failed_ = false;
    unsigned widest_ = 1;
    std::size_t comparisons_ = 0;
    std::size_t products_ = 0; ///< and quotients
    std::map<SymbolicExprId, Bounds> bounds_;
    std::map<std::int64_t, std::size_t> literals_;
};

} // namespace

std::optional<SmtQuestion> writeBitVectors(const SmtSource& source, unsigned unknownBits) {
    if (auto bitwise = BitVectorText(source, unknownBits, true).write())
        return bitwise;
    return BitVectorText(source, unknownBits, false).write();
}

} // namespace VT
