// The embedded host's parser of Quill text: operator precedence with explicit stacks.
#pragma once

#include "host/embedded/QuillBrackets.hpp"
#include "host/embedded/QuillBuilder.hpp"

namespace VT::Embedded {

/// The parser of host/QuillParser.hpp over char.  Linear in the text; keeps the memory of small texts for the next one.
class QuillParser final : public PARSER_T<char>, public ReadsOrdinaryQuill {
public:
    QuillParser(std::size_t nesting, std::span<const std::string> keywords);

    const Tree* generate_parse_tree(const char* text, std::size_t length) override;
    void delete_parse_tree(const Tree* tree) noexcept override;

    QuillFailure failure() const noexcept override { return failure_; }

private:
    /// The state after one token.
    enum class State : std::uint8_t {
        Operand,  ///< an operand must follow
        Operator, ///< an operand is complete
        Done,
        Failed,
    };

    /// What may directly follow an operand.
    enum class Tail : std::uint8_t {
        Chain, ///< arguments, a field, a transpose
        Value, ///< a transpose
        Text,  ///< none of them
    };

    struct Open {
        const QuillBracket* bracket;
        QuillNode token;
        std::size_t operands; ///< when the bracket was opened
        std::size_t row;      ///< operands before those of the current row
        std::size_t outer;    ///< the group around it
    };

    State readText(std::string_view text);
    State fail(std::string_view reason, std::size_t position);

    State fail(std::string_view reason) { return fail(reason, lexer_.position()); }

    // An operand must follow.
    State readOperand();
    State readName();
    State readQuotedText();
    State readPrefix(QuillToken code, QuillRule rule);
    State readFunction();
    State readParameters(std::size_t start);
    State open(const QuillBracket& bracket);
    State missingOperand();

    // An operand is complete.
    State readOperator();
    State readInfix(const QuillOperator& infix);
    State readColon();
    State readPostfix(const QuillOperator& postfix);
    State readField();
    State nextElement();
    State nextRow();
    State extraSemicolon();
    State close();
    State finish();
    State missingOperator();
    bool startsElement() const;

    State push(const QuillNode& operand, Tail tail);
    void endRow();

    void reduceTo(QuillLevel level) { functions_ -= builder_.reduceTo(level); }

    /// Makes the last operand the first child of a rule.
    void wrap(QuillRule rule, std::span<const QuillNode> children) {
        builder_.replace(1, builder_.lastOperand().start, rule, children);
    }

    std::size_t depth() const { return open_.size() - 1 + functions_; }

    /// The keyword at this place, empty without one.
    std::string_view keywordHere() const;

    const std::size_t nesting_;
    const std::vector<std::string> keywords_;

    QuillLexer lexer_{{}};
    QuillFailure failure_;
    QuillBuilder builder_;
    std::vector<Open> open_;
    std::size_t functions_ = 0; ///< anonymous functions whose bodies are not complete
    std::size_t prefixes_ = 0;  ///< prefix operators directly before this place
    std::size_t indexes_ = 0;   ///< open brackets around arguments
    bool fresh_ = false;        ///< a row or an argument list has just begun
    Tail tail_ = Tail::Value;   ///< of the last operand
};

} // namespace VT::Embedded
