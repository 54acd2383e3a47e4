// Finds what C text or a preprocessor cannot decide as the library does.
//
// Method: one walk over the distinct nodes with a check for each operator, name, member and call.  For a directive, the
// names that become macros are printed, sorted by their texts, and neighbours compared.
// Cost: linear in the nodes, but for the sorting of names.
#include "base/print/CTextObstacles.hpp"

#include "base/core/Walk.hpp"
#include "base/print/PreprocessorVCExpr.hpp"
#include "base/print/StructuralOrder.hpp"
#include "base/util/IdMap.hpp"
#include "base/variants/VariantKeywords.hpp"

#include <algorithm>
#include <array>
#include <cmath>
#include <string_view>

namespace VT {

namespace {

/// Operators that C text writes though C has no such operator.
constexpr OperatorSet notInC = [] {
    OperatorSet set{SymbolicOp::Power, SymbolicOp::DotPower,  SymbolicOp::DotMul,    SymbolicOp::DotDiv,
                    SymbolicOp::LDiv,  SymbolicOp::DotLDiv,   SymbolicOp::Transpose, SymbolicOp::DotTranspose,
                    SymbolicOp::Row,   SymbolicOp::CellArray, SymbolicOp::Matrix,    SymbolicOp::AnonymousFunc};
    for (const OperatorInfo& row : operatorTable())
        if (row.form == OperatorForm::Range || row.form == OperatorForm::Brackets)
            set.add(row.op);
    return set;
}();

/// The keywords of C, sorted; `true` and `false` are constants here.
// clang-format off
constexpr auto keywordsOfC = std::to_array<std::string_view>({
    "_Alignas", "_Alignof", "_Atomic", "_BitInt", "_Bool", "_Complex", "_Decimal128", "_Decimal32", "_Decimal64",
    "_Generic", "_Imaginary", "_Noreturn", "_Static_assert", "_Thread_local", "alignas", "alignof", "auto",
    "bool", "break", "case", "char", "const", "constexpr", "continue", "default", "do", "double", "else", "enum",
    "extern", "float", "for", "goto", "if", "inline", "int", "long", "nullptr", "register", "restrict", "return",
    "short", "signed", "sizeof", "static", "static_assert", "struct", "switch", "thread_local", "typedef",
    "typeof", "typeof_unqual", "union", "unsigned", "void", "volatile", "while"
});
// clang-format on
static_assert(std::ranges::is_sorted(keywordsOfC));

constexpr std::string_view definedOperator = "defined";

bool isWord(std::string_view text) {
    return std::ranges::all_of(text, [](unsigned char c) {
        return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || (c >= '0' && c <= '9') || c == '_' || c >= 0x80;
    });
}

/// Leaves letters beyond ASCII to the compiler.
bool isIdentifier(std::string_view text) {
    return !text.empty() && isWord(text) && (text.front() < '0' || text.front() > '9');
}

class Finder {
public:
    Finder(const SymbolicExprTable& table, CTextUse use, const SymbolicExprPrinter::PredicateHandle& predicate)
        : table_(table),
          use_(use),
          predicate_(predicate),
          printer_(table, false, true, predicate) {}

    std::vector<CTextFinding> find(SymbolicExprId root);

private:
    void look(SymbolicExprId id, const SymbolicExpr& node);
    void occurs(SymbolicExprId id, const SymbolicExpr* parent);
    void note(CTextObstacle obstacle, SymbolicExprId id, SymbolicExprId other = invalidId);
    void lookAtName(SymbolicExprId id, const SymbolicString& name);
    void lookAtMember(SymbolicExprId id, const SymbolicMemberValue& member);
    void lookAtCall(SymbolicExprId id, const SymbolicExpr& call);
    void compareNames();
    [[nodiscard]] bool isZeroOrOne(SymbolicExprId id);
    [[nodiscard]] bool isNamed(SymbolicExprId id);
    [[nodiscard]] bool isReserved(std::string_view word) const;

    [[nodiscard]] bool inDirective() const noexcept { return use_ == CTextUse::Directive; }

    [[nodiscard]] SymbolicOp op(SymbolicExprId id) const {
        const SymbolicExpr* const node = table_.get(id);
        return node != nullptr ? node->op() : SymbolicOp::None;
    }

    /// What C makes of the text of an identifier; all false for any other node.
    struct Words {
        bool isTruth = false; ///< `true` or `false`
        bool isIdentifier = false;
        bool isReserved = false; ///< a reserved word of C, or of the preprocessor
    };

    Words wordsOf(SymbolicExprId id);

    const SymbolicExprTable& table_;
    CTextUse use_;
    const SymbolicExprPrinter::PredicateHandle& predicate_;
    PreprocessorVCExpr printer_;
    IdMap<Words> looked_;               ///< at identifiers, which may be long and occur often
    std::vector<SymbolicExprId> names_; ///< what becomes a name in the text
    std::vector<CTextFinding> findings_;
};

void Finder::note(CTextObstacle obstacle, SymbolicExprId id, SymbolicExprId other) {
    const auto same = [&](const CTextFinding& finding) {
        return finding.obstacle == obstacle && op(finding.id) == op(id);
    };
    if (std::ranges::none_of(findings_, same))
        findings_.push_back({obstacle, id, other});
}

/// Whether & and | of an operand are the same bit by bit.
bool Finder::isZeroOrOne(SymbolicExprId id) {
    const SymbolicOp kind = op(id);
    if (kind == SymbolicOp::IntValue) {
        const int value = static_cast<const SymbolicIntValue&>(*table_.get(id)).getValue();
        return value == 0 || value == 1;
    }
    if (kind == SymbolicOp::String)
        return wordsOf(id).isTruth;
    return booleanOps.contains(kind);
}

void Finder::look(SymbolicExprId id, const SymbolicExpr& node) {
    const SymbolicOp kind = node.op();
    if (notInC.contains(kind))
        note(CTextObstacle::NoSuchOperator, id);
    if ((kind == SymbolicOp::SingleAnd || kind == SymbolicOp::SingleOr) &&
        !(isZeroOrOne(node.getInput(0)) && isZeroOrOne(node.getInput(1))))
        note(CTextObstacle::BitwiseLogic, id);
    // C's | binds weaker than its ^, unlike the element-wise one.
    if (kind == SymbolicOp::BitXOr && op(node.getInput(0)) == SymbolicOp::SingleOr)
        note(CTextObstacle::BitwiseLogic, node.getInput(0));
    if (kind == SymbolicOp::DoubleValue &&
        (inDirective() || !std::isfinite(static_cast<const SymbolicDoubleValue&>(node).getValue())))
        note(CTextObstacle::RealConstant, id);
    if (kind == SymbolicOp::String)
        lookAtName(id, static_cast<const SymbolicString&>(node));
    if (kind == SymbolicOp::MemberValue)
        lookAtMember(id, static_cast<const SymbolicMemberValue&>(node));
    if (callOps.contains(kind))
        lookAtCall(id, node);
}

Finder::Words Finder::wordsOf(SymbolicExprId id) {
    if (op(id) != SymbolicOp::String)
        return {};
    if (const Words* const known = looked_.find(id))
        return *known;
    const std::string text = predicate_.printIdentifier(static_cast<const SymbolicString&>(*table_.get(id)));
    return looked_.insert(id, {text == "true" || text == "false", isIdentifier(text), isReserved(text)});
}

/// Whether the operand before a point or an argument list is written so that C can read it.  Members are checked on
/// their own.
bool Finder::isNamed(SymbolicExprId id) {
    const SymbolicOp kind = op(id);
    if (kind == SymbolicOp::String)
        return !wordsOf(id).isTruth && (!inDirective() || wordsOf(id).isIdentifier);
    return kind == SymbolicOp::MemberValue || (!inDirective() && callOps.contains(kind));
}

/// Whether a word is reserved by C, or by the preprocessor.
bool Finder::isReserved(std::string_view word) const {
    return inDirective() ? word == definedOperator : std::ranges::binary_search(keywordsOfC, word);
}

/// A text that a predicate has chosen is the host's responsibility.
void Finder::lookAtName(SymbolicExprId id, const SymbolicString& name) {
    const std::string text = predicate_.printIdentifier(name);
    if (VariantKeywords::isVariantKeyword(text, false))
        note(CTextObstacle::VariantKeyword, id);
    else if (text == name.getName() && (!isIdentifier(text) || (!inDirective() && isReserved(text))))
        note(CTextObstacle::NoSuchName, id);
}

void Finder::lookAtMember(SymbolicExprId id, const SymbolicMemberValue& member) {
    if (!isNamed(member.getInput(0)))
        note(CTextObstacle::MemberOfNoName, id);
    const std::string& name = member.getMemberName();
    const bool isField = isIdentifier(name) && !isReserved(name) && name != "true" && name != "false";
    if (inDirective() ? !isWord(name) : !isField)
        note(CTextObstacle::NoSuchName, id);
}

void Finder::lookAtCall(SymbolicExprId id, const SymbolicExpr& call) {
    const SymbolicExprId callee = call.getNumInputs() > 0 ? call.getInput(0) : invalidId;
    if (!isNamed(callee) || (inDirective() && op(callee) != SymbolicOp::String))
        note(CTextObstacle::CalledNoName, id);
    if (!inDirective() || !wordsOf(callee).isReserved)
        return;
    if (call.getNumInputs() != 2 || !isNamed(call.getInput(1)) || wordsOf(call.getInput(1)).isReserved)
        note(CTextObstacle::DefinedNoName, id);
}

/// Takes note of a name that is used by itself rather than as the owner of a member.
void Finder::occurs(SymbolicExprId id, const SymbolicExpr* parent) {
    const SymbolicOp kind = op(id);
    if ((kind != SymbolicOp::String && kind != SymbolicOp::MemberValue) ||
        (parent != nullptr && parent->op() == SymbolicOp::MemberValue))
        return;
    names_.push_back(id);
    const bool isCalled = parent != nullptr && callOps.contains(parent->op()) && parent->getInput(0) == id;
    if (inDirective() && !isCalled && wordsOf(id).isReserved)
        note(CTextObstacle::NoSuchName, id);
}

/// Looks for two parameters with one text.
void Finder::compareNames() {
    struct Name {
        Text text;
        SymbolicExprId id;
    };

    std::ranges::sort(names_);
    names_.erase(std::unique(names_.begin(), names_.end()), names_.end());
    std::vector<Name> names;
    names.reserve(names_.size());
    for (const SymbolicExprId id : names_)
        names.push_back({printer_.printed(id).text, id});
    const TextPool& texts = printer_.texts();
    const auto before = [&](const Name& a, const Name& b) {
        const int order = texts.compare(a.text, b.text);
        return order != 0 ? order < 0 : compareStructure(table_, a.id, b.id) < 0;
    };
    const auto same = [&](const Name& a, const Name& b) {
        return texts.length(a.text) == texts.length(b.text) && texts.compare(a.text, b.text) == 0;
    };
    std::ranges::sort(names, before);
    const auto shared = std::ranges::adjacent_find(names, same);
    if (shared != names.end())
        note(CTextObstacle::SharedMacroName, shared->id, std::next(shared)->id);
}

std::vector<CTextFinding> Finder::find(SymbolicExprId root) {
    walkDistinctWithParents(
        table_, root,
        [&](SymbolicExprId id, const SymbolicExpr& node, const SymbolicExpr* parent) {
            look(id, node);
            occurs(id, parent);
        },
        [&](SymbolicExprId id, const SymbolicExpr* parent) { occurs(id, parent); });
    if (inDirective())
        compareNames();
    return std::move(findings_);
}

} // namespace

std::vector<CTextFinding> findCTextObstacles(const SymbolicExprTable& table, SymbolicExprId id, CTextUse use,
                                             const SymbolicExprPrinter::PredicateHandle& predicate) {
    return Finder(table, use, predicate).find(id);
}

} // namespace VT
