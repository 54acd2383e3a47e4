// Writes definitions from the operands up.
//
// A node is a number, a rational number or a truth value, and is converted where its parent needs another sort: a truth
// value counts 1 or 0, a number is true where it is not 0.
#include "base/decide/external/SmtWriter.hpp"

#include "base/core/Nodes.hpp"
#include "base/core/Walk.hpp"
#include "base/decide/witness/CallCongruence.hpp"

#include <cmath>
#include <utility>

namespace VT {

// Text.

std::string joined(std::initializer_list<std::string_view> pieces) {
    std::string text;
    for (const std::string_view piece : pieces)
        text.append(piece);
    return text;
}

std::string SmtWriter::compound(std::string_view function, std::string_view a) {
    return joined({"(", function, " ", a, ")"});
}

std::string SmtWriter::compound(std::string_view function, std::string_view a, std::string_view b) {
    return joined({"(", function, " ", a, " ", b, ")"});
}

std::string SmtWriter::choose(std::string_view condition, std::string_view a, std::string_view b) {
    return joined({"(ite ", condition, " ", a, " ", b, ")"});
}

std::string SmtWriter::decimal(std::int64_t value) {
    const auto size = static_cast<std::uint64_t>(value);
    return value < 0 ? compound("-", std::to_string(~size + 1)) : std::to_string(size);
}

std::string SmtWriter::numbered(char letter, std::size_t number) {
    return std::string(1, letter).append(std::to_string(number));
}

const char* SmtWriter::comparisonName(SymbolicOp op) {
    switch (op) {
    case SymbolicOp::LessThan:
        return "<";
    case SymbolicOp::LessThanEqual:
        return "<=";
    case SymbolicOp::GreaterThan:
        return ">";
    case SymbolicOp::GreaterThanEqual:
        return ">=";
    default:
        return "=";
    }
}

void SmtWriter::write(std::initializer_list<std::string_view> pieces) {
    for (const std::string_view piece : pieces)
        out_.text.append(piece);
}

std::string SmtWriter::declare(Sort sort) {
    std::string name = numbered('x', next_++);
    write({"(declare-const ", name, " ", sortName(sort), ")\n"});
    return name;
}

SmtWriter::Term SmtWriter::define(Term value) {
    if (value.sort == Sort::Unclear)
        return value;
    std::string name = numbered('n', next_++);
    write({"(define-fun ", name, " () ", sortName(value.sort), " ", value.name, ")\n"});
    value.name = std::move(name);
    return value;
}

// The walk.

bool SmtWriter::writeAll() {
    std::vector<std::string> truths;
    for (const SymbolicExprId condition : source_.conditions) {
        if (!walk(condition))
            return false;
        truths.push_back(truthOf(condition));
    }
    write({compound("assert", askedText(source_.asked, truths)), "\n"});
    return compareCalls();
}

bool SmtWriter::walk(SymbolicExprId root) {
    bool isComplete = true;
    std::vector<WalkFrame> stack;
    walkUnknown(
        table_, root, stack,
        [&](SymbolicExprId id, const SymbolicExpr*) {
            source_.steps.take();
            if (terms_.find(id) != nullptr)
                return true;
            const LeafMeaning meaning = source_.leaves(id);
            if (meaning.kind == LeafMeaning::Kind::Compound)
                return false;
            terms_.insert(id, leaf(meaning));
            return true;
        },
        [&](SymbolicExprId id, const SymbolicExpr& node, const SymbolicExpr*) {
            if (isComplete)
                terms_.insert(id, define(operation(node)));
        },
        [&](SymbolicExprId, const SymbolicExpr*) { isComplete = false; });
    return isComplete;
}

SmtWriter::Term SmtWriter::leaf(const LeafMeaning& meaning) {
    switch (meaning.kind) {
    case LeafMeaning::Kind::Integer: {
        Term term = integer(meaning.integer);
        term.integer = meaning.integer;
        term.literal = static_cast<double>(meaning.integer);
        return term;
    }
    case LeafMeaning::Kind::Real: {
        Term term = std::isfinite(meaning.real) ? real(meaning.real) : Term();
        term.literal = meaning.real;
        return term;
    }
    case LeafMeaning::Kind::Free:
    case LeafMeaning::Kind::Simulation:
    case LeafMeaning::Kind::CodeGeneration:
        if (const Term* const before = unknowns_.find(meaning.node); before != nullptr)
            return *before;
        return unknowns_.insert(meaning.node,
                                meaning.kind == LeafMeaning::Kind::Free ? unknown(meaning.node) : keyword(meaning));
    default:
        return {};
    }
}

SmtWriter::Term SmtWriter::unknown(SymbolicExprId node) {
    Term term{numbered('u', out_.unknowns.size()), Sort::Number};
    out_.unknowns.push_back(node);
    if (isFunctionCall(table_, node))
        out_.calls.push_back(node);
    restrict(term, node);
    return term;
}

/// The keywords share one truth value: they are 1 in simulation and 0 in generated code, or the opposite.
SmtWriter::Term SmtWriter::keyword(const LeafMeaning& meaning) {
    if (simulation_.empty())
        simulation_ = declare(Sort::Truth);
    const std::string name = numbered('u', out_.unknowns.size());
    out_.unknowns.push_back(meaning.node);
    Term one = integer(1);
    const Term zero = integer(0);
    const bool isSimulation = meaning.kind == LeafMeaning::Kind::Simulation;
    const std::string value =
        isSimulation ? choose(simulation_, one.name, zero.name) : choose(simulation_, zero.name, one.name);
    write({compound("assert", compound("=", name, value)), "\n"});
    one.name = name;
    return one;
}

std::string SmtWriter::truthOf(SymbolicExprId id) {
    const Term& term = *terms_.find(id);
    if (term.sort == Sort::Truth)
        return term.name;
    if (term.literal)
        return *term.literal != 0 ? "true" : "false"; // NaN is no zero
    return term.sort == Sort::Unclear ? declare(Sort::Truth) : nonZero(term);
}

/// A number; truth values become 0 and 1.
SmtWriter::Term SmtWriter::number(SymbolicExprId id) {
    const Term& term = *terms_.find(id);
    if (term.sort != Sort::Truth)
        return term;
    Term one = integer(1);
    one.name = choose(term.name, one.name, integer(0).name);
    return one;
}

SmtWriter::Term SmtWriter::operation(const SymbolicExpr& node) {
    const SymbolicOp op = node.op();
    const std::size_t operands = node.getNumInputs();
    switch (op) {
    case SymbolicOp::Not:
        return truth(compound("not", truthOf(node.getInput(0))));
    case SymbolicOp::And:
    case SymbolicOp::SingleAnd:
        return truth(compound("and", truthOf(node.getInput(0)), truthOf(node.getInput(1))));
    case SymbolicOp::Or:
    case SymbolicOp::SingleOr:
        return truth(compound("or", truthOf(node.getInput(0)), truthOf(node.getInput(1))));
    default:
        break;
    }
    if (operands == 0 || operands > 2)
        return {};
    const Term a = number(node.getInput(0));
    if (operands == 1) {
        if (a.sort == Sort::Unclear)
            return {};
        return op == SymbolicOp::UnaryMinus ? negative(a) : op == SymbolicOp::BitCompl ? complement(a) : Term();
    }
    const Term b = number(node.getInput(1));
    const bool isUnclear = a.sort == Sort::Unclear || b.sort == Sort::Unclear;
    if (comparisonOps.contains(op))
        return isUnclear ? anyTruth() : comparison(op, a, b);
    return isUnclear ? Term() : arithmetic(op, a, b);
}

// Calls.

/// States for every two calls of one function that they agree where their arguments do; arguments may hold calls.
bool SmtWriter::compareCalls() {
    for (std::size_t i = 1; i < out_.calls.size(); ++i) {
        const SymbolicExpr& late = *table_.get(out_.calls[i]);
        for (std::size_t j = 0; j < i; ++j) {
            source_.steps.take();
            const SymbolicExpr& early = *table_.get(out_.calls[j]);
            if (early.getInput(0) != late.getInput(0) || early.getNumInputs() != late.getNumInputs())
                continue;
            for (std::size_t at = 1; at < late.getNumInputs(); ++at)
                if (!walk(early.getInput(at)) || !walk(late.getInput(at)))
                    return false;
            write({compound("assert", congruence(out_.calls[j], out_.calls[i])), "\n"});
        }
    }
    return true;
}

std::string SmtWriter::congruence(SymbolicExprId a, SymbolicExprId b) {
    const SymbolicExpr& left = *table_.get(a);
    const SymbolicExpr& right = *table_.get(b);
    std::string equal = "true";
    for (std::size_t at = 1; at < left.getNumInputs(); ++at) {
        if (left.getInput(at) == right.getInput(at))
            continue;
        const Term x = number(left.getInput(at));
        const Term y = number(right.getInput(at));
        const bool isUnclear = x.sort == Sort::Unclear || y.sort == Sort::Unclear;
        equal = compound("and", equal, (isUnclear ? anyTruth() : comparison(SymbolicOp::Equal, x, y)).name);
    }
    return compound("=>", equal, compound("=", unknowns_.find(a)->name, unknowns_.find(b)->name));
}

} // namespace VT
