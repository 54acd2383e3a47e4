// Dimension expressions in Quill text become nodes.
#pragma once

#include "base/transform/XForm.hpp"
#include "host/QuillParser.hpp"
#include "host/SymbolValidator.hpp"
#include "parser/ErrorChecker.hpp"

#include <array>
#include <cstddef>
#include <cstdint>
#include <iosfwd>
#include <memory>
#include <span>
#include <string>
#include <string_view>
#include <typeinfo>
#include <utility>
#include <vector>

namespace VT {

/// Turns Quill text such as `N*2+1`, `[N, 3]` or `rem(N, 4)` into one interned expression in C shape, by way of the
/// parse tree of the host's parser.
///
/// Accepts names, numbers, the operators + - * / && || ~ and the comparisons, fields, lists of one row, and calls of
/// idivide, rem, bitand, bitor, bitxor, bitcmp and bitshift with their number of arguments.  Every literal is a real
/// number, and a minus directly before 2147483648 belongs to it.  Names are given to the symbol validator.
///
/// Anything else yields the invalid identifier and one report, which goes through a report operation to the error
/// checker.  Nothing is thrown for bad text.  Exceptions of the host's parser, the validator, the checker and
/// std::bad_alloc pass; the converter stays usable, and nodes of the text may stay interned.
///
/// Linear in the length of the text; neither depth nor breadth of the tree costs stack.  A converter and its table are
/// used by one thread at a time.
///
/// The order of the virtual functions is fixed: hosts call them by slot.  Every one of them may be overridden.  The
/// visits return an identifier, the invalid one after a report, or `deferred`.
class VTSYM_API SymbolicExprFromQParseTree {
public:
    using ParseTree = _Q_parse_tree_T<char>;

    /// Returned by a visit of a node whose children are to be converted first.  Not the identifier of any node.
    static constexpr SymbolicExprId deferred = invalidId - 1;

    /// All of them outlive the converter.  Without a validator every name is a symbol.
    SymbolicExprFromQParseTree(SymbolicExprTable& table, VTSymbolicExprErrorChecker& checker,
                               SymbolValidator* validator = nullptr);
    SymbolicExprFromQParseTree(const SymbolicExprFromQParseTree&) = delete;
    SymbolicExprFromQParseTree& operator=(const SymbolicExprFromQParseTree&) = delete;

    /// The expression of a text, or the invalid identifier.
    SymbolicExprId operator()(const char* text);
    SymbolicExprId operator()(const std::string& text);
    /// The same for UTF-16.  A list that is the whole text is always read as a list of dimensions.  Positions in
    /// reports are those in the text as UTF-8.  A surrogate without its partner is reported as "NonASCIIText".
    SymbolicExprId operator()(const std::u16string& text);

    /// The expression of a node of a tree of the text.
    SymbolicExprId visitNode(const ParseTree& node, const char* text);

    /// The expression below a root, be it a root in roots; any other node itself.
    static const ParseTree& skipExprGoal(const ParseTree& node);

    [[nodiscard]] bool skipDiagnostics() const noexcept { return checker_.skipDiagnostics(); }

    // Slots 1 to 6.

    /// Whether a number that is not a 32-bit integer is refused.  False.
    [[nodiscard]] virtual bool supportIntegerOnly() const;
    /// Whether an integral number of 32 bits becomes an integer literal.  False: every number is a real literal.
    [[nodiscard]] virtual bool shouldCreateIntValueNodeForIntegerValue() const;
    /// Whether a truth value may be used as a number.  True.
    [[nodiscard]] virtual bool supportLogicalValues() const;
    /// Whether a rule may be converted; asked before each.  True.  An override that refuses a rule must report it, for
    /// instance with reportDivisionExpr().
    virtual bool supportOperator(const ParseTree& node, const char* text);
    virtual ~SymbolicExprFromQParseTree();
    /// Lets the checker collect reports.
    virtual void enableDiagnostics();

    // Slots 7 to 14: reports about numbers and names, forwarded to the checker's operations of the same names.

    virtual void reportInvalidLiteralValue(const std::string& literal, const char* text, std::size_t position);
    virtual void reportNonScalarValue(const std::string& name, const char* text, std::size_t position);
    virtual void reportComplexValue(const std::string& name, const char* text, std::size_t position);
    virtual void reportLogicalValue(const std::string& name, const char* text, std::size_t position);
    virtual void reportNonIntegerLiteralValue(const std::string& literal, const char* text, std::size_t position);
    virtual void reportNonIntegerValue(const std::string& name, const char* text, std::size_t position);
    virtual void reportUnsupportedValue(const std::string& name, const char* text, std::size_t position);
    virtual void reportDiagnostic(const HostDiagnostic& diagnostic);

    // Slots 15 to 20.

    /// An identifier or a number; any other token is reported.
    virtual SymbolicExprId visitTerminal(const ParseTree& node, const char* text);
    /// The identifier of the name of a called function; the invalid one, and no report, where the callee is not an
    /// identifier.
    virtual SymbolicExprId getFunctionNameSymId(const ParseTree& node, const char* text);
    /// Resolves a name: to itself or to its value.  A meaning that no dimension can have is reported.
    virtual SymbolicExprId resolveIdentifier(const std::string& name, const char* text, std::size_t position);
    /// Whether a function may be called with `numArgs` arguments; reports where it may not.
    virtual bool supportFcn(SymbolicExprId functionNameId, std::size_t numArgs, const ParseTree& node,
                            const char* text);
    /// A scalar becomes a literal, a row a list of dimensions; any other value of a name is reported.
    virtual SymbolicExprId getNumberFromQxArray(const QxArray& array, const std::string& name, const char* text,
                                                std::size_t position);
    /// Converts a rule; a rule that this class does not support is reported.
    virtual SymbolicExprId visitNonTerminal(const ParseTree& node, const char* text);

    // Slots 21 to 25: further reports.

    virtual void reportUnhandledExpr(const ParseTree& node, const char* text);
    virtual void reportDivisionExpr(const ParseTree& node, const char* text);
    virtual void reportUnsupportedFcn(SymbolicExprId functionNameId, const ParseTree& node, const char* text);
    virtual void reportInvalidNumArgs(SymbolicExprId functionNameId, std::size_t expected, std::size_t actual,
                                      const ParseTree& node, const char* text);
    virtual void reportInvalidExpr(const char* text);

    // Slots 26 and 27.

    /// A bracketed list: one row of two, three or any other number of dimensions.  More rows than one, and a list in
    /// the list, are reported.
    virtual SymbolicExprId visitMatrixNode(const ParseTree& node, const char* text);
    /// A field of an owner.  The validator is asked for the owner's name only.
    virtual SymbolicExprId visitMDot(const ParseTree& node, const char* text);

    // Slots 28 and 29, for hosts that end a converter by slot.

    /// Destroys the converter and leaves its memory.
    virtual void destroy() noexcept;
    /// Destroys the converter, which new has made, and frees its memory.
    virtual void destroyAndFree() noexcept;

protected:
    /// Makes the expression of a node from those of its operands, in their order.
    using Build = SymbolicExprId (*)(SymbolicExprFromQParseTree& self, const ParseTree& node,
                                     std::span<const SymbolicExprId> operands, const char* text);

    /// Children that are operands: one in front, where there is one, then `count` of a sequence, `step` apart.
    struct Operands {
        const ParseTree* front = nullptr;
        const ParseTree* first = nullptr;
        std::uint32_t count = 0;
        std::uint32_t step = 1;
    };

    /// The operands of a rule among its children, and the function that builds its node.
    struct Rule {
        QuillRule code;
        std::uint8_t first; ///< the first operand's place among the children
        std::uint8_t count; ///< operands, or allChildren
        std::uint8_t step;
        Build build;
    };

    static constexpr std::uint8_t allChildren = 255;

    /// Rules by their codes.
    class RuleTable {
    public:
        constexpr explicit RuleTable(std::span<const Rule> rules) : rules_(rules) {
            for (std::size_t i = 0; i < rules.size(); ++i)
                places_.at(static_cast<std::size_t>(rules[i].code)) = static_cast<std::uint8_t>(i + 1);
        }

        /// nullptr for a code without a rule.
        [[nodiscard]] constexpr const Rule* find(std::int32_t code) const {
            const auto at = static_cast<std::size_t>(static_cast<std::uint32_t>(code));
            return at < places_.size() && places_[at] != 0 ? &rules_[places_[at] - 1U] : nullptr;
        }

    private:
        std::span<const Rule> rules_;
        std::array<std::uint8_t, 320> places_{};
    };

    /// For visits: the operands are converted next, from left to right, and then `build` is called, unless one of them
    /// is refused.  `head` is an operand before them that has been converted already.
    SymbolicExprId afterOperands(const ParseTree& node, const Operands& operands, Build build,
                                 SymbolicExprId head = invalidId);
    /// The same by a rule.  A node without the children that the rule asks for is reported.
    SymbolicExprId afterOperands(const ParseTree& node, const Rule& rule, const char* text);
    /// Converts a call.
    ///
    /// @param furtherCallees  whether other callees than names are accepted.  A name in parentheses is never one.
    SymbolicExprId visitCallNode(const ParseTree& node, const char* text, bool furtherCallees);

    /// Calls `build` with its operands as arguments, for the table of rules.
    template <class Node>
    static SymbolicExprId buildUnary(SymbolicExprFromQParseTree& self, const ParseTree&,
                                     std::span<const SymbolicExprId> operands, const char*) {
        return self.factory_.make<Node>(operands[0]);
    }

    template <class Node>
    static SymbolicExprId buildBinary(SymbolicExprFromQParseTree& self, const ParseTree&,
                                      std::span<const SymbolicExprId> operands, const char*) {
        return self.factory_.make<Node>(operands[0], operands[1]);
    }

    template <class Node>
    static SymbolicExprId buildMulti(SymbolicExprFromQParseTree& self, const ParseTree&,
                                     std::span<const SymbolicExprId> operands, const char*) {
        return self.factory_.make<Node>(std::vector<SymbolicExprId>(operands.begin(), operands.end()));
    }

    /// Reports a node and returns the invalid identifier.
    SymbolicExprId refuse(const ParseTree& node, const char* text);

    /// How a text is converted.
    struct Request {
        bool variantKeywords = false; ///< (sim) and (codegen) are names
        bool listAtTop = false;       ///< a list that is the whole text is one of dimensions
        bool ordinary = false;        ///< where nothing is overridden, the quick reader reads what it can
        std::ostream* dump = nullptr; ///< receives the parse tree
        /// The library's own class.  One derived from it may return nodes of its own.
        const std::type_info* ownClass = &typeid(SymbolicExprFromQParseTree);
    };

    /// `text` is followed by NUL.
    SymbolicExprId convert(std::string_view text, const Request& request);
    SymbolicExprId convert(const std::u16string& text, std::string& converted, Request request);

    [[nodiscard]] SymbolicExprTable& table() const noexcept { return table_; }

    [[nodiscard]] SymbolicExprFactory& factory() noexcept { return factory_; }

    [[nodiscard]] const VTSymbolicExprErrorChecker& checker() const noexcept { return checker_; }

    /// The validator; nullptr for the default one.
    [[nodiscard]] SymbolValidator* validator() const noexcept { return validator_; }

    /// The reports that the checker had before the latest text.
    [[nodiscard]] std::size_t earlierReports() const noexcept { return earlierReports_; }

    /// The position of the latest report, whether or not the checker kept it.
    [[nodiscard]] std::size_t reportedPosition() const noexcept { return reportedPosition_; }

    /// Why the host's parser had no tree for the latest text.
    [[nodiscard]] const QuillFailure& failure() const noexcept { return failure_; }

private:
    using Parser = PARSER_T<char>;

    /// A node that waits for its operands.
    struct Frame {
        const ParseTree* node;
        Build build;
        Operands open;         ///< those that are not converted yet
        std::size_t converted; ///< where those that are begin on their stack
    };

    class TextInWork;
    class Unwind;

    static SymbolicExprId buildDimensions(SymbolicExprFromQParseTree& self, const ParseTree& node,
                                          std::span<const SymbolicExprId> operands, const char* text);
    static SymbolicExprId buildMember(SymbolicExprFromQParseTree& self, const ParseTree& node,
                                      std::span<const SymbolicExprId> operands, const char* text);
    static const RuleTable& rules();

    static std::string textOf(const ParseTree& token) { return {token.text, token.length}; }

    Parser& parserFor(bool variantKeywords);
    SymbolicExprId enter(const ParseTree& node, const char* text);
    SymbolicExprId finish(SymbolicExprId id, std::size_t frames, const char* text);
    /// Converts a call, whose callee comes before its arguments among the operands.
    SymbolicExprId afterArguments(const ParseTree& node, SymbolicExprId name);
    SymbolicExprId dimensions(std::span<const SymbolicExprId> ids);

    SymbolicExprId getNumberFromString(const std::string& literal, const char* text, std::size_t position);
    SymbolicExprId getNumberFromValue(double value, const std::string& literal, const char* text, std::size_t position,
                                      bool isLiteral);

    SymbolicExprTable& table_;
    VTSymbolicExprErrorChecker& checker_;
    SymbolValidator* validator_;
    SymbolicExprFactory factory_;
    std::array<std::unique_ptr<Parser>, 2> parsers_; ///< without and with the variant keywords, made when needed
    std::vector<std::pair<SymbolicExprId, std::size_t>> functions_; ///< the supported ones with their arguments
    std::vector<Frame> frames_;
    std::vector<SymbolicExprId> operands_;
    std::uint64_t convertible_ = 0; ///< calls met so far that C has operators for
    std::size_t earlierReports_ = 0;
    std::size_t reportedPosition_ = 0;
    QuillFailure failure_;
};

} // namespace VT
