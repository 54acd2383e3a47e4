// The embedded host's parser of Quill text.
//
// Method: operator precedence (Floyd, "Syntactic analysis and operator precedence", 1963) with two states: an operand
// must follow, or one is complete.  Brackets and anonymous functions are kept on explicit stacks; nothing recurses.
// Cost: linear in the text; memory in the open brackets and the tree.
// Relies on: QuillLexer for tokens, QuillBuilder for the stack of operands and the tree.
#include "host/embedded/EmbeddedQuillParser.hpp"

#include <array>
#include <limits>
#include <utility>

namespace VT::Embedded {

QuillParser::QuillParser(std::size_t nesting, std::span<const std::string> keywords)
    : nesting_(nesting),
      keywords_(keywords.begin(), keywords.end()) {}

const QuillParser::Tree* QuillParser::generate_parse_tree(const char* text, std::size_t length) {
    builder_.start();
    const QuillTree* const tree = readText({text, length}) == State::Done ? builder_.finish() : nullptr;
    builder_.release();
    return tree;
}

void QuillParser::delete_parse_tree(const Tree* tree) noexcept {
    // This parser has made the tree, and no constant one.
    builder_.recycle(std::unique_ptr<QuillTree>(const_cast<QuillTree*>(static_cast<const QuillTree*>(tree))));
}

QuillParser::State QuillParser::readText(std::string_view text) {
    lexer_ = QuillLexer(text);
    failure_ = {};
    open_.clear();
    functions_ = prefixes_ = indexes_ = 0;
    fresh_ = false;
    if (text.size() > std::numeric_limits<std::int32_t>::max())
        return fail("the text is too long");
    open_.push_back({.bracket = &wholeText, .token = {}, .operands = 0, .row = 0, .outer = 0});
    State state = State::Operand;
    while (state <= State::Operator)
        state = state == State::Operand ? readOperand() : readOperator();
    return state;
}

QuillParser::State QuillParser::fail(std::string_view reason, std::size_t position) {
    failure_ = {position, reason};
    return State::Failed;
}

std::string_view QuillParser::keywordHere() const {
    for (const std::string& keyword : keywords_)
        if (lexer_.rest().starts_with(keyword))
            return keyword;
    return {};
}

// An operand must follow.

QuillParser::State QuillParser::readOperand() {
    lexer_.skipBlanks();
    const bool fresh = std::exchange(fresh_, false);
    const char c = lexer_.peek();
    if (QuillLexer::startsName(c))
        return readName();
    if (lexer_.startsNumber())
        return push(lexer_.number(), Tail::Value);
    switch (c) {
    case '(':
        if (const std::string_view keyword = keywordHere(); !keyword.empty())
            return push(lexer_.token(QuillToken::Identifier, keyword.size()), Tail::Chain);
        return open(parentheses);
    case '!':
    case '~':
        return lexer_.peek(1) == '=' ? missingOperand() : readPrefix(QuillToken::NotSign, QuillRule::Not);
    case '-':
        return readPrefix(QuillToken::MinusSign, QuillRule::UnaryMinus);
    case '+':
        return readPrefix(QuillToken::PlusSign, QuillRule::Plus);
    case '\'':
    case '"':
        return readQuotedText();
    case '[':
        return open(matrixBrackets);
    case '{':
        return open(cellBraces);
    case '@':
        return readFunction();
    case ')':
    case ']':
    case '}':
        return fresh ? close() : missingOperand();
    case ';':
        return fresh ? nextRow() : missingOperand();
    default:
        return missingOperand();
    }
}

QuillParser::State QuillParser::readName() {
    const QuillNode name = lexer_.name();
    if (name.code == static_cast<std::int32_t>(QuillToken::Identifier))
        return push(name, Tail::Chain);
    if (indexes_ == 0)
        return fail("end is only allowed among the arguments of an index", name.start);
    return push(name, Tail::Value);
}

QuillParser::State QuillParser::readQuotedText() {
    const QuillNode text = lexer_.quotedText();
    return text.length == 0 ? fail("the quotes are not closed") : push(text, Tail::Text);
}

QuillParser::State QuillParser::readPrefix(QuillToken code, QuillRule rule) {
    if (++prefixes_ > nesting_)
        return fail("too many prefix operators follow each other");
    const QuillNode token = lexer_.token(code, 1);
    // The right operand of a power takes its prefix operators before the power takes it.
    const QuillBuilder::Waiting* const before = builder_.lastWaiting();
    const bool inPower = before != nullptr && before->level == QuillLevel::Power;
    if (rule != QuillRule::Plus)
        builder_.wait({QuillForm::Prefix, inPower ? QuillLevel::Power : QuillLevel::Prefix, rule, token});
    return State::Operand;
}

QuillParser::State QuillParser::readFunction() {
    const std::size_t start = lexer_.position();
    lexer_.skip(1);
    lexer_.skipBlanks();
    if (lexer_.peek() == '(')
        return readParameters(start);
    if (!QuillLexer::startsName(lexer_.peek()))
        return fail("a function name or parameters in parentheses are missing after @");
    const QuillNode name = lexer_.name();
    if (name.code != static_cast<std::int32_t>(QuillToken::Identifier))
        return fail("end is not a function name", name.start);
    builder_.push(name);
    builder_.gather(builder_.operandCount() - 1, QuillRule::FunctionHandle, start);
    prefixes_ = 0;
    tail_ = Tail::Value;
    return State::Operator;
}

QuillParser::State QuillParser::readParameters(std::size_t start) {
    if (depth() >= nesting_)
        return fail("brackets and functions are nested too deeply", start);
    const std::size_t listStart = lexer_.position();
    const std::size_t first = builder_.operandCount();
    lexer_.skip(1);
    lexer_.skipBlanks();
    for (bool more = lexer_.peek() != ')'; more; lexer_.skipBlanks()) {
        if (!QuillLexer::startsName(lexer_.peek()))
            return fail("a parameter name is missing");
        const QuillNode name = lexer_.name();
        if (name.code != static_cast<std::int32_t>(QuillToken::Identifier))
            return fail("end is not a parameter name", name.start);
        builder_.push(name);
        lexer_.skipBlanks();
        more = lexer_.peek() == ',';
        if (!more && lexer_.peek() != ')')
            return fail("a , or ) is missing after the parameter");
        if (more)
            lexer_.skip(1);
    }
    lexer_.skip(1);
    builder_.gather(first, QuillRule::ParameterList, listStart);
    QuillNode token{};
    token.start = static_cast<std::uint32_t>(start);
    builder_.wait({QuillForm::Function, QuillLevel::Expression, QuillRule::AnonymousFunction, token});
    ++functions_;
    prefixes_ = 0;
    return State::Operand;
}

QuillParser::State QuillParser::open(const QuillBracket& bracket) {
    if (depth() >= nesting_)
        return fail("brackets and functions are nested too deeply");
    const std::size_t operands = builder_.operandCount();
    open_.push_back({.bracket = &bracket,
                     .token = lexer_.token(bracket.open, 1),
                     .operands = operands,
                     .row = operands,
                     .outer = builder_.beginGroup()});
    indexes_ += bracket.isIndex ? 1 : 0;
    prefixes_ = 0;
    fresh_ = bracket.commas;
    return State::Operand;
}

QuillParser::State QuillParser::missingOperand() {
    const auto byte = static_cast<unsigned char>(lexer_.peek());
    if (byte == ';' && !open_.back().bracket->semicolons)
        return extraSemicolon();
    if (byte >= 0x80)
        return fail("characters outside ASCII are only allowed in quotes and comments");
    return fail(lexer_.atEnd() ? "the text ends where a value must follow" : "a value is missing");
}

// An operand is complete.

QuillParser::State QuillParser::readOperator() {
    const bool blank = lexer_.skipBlanks();
    if (lexer_.atEnd())
        return finish();
    if (blank && open_.back().bracket->blanksSeparate && startsElement()) {
        reduceTo(QuillLevel::Expression);
        return State::Operand;
    }
    const char c = lexer_.peek();
    switch (c) {
    case '(':
        if (tail_ != Tail::Chain || (blank && !keywordHere().empty()))
            return missingOperator();
        return open(callParentheses);
    case '{':
        return tail_ == Tail::Chain ? open(indexBraces) : missingOperator();
    case ')':
    case ']':
    case '}':
        return close();
    case ',':
        return nextElement();
    case ';':
        return nextRow();
    case ':':
        return readColon();
    case '\'':
        if (blank || tail_ == Tail::Text)
            return missingOperator();
        break;
    default:
        break;
    }
    const QuillOperator* const found = lexer_.operatorHere();
    if (found == nullptr)
        return c == '.' ? readField() : missingOperator();
    return found->rule == QuillRule::Transpose || found->rule == QuillRule::DotTranspose ? readPostfix(*found)
                                                                                         : readInfix(*found);
}

/// Whether the token here, after white space, begins an element of its own.  An operator does so only as a prefix
/// operator: directly before its operand.
bool QuillParser::startsElement() const {
    const char c = lexer_.peek();
    switch (c) {
    case '+':
    case '-':
        return lexer_.rest().size() > 1 && !lexer_.isBlank(1);
    case '~':
    case '!':
        return lexer_.peek(1) != '=';
    case '(':
    case '[':
    case '{':
    case '@':
    case '\'':
    case '"':
        return true;
    default:
        return QuillLexer::startsName(c) || lexer_.startsNumber();
    }
}

QuillParser::State QuillParser::readInfix(const QuillOperator& infix) {
    reduceTo(infix.level);
    builder_.wait({QuillForm::Infix, infix.level, infix.rule, lexer_.token(infix.token, infix.spelling.size())});
    return State::Operand;
}

/// a:b:c is one range with a step, and further colons begin a range that this one is the first bound of.
QuillParser::State QuillParser::readColon() {
    reduceTo(QuillLevel::Sum);
    lexer_.skip(1);
    QuillBuilder::Waiting* const before = builder_.lastWaiting();
    if (before != nullptr && before->form == QuillForm::Range) {
        before->form = QuillForm::SteppedRange;
        before->rule = QuillRule::SteppedRange;
        return State::Operand;
    }
    reduceTo(QuillLevel::Range);
    builder_.wait({QuillForm::Range, QuillLevel::Range, QuillRule::Range, {}});
    return State::Operand;
}

QuillParser::State QuillParser::readPostfix(const QuillOperator& postfix) {
    reduceTo(postfix.level);
    const QuillNode token = lexer_.token(postfix.token, postfix.spelling.size());
    wrap(postfix.rule, std::array{builder_.lastOperand(), token});
    tail_ = Tail::Value;
    return State::Operator;
}

QuillParser::State QuillParser::readField() {
    if (tail_ != Tail::Chain || lexer_.startsNumber())
        return missingOperator();
    lexer_.skip(1);
    lexer_.skipBlanks();
    if (!QuillLexer::startsName(lexer_.peek()))
        return fail("a field name is missing");
    const QuillNode field = lexer_.name();
    if (field.code != static_cast<std::int32_t>(QuillToken::Identifier))
        return fail("end is not a field name", field.start);
    wrap(QuillRule::Field, std::array{builder_.lastOperand(), field});
    return State::Operator;
}

QuillParser::State QuillParser::nextElement() {
    if (!open_.back().bracket->commas)
        return fail("a comma is only allowed between arguments and between elements");
    reduceTo(QuillLevel::Expression);
    lexer_.skip(1);
    return State::Operand;
}

QuillParser::State QuillParser::nextRow() {
    if (!open_.back().bracket->semicolons)
        return extraSemicolon();
    reduceTo(QuillLevel::Expression);
    endRow();
    lexer_.skip(1);
    fresh_ = true;
    return State::Operand;
}

QuillParser::State QuillParser::extraSemicolon() {
    return fail("this ; is extra: it is only allowed between the rows of a matrix or of a cell array");
}

QuillParser::State QuillParser::close() {
    const QuillBracket& bracket = *open_.back().bracket;
    if (lexer_.peek() != bracket.closing)
        return fail(bracket.missing);
    reduceTo(QuillLevel::Expression);
    if (bracket.semicolons)
        endRow();
    const Open opened = open_.back();
    const std::size_t here = lexer_.position();
    const QuillNode closing = lexer_.token(bracket.close, 1);
    open_.pop_back();
    builder_.endGroup(opened.outer);
    if (&bracket == &parentheses) {
        builder_.replace(1, opened.token.start, QuillRule::Parentheses,
                         std::array{opened.token, builder_.lastOperand(), closing});
    } else if (bracket.semicolons) {
        builder_.gather(opened.operands, bracket.rule, opened.token.start);
    } else {
        --indexes_;
        const bool empty = builder_.operandCount() == opened.operands;
        builder_.gather(opened.operands, QuillRule::ArgumentList,
                        empty ? here : builder_.operand(opened.operands).start);
        const QuillNode callee = builder_.operand(opened.operands - 1);
        builder_.replace(2, callee.start, bracket.rule,
                         std::array{callee, opened.token, builder_.lastOperand(), closing});
    }
    tail_ = Tail::Chain;
    return State::Operator;
}

QuillParser::State QuillParser::finish() {
    if (open_.size() > 1)
        return fail(open_.back().bracket->missing);
    reduceTo(QuillLevel::Expression);
    return State::Done;
}

QuillParser::State QuillParser::missingOperator() {
    const char c = lexer_.peek();
    if (c == '=')
        return fail("a single = is not an operator: write == to compare");
    if (static_cast<unsigned char>(c) >= 0x80)
        return fail("characters outside ASCII are only allowed in quotes and comments");
    return fail("an operator is missing");
}

QuillParser::State QuillParser::push(const QuillNode& operand, Tail tail) {
    builder_.push(operand);
    tail_ = tail;
    prefixes_ = 0;
    return State::Operator;
}

void QuillParser::endRow() {
    const std::size_t first = open_.back().row;
    const bool empty = first == builder_.operandCount();
    builder_.gather(first, QuillRule::Row, empty ? lexer_.position() : builder_.operand(first).start);
    open_.back().row = builder_.operandCount();
}

} // namespace VT::Embedded

template <>
std::unique_ptr<PARSER_T<char>> PARSER_T<char>::create(std::size_t nesting, std::span<const std::string> keywords) {
    return std::make_unique<VT::Embedded::QuillParser>(nesting, keywords);
}
