// The condition grammar: C-like text to syntax values.
//
// Method: recursive descent for operands, operator precedence for what joins them (Floyd, "Syntactic analysis and
// operator precedence", 1963): operands and operators of one expression are folded as they are read, and operators that
// wait bind tighter and tighter, so the number of strengths bounds their stack.  Alternatives differ in their first
// token, so no text is read twice.
// Cost: linear in the text; the depth of the stack is bounded by limits::nesting.
// Relies on: the operator table for spellings and strengths.
#include "parser/ConditionGrammar.hpp"

#include "base/core/Check.hpp"
#include "base/core/Limits.hpp"
#include "base/variants/VariantKeywords.hpp"
#include "host/Numbers.hpp"
#include "parser/StrictRealPolicies.hpp"
#include "parser/SyntaxActions.hpp"

#include <boost/spirit/include/phoenix_core.hpp>
#include <boost/spirit/include/phoenix_operator.hpp>
#include <boost/spirit/include/qi.hpp>

#include <array>
#include <bit>
#include <type_traits>
#include <utility>

namespace VT::Parser {

namespace {

namespace ascii = boost::spirit::ascii;
namespace fusion = boost::fusion;
namespace qi = boost::spirit::qi;

using Place = const char*;
using Range = boost::iterator_range<Place>;
using Blanks = ascii::space_type;

/// The state of one reading.  The grammar itself keeps nothing from text to text and may be shared.
struct Reading {
    SyntaxArena& arena;
    Place refused = nullptr; ///< the literal, bracket or prefix operator that ended the reading

    void refuse(Place place) {
        if (refused == nullptr)
            refused = place;
    }
};

/// An infix operator: its binding strength (a smaller number binds tighter) and the action that joins its operands.
struct Infix {
    std::uint8_t precedence = 0;
    expression_ast (*combine)(SyntaxArena& arena, const expression_ast& left, const expression_ast& right) = nullptr;
};

struct InfixRow {
    SymbolicOp op = SymbolicOp::None;
    Infix infix;
};

template <SymbolicOp Op>
constexpr InfixRow infix{
    Op, {operatorInfo(Op).precedence, [](SyntaxArena& arena, const expression_ast& left, const expression_ast& right) {
             return binary_expr<Op>()(arena, left, right);
         }}};

/// The rows of the operators in conditionInfixOps, in the order of the operator table.
constexpr auto infixOperators = [] {
    std::array<InfixRow, static_cast<std::size_t>(conditionInfixOps.size())> rows{};
    std::size_t next = 0;
#define VTSYM_OPERATOR(Code, Name, ...)                                                                                \
    if constexpr (conditionInfixOps.contains(SymbolicOp::Name))                                                        \
        rows[next++] = infix<SymbolicOp::Name>;
#include "base/core/operators.def"
#undef VTSYM_OPERATOR
    return rows;
}();

constexpr std::size_t countPrecedences() {
    std::uint64_t seen = 0;
    for (const InfixRow& row : infixOperators)
        seen |= std::uint64_t{1} << row.infix.precedence;
    return static_cast<std::size_t>(std::popcount(seen));
}

/// Operands and infix operators of one expression, folded from the left as soon as their strength allows.  Operators
/// that wait bind tighter and tighter, so never more of them wait than there are strengths.
class OperatorChain {
public:
    void start(const expression_ast& operand) { operands_[0] = operand; }

    void add(SyntaxArena& arena, Infix infix, const expression_ast& operand) {
        foldUpTo(arena, infix.precedence);
        VTSYM_CHECK(waiting_ < levels);
        operators_[waiting_++] = infix;
        operands_[waiting_] = operand;
    }

    const expression_ast& finish(SyntaxArena& arena) {
        foldUpTo(arena, loosest);
        return operands_[0];
    }

private:
    static constexpr std::size_t levels = countPrecedences();
    static constexpr std::uint8_t loosest = 255;

    /// Folds the waiting operators that bind as tightly as `precedence` or tighter.
    void foldUpTo(SyntaxArena& arena, std::uint8_t precedence) {
        for (; waiting_ > 0 && operators_[waiting_ - 1].precedence <= precedence; --waiting_)
            operands_[waiting_ - 1] =
                operators_[waiting_ - 1].combine(arena, operands_[waiting_ - 1], operands_[waiting_]);
    }

    std::array<expression_ast, levels + 1> operands_;
    std::array<Infix, levels> operators_;
    std::size_t waiting_ = 0;
};

// Semantic actions.  Every rule inherits the reading and the number of brackets open around it.

template <class Context>
auto& valueOf(Context& context) {
    return fusion::at_c<0>(context.attributes);
}

template <class Context>
Reading& readingOf(Context& context) {
    return fusion::at_c<1>(context.attributes);
}

template <class Context>
std::size_t bracketsAround(Context& context) {
    return fusion::at_c<2>(context.attributes);
}

template <class Context>
OperatorChain& chainOf(Context& context) {
    return fusion::at_c<0>(context.locals);
}

std::string_view textOf(const Range& range) {
    return {range.begin(), range.size()};
}

struct start_chain {
    template <class Context>
    void operator()(const expression_ast& operand, Context& context, bool&) const {
        chainOf(context).start(operand);
    }
};

struct add_operand {
    template <class Attribute, class Context>
    void operator()(const Attribute& pair, Context& context, bool&) const {
        chainOf(context).add(readingOf(context).arena, fusion::at_c<0>(pair), fusion::at_c<1>(pair));
    }
};

struct finish_chain {
    template <class Context>
    void operator()(qi::unused_type, Context& context, bool&) const {
        valueOf(context) = chainOf(context).finish(readingOf(context).arena);
    }
};

struct apply_prefixes {
    template <class Attribute, class Context>
    void operator()(const Attribute& pair, Context& context, bool&) const {
        expression_ast value = fusion::at_c<1>(pair);
        const std::string_view prefixes = textOf(fusion::at_c<0>(pair));
        for (std::size_t i = prefixes.size(); i-- > 0;)
            value = apply(prefixes[i], readingOf(context).arena, value);
        valueOf(context) = value;
    }

    static expression_ast apply(char prefix, SyntaxArena& arena, const expression_ast& operand) {
        switch (prefix) {
        case '-':
            return negate_expr()(arena, operand);
        case '!':
            return not_expr()(arena, operand);
        case '~':
            return cmp_expr()(arena, operand);
        default: // a plus changes nothing, nor does a blank
            return operand;
        }
    }
};

/// Notes the place of an error.  No other alternative could read the text there, so the whole text fails too.
struct refuse {
    template <class Context>
    void operator()(const Range& here, Context& context, bool& pass) const {
        readingOf(context).refuse(here.begin());
        pass = false;
    }
};

struct enter_bracket {
    template <class Context>
    void operator()(const Range& bracket, Context& context, bool& pass) const {
        if (bracketsAround(context) >= limits::nesting)
            refuse()(bracket, context, pass);
    }
};

struct store_text {
    template <class Context>
    void operator()(const Range& text, Context& context, bool&) const {
        valueOf(context) = textOf(text);
    }
};

struct store_value {
    template <class Value, class Context>
    void operator()(const Value& value, Context& context, bool&) const {
        valueOf(context) = value;
    }
};

/// A number beyond the finite values is not a real literal.
struct store_real {
    template <class Context>
    void operator()(const Range& digits, Context& context, bool& pass) const {
        std::string_view text = textOf(digits);
        if (text.starts_with('+'))
            text.remove_prefix(1);
        const ParsedNumber number = vtsv_strtod(text);
        pass = number.error == NumberError::None;
        if (pass)
            valueOf(context) = number.value;
    }
};

/// Extends the value that was read before: a name becomes a call or a member.
template <class Action>
struct extend_value {
    template <class Context>
    void operator()(qi::unused_type, Context& context, bool&) const {
        valueOf(context) = Action()(readingOf(context).arena, valueOf(context));
    }

    template <class Context>
    void operator()(const Range& name, Context& context, bool&) const {
        valueOf(context) = Action()(readingOf(context).arena, valueOf(context), textOf(name));
    }

    template <class Context>
    void operator()(const expression_list* arguments, Context& context, bool&) const {
        valueOf(context) = Action()(readingOf(context).arena, valueOf(context), arguments);
    }
};

struct append_element {
    template <class Context>
    void operator()(const expression_ast& element, Context& context, bool&) const {
        valueOf(context) = readingOf(context).arena.append(valueOf(context), element);
    }
};

/// One grammar for each combination of options.
///
/// Operands are led by their first token, so that none is read twice: f(x), f(), a.b and a share the reading of the
/// name.  An infix operator without an operand after it is given back; reading then stops before it.
class ConditionGrammar {
public:
    explicit ConditionGrammar(const GrammarOptions& options);
    ConditionGrammar(const ConditionGrammar&) = delete;
    ConditionGrammar& operator=(const ConditionGrammar&) = delete;

    /// Reads as much of a text as is an expression.
    bool read(Place& first, Place last, Reading& reading, expression_ast& value) const {
        return qi::phrase_parse(first, last, expression_(boost::phoenix::ref(reading), std::size_t{0}), Blanks(),
                                value);
    }

private:
    template <class Value, class... Locals>
    using Rule = qi::rule<Place, Value(Reading&, std::size_t), Blanks, Locals...>;

    qi::symbols<char, Infix> infix_;
    Rule<expression_ast, qi::locals<OperatorChain>> expression_;
    Rule<expression_ast> prefixed_;
    Rule<expression_ast> operand_;
    Rule<expression_list*> elements_;
};

ConditionGrammar::ConditionGrammar(const GrammarOptions& options) {
    using ascii::alnum;
    using ascii::alpha;
    using ascii::char_;
    using ascii::digit;
    using qi::_r1;
    using qi::_r2;
    using qi::eps;
    using qi::lexeme;
    using qi::lit;
    using qi::omit;
    using qi::raw;
    using qi::repeat;

    const std::string simKeyword = VariantKeywords::getSimVariantKeyword();
    const std::string codegenKeyword = VariantKeywords::getCodegenVariantKeyword();

    for (const InfixRow& row : infixOperators)
        infix_.add(std::string(operatorInfo(row.op).c), row.infix);
    if (!options.cOperators)
        infix_.add(std::string(operatorInfo(SymbolicOp::NotEqual).quill), infix<SymbolicOp::NotEqual>.infix);

    const auto identifier = qi::copy(raw[lexeme[(alpha | char_('_')) >> *(alnum | char_('_'))]]);
    const auto sign = qi::copy(char_("+-"));
    const auto real = qi::copy(raw[qi::real_parser<double, strict_real_policies<double>>()]);
    const auto integerOutOfRange = qi::copy(omit[lexeme[-sign >> raw[digit][refuse()]]]);
    // A sign directly before a number belongs to the number.
    const auto prefix = qi::copy(lexeme[char_("!~") | sign >> !(-lit('.') >> digit)]);
    const auto open = [](char bracket) { return qi::copy(omit[raw[lit(bracket)][enter_bracket()]]); };
    const auto inBrackets = _r2 + std::size_t{1};

    expression_ =
        prefixed_(_r1, _r2)[start_chain()] >> *(infix_ >> prefixed_(_r1, _r2))[add_operand()] >> eps[finish_chain()];

    prefixed_ =
        operand_(_r1, _r2)[store_value()] | (raw[repeat(std::size_t{1}, limits::nesting)[prefix]] >>
                                             !omit[raw[prefix][refuse()]] >> operand_(_r1, _r2))[apply_prefixes()];

    const auto call = qi::copy(open('(') >> (lit(')')[extend_value<void_fcn_call_expr>()] |
                                             (elements_(_r1, inBrackets) >> ')')[extend_value<fcn_call_expr>()]));
    const auto members = qi::copy(+('.' >> identifier[extend_value<member_val>()]));
    const auto keyword = qi::copy(raw[lit(simKeyword) | lit(codegenKeyword)]);

    operand_ = identifier[store_text()] >> -(call | members)                       //
               | real[store_real()]                                                //
               | qi::int_[store_value()]                                           //
               | integerOutOfRange                                                 //
               | eps(options.variantKeywords) >> keyword[store_text()]             //
               | open('(') >> (expression_(_r1, inBrackets) >> ')')[store_value()] //
               | open('[') >> (elements_(_r1, inBrackets) >> ']')[store_value()];

    elements_ = expression_(_r1, _r2)[append_element()] % ',';
}

const ConditionGrammar& grammarFor(const GrammarOptions& options) {
    static const std::array<ConditionGrammar, 4> grammars{
        ConditionGrammar({false, false}), ConditionGrammar({false, true}), //
        ConditionGrammar({true, false}), ConditionGrammar({true, true})};
    return grammars[(options.cOperators ? 2U : 0U) + (options.variantKeywords ? 1U : 0U)];
}

} // namespace

SyntaxResult readCondition(std::string_view text, const GrammarOptions& options, SyntaxArena& arena) {
    const Place begin = text.data();
    const Place end = begin + text.size();
    Place stop = begin;
    Reading reading{arena};
    expression_ast value;
    const bool read = grammarFor(options).read(stop, end, reading, value);
    if (reading.refused != nullptr)
        stop = reading.refused;
    else if (!read)
        stop = begin;
    else if (stop == end)
        return {value, text.size()};
    return {std::nullopt, static_cast<std::size_t>(stop - begin)};
}

} // namespace VT::Parser
