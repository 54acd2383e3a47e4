// Reads the texts of ordinary conditions at once to nodes.
#pragma once

#include "base/core/Table.hpp"
#include "parser/ConditionGrammar.hpp"

#include <boost/container/small_vector.hpp>

#include <cstdint>
#include <string_view>

namespace VT::Parser {

/// Reads operators, names, numbers, calls, members and parentheses.  Gives up at anything else: a text that is refused
/// here may be a condition, and the grammar of its language says so, or where it stops.
class QuickReader {
public:
    enum class Language : std::uint8_t { C, Quill };

    /// In Quill, of the options only the keywords have a meaning.
    QuickReader(SymbolicExprTable& table, const GrammarOptions& options, Language language = Language::C)
        : table_(table),
          options_(options),
          isQuill_(language == Language::Quill) {}

    /// Returns the identifier of what the condition grammar, or the converter of Quill conditions without a validator,
    /// reads, interned in the same order; the invalid identifier for a text that is left to it, of which nothing is
    /// interned.  `text` is followed by NUL.  Linear in the text; its stacks are explicit.  Throws std::bad_alloc.
    SymbolicExprId read(std::string_view text);

private:
    enum class Part : std::uint8_t { Name, Integer, Real, Operator, Call };

    /// A leaf, an operator or a call.  Parts are linked in the order in which they are interned: operands before their
    /// operators, in C right ones first.
    struct Item {
        std::uint32_t next;  ///< the part that is interned after this one
        std::uint32_t start; ///< of the text; number of the arguments of a call
        std::uint32_t size;  ///< of the text; the value of an integer
        Part part;
        std::uint8_t op;
    };

    /// The parts of an operand: the one that is interned first, and the operand itself.
    struct Operand {
        std::uint32_t first;
        std::uint32_t root;
    };

    enum class Wait : std::uint8_t { Infix, Prefix, Parenthesis, Call };

    /// What waits for operands.
    struct Waiting {
        Wait wait;
        std::uint8_t precedence; ///< of an infix operator
        SymbolicOp op;
        std::uint32_t callee;    ///< of a call
        std::uint32_t last;      ///< the root of its last argument, or the callee
        std::uint32_t arguments; ///< so far
    };

    bool readAll();
    bool readOperand();
    bool readPrefixes();
    bool readName();
    bool readNumber();
    bool readReal();
    bool openBracket(Wait wait, std::uint32_t callee);
    bool readOperator();
    bool closeBracket();
    bool nextArgument();
    void foldUpTo(unsigned precedence);
    void endArgument(Waiting& call);
    SymbolicExprId intern(Operand root);
    SymbolicExprId internCall(std::size_t arguments);

    std::uint32_t add(Part part, SymbolicOp op, std::uint32_t start = 0, std::uint32_t size = 0);
    bool endOperand(Operand operand);
    std::string_view word();
    bool skipBlanks();
    [[nodiscard]] bool startsKeyword() const;

    [[nodiscard]] std::string_view textOf(const Item& item) const { return text_.substr(item.start, item.size); }

    SymbolicExprTable& table_;
    GrammarOptions options_;
    bool isQuill_;
    std::string_view text_;
    const char* at_ = nullptr; ///< the next byte of the text, or the NUL after it
    std::size_t brackets_ = 0; ///< that are open
    bool operandIsNext_ = true;
    // Most texts need no memory but this.
    boost::container::small_vector<Item, 64> items_;
    boost::container::small_vector<Operand, 16> operands_;
    boost::container::small_vector<Waiting, 16> waiting_;
    boost::container::small_vector<SymbolicExprId, 16> ids_;
};

} // namespace VT::Parser
