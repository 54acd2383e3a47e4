// Converts parse trees of dimension expressions to nodes.
//
// Method: one walk over the tree with two stacks: nodes that wait for operands, and the operands.  A table maps the
// code of a rule to its operands among the children and to a function that builds the node.  Every step goes through a
// virtual visit, so that a host may override it; a visit returns `deferred` where the walk has to convert operands
// first.  Calls that C has operators for are converted at the end (QuillConversion).  Where nothing is overridden, the
// quick reader reads ordinary texts without a tree.
// Cost: linear in the text.
#include "parser/QuillConverter.hpp"

#include "base/core/Check.hpp"
#include "base/core/Limits.hpp"
#include "base/transform/QuillConversion.hpp"
#include "base/variants/VariantKeywords.hpp"
#include "host/Text.hpp"
#include "parser/ParseTreeDump.hpp"
#include "parser/QuickReader.hpp"
#include "parser/QuillNumber.hpp"

#include <algorithm>
#include <limits>
#include <typeinfo>

namespace VT {

namespace {

using ParseTree = SymbolicExprFromQParseTree::ParseTree;

bool isTerminal(const ParseTree& node, QuillToken code) {
    return node.kind == ParseTree::terminal && node.code == static_cast<std::int32_t>(code);
}

bool isRule(const ParseTree& node, QuillRule code) {
    return node.kind == ParseTree::nonTerminal && node.code == static_cast<std::int32_t>(code);
}

std::size_t countOf(const ParseTree& node) {
    return node.kind == ParseTree::nonTerminal ? static_cast<std::size_t>(std::max(node.childCount, 0)) : 0;
}

constexpr double int32Minimum = std::numeric_limits<std::int32_t>::min();

/// Whether a node is a minus directly before the literal 2147483648.  They are one literal: the number alone is not an
/// integer of 32 bits.
bool isMinusLeast(const ParseTree& node) {
    if (!isRule(node, QuillRule::UnaryMinus) && !isRule(node, QuillRule::UnaryMinus2))
        return false;
    if (countOf(node) < 2)
        return false;
    constexpr std::size_t digitsOfMinimum = 10; // in decimal and, with 0x, in hexadecimal
    const ParseTree& operand = SymbolicExprFromQParseTree::skipExprGoal(node.children[1]);
    return isTerminal(operand, QuillToken::Number) && operand.length >= digitsOfMinimum &&
           quillNumber({operand.text, operand.length}).value == -int32Minimum;
}

/// Whether a callee is more than a plain name, in parentheses or not.
bool isFurtherCallee(const ParseTree& callee) {
    const ParseTree* inner = &SymbolicExprFromQParseTree::skipExprGoal(callee);
    while ((isRule(*inner, QuillRule::Parentheses) || isRule(*inner, QuillRule::Parentheses2)) && countOf(*inner) > 1)
        inner = &SymbolicExprFromQParseTree::skipExprGoal(inner->children[1]);
    return !isTerminal(*inner, QuillToken::Identifier);
}

/// Whether the host's parsers read ordinary texts like the quick reader.  A process has one host, so that one look at a
/// parser's class will do.
bool isOrdinary(const PARSER_T<char>& parser) {
    static const bool answer = dynamic_cast<const ReadsOrdinaryQuill*>(&parser) != nullptr;
    return answer;
}

/// Whether a name is that of a function which C has an operator for.
bool isQuillCall(const SymbolicExpr* name) {
    return name != nullptr && name->op() == SymbolicOp::String && std::ranges::any_of(quillCalls, [&](SymbolicOp op) {
               return operatorInfo(op).quillCall == static_cast<const SymbolicString*>(name)->getName();
           });
}

} // namespace

/// Shows the checker the whole text while it is converted.
class SymbolicExprFromQParseTree::TextInWork {
public:
    TextInWork(SymbolicExprFromQParseTree& self, std::string_view text)
        : checker_(self.checker_),
          outer_(self.checker_.text_) {
        checker_.startText();
        checker_.text_ = text;
        self.earlierReports_ = checker_.diagnostics().size();
        self.reportedPosition_ = 0;
        self.failure_ = {};
    }

    TextInWork(const TextInWork&) = delete;
    TextInWork& operator=(const TextInWork&) = delete;

    ~TextInWork() { checker_.text_ = outer_; }

private:
    VTSymbolicExprErrorChecker& checker_;
    std::string_view outer_;
};

/// Restores the stacks, however the conversion ends, and frees the memory of a huge one.
class SymbolicExprFromQParseTree::Unwind {
public:
    explicit Unwind(SymbolicExprFromQParseTree& self)
        : self_(self),
          frames_(self.frames_.size()),
          operands_(self.operands_.size()) {}

    Unwind(const Unwind&) = delete;
    Unwind& operator=(const Unwind&) = delete;

    ~Unwind() {
        cut(self_.frames_, frames_);
        cut(self_.operands_, operands_);
    }

    [[nodiscard]] std::size_t frames() const { return frames_; }

private:
    template <class Element>
    static void cut(std::vector<Element>& stack, std::size_t size) noexcept {
        constexpr std::size_t kept = 4096;
        stack.erase(stack.begin() + static_cast<std::ptrdiff_t>(size), stack.end());
        if (size == 0 && stack.capacity() > kept)
            std::vector<Element>().swap(stack);
    }

    SymbolicExprFromQParseTree& self_;
    std::size_t frames_;
    std::size_t operands_;
};

SymbolicExprFromQParseTree::SymbolicExprFromQParseTree(SymbolicExprTable& table, VTSymbolicExprErrorChecker& checker,
                                                       SymbolValidator* validator)
    : table_(table),
      checker_(checker),
      validator_(validator),
      factory_(table) {}

SymbolicExprFromQParseTree::~SymbolicExprFromQParseTree() = default;

void SymbolicExprFromQParseTree::destroy() noexcept {
    this->~SymbolicExprFromQParseTree();
}

void SymbolicExprFromQParseTree::destroyAndFree() noexcept {
    delete this;
}

// Whole texts.

SymbolicExprId SymbolicExprFromQParseTree::operator()(const char* text) {
    return convert(std::string_view(text), {});
}

SymbolicExprId SymbolicExprFromQParseTree::operator()(const std::string& text) {
    return convert(std::string_view(text), {});
}

SymbolicExprId SymbolicExprFromQParseTree::operator()(const std::u16string& text) {
    std::string converted;
    return convert(text, converted, {});
}

SymbolicExprId SymbolicExprFromQParseTree::convert(const std::u16string& text, std::string& converted,
                                                   Request request) {
    converted = cvt_ustring_string(text);
    const auto isHigh = [](char16_t unit) { return (unit & 0xfc00U) == 0xd800U; };
    const auto isLow = [](char16_t unit) { return (unit & 0xfc00U) == 0xdc00U; };
    for (std::size_t at = 0; at < text.size(); ++at) {
        if (isHigh(text[at]) && at + 1 < text.size() && isLow(text[at + 1])) {
            ++at;
        } else if (isHigh(text[at]) || isLow(text[at])) {
            const TextInWork inWork(*this, converted);
            const std::size_t position = cvt_ustring_string(std::u16string_view(text).substr(0, at)).size();
            reportDiagnostic(symbolicDimsDiagnostic("NonASCIIText", {converted}, position));
            return invalidId;
        }
    }
    request.listAtTop = true;
    return convert(std::string_view(converted), request);
}

SymbolicExprId SymbolicExprFromQParseTree::convert(std::string_view text, const Request& request) {
    const TextInWork inWork(*this, text);
    Parser& parser = parserFor(request.variantKeywords);
    const bool isOwn = typeid(*this) == *request.ownClass;
    if (request.ordinary && isOwn && validator_ == nullptr && request.dump == nullptr && isOrdinary(parser)) {
        VT::Parser::QuickReader read(table_, {false, request.variantKeywords},
                                     VT::Parser::QuickReader::Language::Quill);
        if (const SymbolicExprId id = read.read(text); id != invalidId)
            return id;
    }
    const auto free = [&parser](const ParseTree* tree) { parser.delete_parse_tree(tree); };
    const std::unique_ptr<const ParseTree, decltype(free)> tree(parser.generate_parse_tree(text.data(), text.size()),
                                                                free);
    if (request.dump != nullptr)
        dumpParseTree(*request.dump, text, tree.get());
    if (tree == nullptr) {
        failure_ = parser.failure();
        reportInvalidExpr(text.data());
        return invalidId;
    }

    const std::uint64_t before = convertible_;
    SymbolicExprId id = invalidId;
    const ParseTree& top = skipExprGoal(*tree);
    if (request.listAtTop && isRule(top, QuillRule::Matrix)) {
        const Unwind unwind(*this);
        id = finish(visitMatrixNode(top, text.data()), unwind.frames(), text.data());
    } else {
        id = visitNode(*tree, text.data());
    }
    // Only calls of those functions differ in C.  Those that an override made are not counted.
    const bool mayHoldCalls = convertible_ != before || !isOwn;
    return id != invalidId && mayHoldCalls ? SymbolicExprQ2C(table_)(id) : id;
}

SymbolicExprFromQParseTree::Parser& SymbolicExprFromQParseTree::parserFor(bool variantKeywords) {
    std::unique_ptr<Parser>& parser = parsers_[variantKeywords ? 1 : 0];
    if (parser == nullptr) {
        std::vector<std::string> keywords;
        if (variantKeywords)
            keywords = {VariantKeywords::getSimVariantKeyword(), VariantKeywords::getCodegenVariantKeyword()};
        parser = Parser::create(limits::nesting, keywords);
    }
    return *parser;
}

// The walk.

SymbolicExprId SymbolicExprFromQParseTree::visitNode(const ParseTree& node, const char* text) {
    const Unwind unwind(*this);
    return finish(enter(node, text), unwind.frames(), text);
}

const ParseTree& SymbolicExprFromQParseTree::skipExprGoal(const ParseTree& node) {
    const ParseTree* goal = &node;
    while (isRule(*goal, QuillRule::Root) && countOf(*goal) > 0)
        goal = goal->children;
    return *goal;
}

SymbolicExprId SymbolicExprFromQParseTree::enter(const ParseTree& node, const char* text) {
    const ParseTree& goal = skipExprGoal(node);
    if (goal.kind == ParseTree::terminal)
        return visitTerminal(goal, text);
    return supportOperator(goal, text) ? visitNonTerminal(goal, text) : invalidId;
}

/// Completes the nodes above the first `frames` ones; `id` is the result of the topmost visit.
SymbolicExprId SymbolicExprFromQParseTree::finish(SymbolicExprId id, std::size_t frames, const char* text) {
    while (id != invalidId) {
        if (id != deferred) {
            if (frames_.size() == frames)
                return id;
            operands_.push_back(id);
        }
        VTSYM_CHECK(frames_.size() > frames);
        Operands& open = frames_.back().open;
        if (open.front != nullptr) {
            id = enter(*std::exchange(open.front, nullptr), text);
        } else if (open.count > 0) {
            const ParseTree* const operand = open.first;
            if (--open.count > 0)
                open.first += open.step;
            id = enter(*operand, text);
        } else {
            const Frame done = frames_.back();
            frames_.pop_back();
            id = done.build(*this, *done.node, std::span(operands_).subspan(done.converted), text);
            operands_.resize(done.converted);
        }
    }
    return invalidId;
}

SymbolicExprId SymbolicExprFromQParseTree::afterOperands(const ParseTree& node, const Operands& operands, Build build,
                                                         SymbolicExprId head) {
    frames_.push_back({&node, build, operands, operands_.size()});
    if (head != invalidId)
        operands_.push_back(head);
    return deferred;
}

SymbolicExprId SymbolicExprFromQParseTree::afterOperands(const ParseTree& node, const Rule& rule, const char* text) {
    if (isMinusLeast(node))
        return getNumberFromValue(int32Minimum, '-' + textOf(skipExprGoal(node.children[1])), text,
                                  checker_.getNodeStartIdx(node), true);
    const std::size_t children = countOf(node);
    if (rule.count == allChildren)
        return afterOperands(node, {nullptr, node.children, static_cast<std::uint32_t>(children), 1}, rule.build);
    if (rule.first + (rule.count - 1U) * rule.step >= children)
        return refuse(node, text);
    return afterOperands(node, {nullptr, node.children + rule.first, rule.count, rule.step}, rule.build);
}

SymbolicExprId SymbolicExprFromQParseTree::refuse(const ParseTree& node, const char* text) {
    reportUnhandledExpr(node, text);
    return invalidId;
}

// Rules.

const SymbolicExprFromQParseTree::RuleTable& SymbolicExprFromQParseTree::rules() {
    static constexpr Build itself = [](SymbolicExprFromQParseTree&, const ParseTree&,
                                       std::span<const SymbolicExprId> operands, const char*) { return operands[0]; };
    static constexpr Rule rows[] = {
        {QuillRule::Parentheses, 1, 1, 1, itself},
        {QuillRule::Parentheses2, 1, 1, 1, itself},
        {QuillRule::UnaryMinus, 1, 1, 1, buildUnary<SymbolicUnaryMinusExpr>},
        {QuillRule::Not, 1, 1, 1, buildUnary<SymbolicNotExpr>},
        {QuillRule::Plus, 0, 2, 2, buildBinary<SymbolicPlusExpr>},
        {QuillRule::Minus, 0, 2, 2, buildBinary<SymbolicMinusExpr>},
        {QuillRule::Multiply, 0, 2, 2, buildBinary<SymbolicMultiplyExpr>},
        {QuillRule::Divide, 0, 2, 2, buildBinary<SymbolicDivideExpr>},
        {QuillRule::LessThan, 0, 2, 2, buildBinary<SymbolicLessThanExpr>},
        {QuillRule::LessThanEqual, 0, 2, 2, buildBinary<SymbolicLessThanEqualExpr>},
        {QuillRule::GreaterThan, 0, 2, 2, buildBinary<SymbolicGreaterThanExpr>},
        {QuillRule::GreaterThanEqual, 0, 2, 2, buildBinary<SymbolicGreaterThanEqualExpr>},
        {QuillRule::Equal, 0, 2, 2, buildBinary<SymbolicEqualExpr>},
        {QuillRule::NotEqual, 0, 2, 2, buildBinary<SymbolicNotEqualExpr>},
        {QuillRule::Or, 0, 2, 2, buildBinary<SymbolicOrExpr>},
        {QuillRule::And, 0, 2, 2, buildBinary<SymbolicAndExpr>},
    };
    static constexpr RuleTable table(rows);
    return table;
}

SymbolicExprId SymbolicExprFromQParseTree::visitNonTerminal(const ParseTree& node, const char* text) {
    if (const Rule* const rule = rules().find(node.code))
        return afterOperands(node, *rule, text);
    switch (static_cast<QuillRule>(node.code)) {
    case QuillRule::Matrix:
        return visitMatrixNode(node, text);
    case QuillRule::Field:
        return visitMDot(node, text);
    case QuillRule::Call:
        return visitCallNode(node, text, false);
    default:
        return refuse(node, text);
    }
}

// Lists and fields.

SymbolicExprId SymbolicExprFromQParseTree::visitMatrixNode(const ParseTree& node, const char* text) {
    if (countOf(node) > 1) {
        reportDiagnostic(
            symbolicDimsDiagnostic("NonVectorValue", {checker_.wholeText(text)}, checker_.getNodeStartIdx(node)));
        return invalidId;
    }
    if (countOf(node) == 0)
        return dimensions({});
    const ParseTree& row = node.children[0];
    if (row.kind == ParseTree::terminal)
        return refuse(row, text);
    return afterOperands(node, {nullptr, row.children, static_cast<std::uint32_t>(countOf(row)), 1}, buildDimensions);
}

SymbolicExprId SymbolicExprFromQParseTree::buildDimensions(SymbolicExprFromQParseTree& self, const ParseTree& node,
                                                           std::span<const SymbolicExprId> operands, const char* text) {
    for (std::size_t i = 0; i < operands.size(); ++i) {
        const SymbolicExpr* const element = self.table_.get(operands[i]);
        if (element != nullptr && dimensionOps.contains(element->op())) {
            const std::size_t position = self.checker_.getNodeStartIdx(node.children[0].children[i]);
            self.reportDiagnostic(symbolicDimsDiagnostic("NonVectorValue", {self.checker_.wholeText(text)}, position));
            return invalidId;
        }
    }
    return self.dimensions(operands);
}

SymbolicExprId SymbolicExprFromQParseTree::dimensions(std::span<const SymbolicExprId> ids) {
    switch (ids.size()) {
    case 2:
        return factory_.make<Symbolic2DExpr>(ids[0], ids[1]);
    case 3:
        return factory_.make<Symbolic3DExpr>(ids[0], ids[1], ids[2]);
    default:
        return factory_.make<SymbolicNDExpr>(std::vector<SymbolicExprId>(ids.begin(), ids.end()));
    }
}

SymbolicExprId SymbolicExprFromQParseTree::visitMDot(const ParseTree& node, const char* text) {
    if (countOf(node) < 2 || !isTerminal(node.children[1], QuillToken::Identifier))
        return refuse(node, text);
    return afterOperands(node, {nullptr, node.children, 1, 1}, buildMember);
}

SymbolicExprId SymbolicExprFromQParseTree::buildMember(SymbolicExprFromQParseTree& self, const ParseTree& node,
                                                       std::span<const SymbolicExprId> operands, const char*) {
    const SymbolicExprId owner = operands[0];
    const std::string field = textOf(node.children[1]);
    self.factory_.make<SymbolicString>(field);
    return self.factory_.make<SymbolicMemberValue>(owner, field);
}

// Calls.

SymbolicExprId SymbolicExprFromQParseTree::visitCallNode(const ParseTree& node, const char* text, bool furtherCallees) {
    if (countOf(node) < 3 || node.children[2].kind == ParseTree::terminal)
        return refuse(node, text);
    const SymbolicExprId name = getFunctionNameSymId(node.children[0], text);
    if (name == invalidId)
        return furtherCallees && isFurtherCallee(node.children[0]) ? afterArguments(node, invalidId)
                                                                   : refuse(node, text);
    if (!supportFcn(name, countOf(node.children[2]), node, text))
        return invalidId;
    return afterArguments(node, name);
}

SymbolicExprId SymbolicExprFromQParseTree::afterArguments(const ParseTree& node, SymbolicExprId name) {
    const ParseTree& list = node.children[2];
    convertible_ += name != invalidId && isQuillCall(table_.get(name)) ? 1U : 0U;
    return afterOperands(
        node,
        {name == invalidId ? node.children : nullptr, list.children, static_cast<std::uint32_t>(countOf(list)), 1},
        buildMulti<SymbolicFcnCallExpr>, name);
}

SymbolicExprId SymbolicExprFromQParseTree::getFunctionNameSymId(const ParseTree& node, const char*) {
    return isTerminal(node, QuillToken::Identifier) ? factory_.make<SymbolicString>(textOf(node)) : invalidId;
}

bool SymbolicExprFromQParseTree::supportFcn(SymbolicExprId functionNameId, std::size_t numArgs, const ParseTree& node,
                                            const char* text) {
    if (functions_.empty()) {
        decltype(functions_) functions;
        for (const SymbolicOp op : quillCalls)
            functions.emplace_back(factory_.make<SymbolicString>(std::string(operatorInfo(op).quillCall)),
                                   quillCallArguments(op));
        functions_ = std::move(functions);
    }
    const auto known = std::ranges::find(functions_, functionNameId, &decltype(functions_)::value_type::first);
    if (known == functions_.end())
        reportUnsupportedFcn(functionNameId, node, text);
    else if (known->second != numArgs)
        reportInvalidNumArgs(functionNameId, known->second, numArgs, node, text);
    else
        return true;
    return false;
}

} // namespace VT
