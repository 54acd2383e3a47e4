// Writes a question about conditions as SMT-LIB 2 text for another solver.
//
// One definition for each distinct node, in post-order, so that the text is linear in the graph. What is not understood
// and every operation outside its domain is a value of its own for its node that nothing is known of: the text admits
// every assignment that the conditions admit, so that "unsatisfiable" is a proof, and an assignment has to be confirmed
// by evaluation.  Calls are functions of their arguments: two calls of one function are compared.
//
// Logic and leaves are written here, numbers by the writers for integers and for bit vectors.
#pragma once

#include "base/decide/LeafReader.hpp"
#include "base/decide/Steps.hpp"
#include "base/decide/external/AskedQuestion.hpp"
#include "base/util/IdMap.hpp"

#include <cstdint>
#include <initializer_list>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace VT {

struct SmtQuestion {
    std::string text;                     ///< the assertions over the constants u0, u1, ...
    std::vector<SymbolicExprId> unknowns; ///< what these stand for, in the order of their first occurrence
    std::vector<SymbolicExprId> calls;    ///< those that are functions of their arguments
    unsigned width = 0;                   ///< of the constants as bit vectors; 0 for integers
    bool isProof = true;                  ///< whether "unsatisfiable" is a proof
    bool hasBits = false;                 ///< whether bits of two unknowns are combined
};

/// A question in terms of LeafReader, with the steps that writing it may take, one for each node or pair of calls.
struct SmtSource {
    const LeafReader& leaves;
    std::span<const SymbolicExprId> conditions;
    AskedOf asked;
    bool bits32; ///< unknowns are signed 32-bit integers
    Steps& steps;
};

/// Over integers and rational numbers, exact but for bits of two unknowns, of which some laws are stated.
/// Nothing where an operand is missing. Throws StepsUsedUp.
std::optional<SmtQuestion> writeIntegers(const SmtSource& source);

/// Over bit vectors that are wide enough for every value.  Unknowns that the question does not bound have `unknownBits`
/// bits, and "unsatisfiable" is no proof then, unless all operations work bit by bit.  Nothing where an operand is
/// missing or a value needs more than limits::solverBits.
std::optional<SmtQuestion> writeBitVectors(const SmtSource& source, unsigned unknownBits);

[[nodiscard]] std::string joined(std::initializer_list<std::string_view> pieces);

class SmtWriter {
public:
    SmtWriter(const SmtWriter&) = delete;
    SmtWriter& operator=(const SmtWriter&) = delete;

protected:
    enum class Sort : std::uint8_t { Number, Rational, Truth, Unclear };

    struct Term {
        std::string name;
        Sort sort = Sort::Unclear;          ///< Unclear has no name, and a truth of its own where one is asked for
        std::optional<double> literal = {}; ///< literals are rounded with each other
        std::optional<std::int64_t> integer = {}; ///< the value of an integer literal
        unsigned bits = 0; ///< of its values: exact for bit vectors, a measure of size for integers
    };

    explicit SmtWriter(const SmtSource& source) : source_(source), table_(source.leaves.table()) {}

    ~SmtWriter() = default;

    /// Writes everything into out_; false where an operand is missing.
    bool writeAll();

    virtual Term integer(std::int64_t value) = 0;
    virtual Term real(double value) = 0;
    /// Says what is known of an unknown.
    virtual void restrict(Term& unknown, SymbolicExprId node) = 0;
    virtual Term negative(const Term& a) = 0;
    virtual Term complement(const Term& a) = 0;
    virtual Term arithmetic(SymbolicOp op, const Term& a, const Term& b) = 0;
    virtual Term comparison(SymbolicOp op, const Term& a, const Term& b) = 0;
    /// Whether a number differs from 0.
    virtual std::string nonZero(const Term& number) = 0;
    virtual const char* sortName(Sort sort) const = 0;

    void write(std::initializer_list<std::string_view> pieces);
    std::string declare(Sort sort);

    /// A truth value that nothing is known of.
    Term anyTruth() { return {declare(Sort::Truth), Sort::Truth}; }

    static std::string compound(std::string_view function, std::string_view a);
    static std::string compound(std::string_view function, std::string_view a, std::string_view b);
    static std::string choose(std::string_view condition, std::string_view a, std::string_view b);
    static std::string decimal(std::int64_t value);
    static std::string numbered(char letter, std::size_t number);
    /// The function of SMT-LIB for a comparison other than !=.
    static const char* comparisonName(SymbolicOp op);

    static Term truth(std::string text) { return {std::move(text), Sort::Truth}; }

    const SmtSource& source_;
    const SymbolicExprTable& table_;
    SmtQuestion out_;

private:
    bool walk(SymbolicExprId root);
    Term leaf(const LeafMeaning& meaning);
    Term operation(const SymbolicExpr& node);
    Term unknown(SymbolicExprId node);
    Term keyword(const LeafMeaning& meaning);
    Term define(Term value);
    std::string truthOf(SymbolicExprId id);
    Term number(SymbolicExprId id);
    bool compareCalls();
    std::string congruence(SymbolicExprId a, SymbolicExprId b);

    IdMap<Term> terms_;
    IdMap<Term> unknowns_; ///< by the node of the leaf, which may differ from that of a bound member
    std::string simulation_;
    std::size_t next_ = 0;
};

} // namespace VT
