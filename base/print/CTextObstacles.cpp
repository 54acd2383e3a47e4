#include "base/print/CTextObstacles.hpp"

#include "base/core/Walk.hpp"
#include "base/print/PreprocessorVCExpr.hpp"

#include <algorithm>

namespace VT {

namespace {

/// Operators that C text writes, but C has not.
constexpr OperatorSet notInC = [] {
    OperatorSet set{SymbolicOp::Power, SymbolicOp::DotPower,  SymbolicOp::DotMul,    SymbolicOp::DotDiv,
                    SymbolicOp::LDiv,  SymbolicOp::DotLDiv,   SymbolicOp::Transpose, SymbolicOp::DotTranspose,
                    SymbolicOp::Row,   SymbolicOp::CellArray, SymbolicOp::Matrix,    SymbolicOp::AnonymousFunc};
    for (const OperatorInfo& row : operatorTable())
        if (row.form == OperatorForm::Range || row.form == OperatorForm::Brackets)
            set.add(row.op);
    return set;
}();

class Finder {
public:
    Finder(const SymbolicExprTable& table, CTextUse use, const SymbolicExprPrinter::PredicateHandle& predicate)
        : table_(table),
          use_(use),
          printer_(table, false, true, predicate) {}

    std::vector<CTextFinding> find(SymbolicExprId root);

private:
    void look(SymbolicExprId id, const SymbolicExpr& node);
    void occurs(SymbolicExprId id, const SymbolicExpr* parent);
    void note(CTextObstacle obstacle, SymbolicExprId id, SymbolicExprId other = invalidId);
    void compareNames();
    [[nodiscard]] bool isZeroOrOne(SymbolicExprId id) const;

    [[nodiscard]] SymbolicOp op(SymbolicExprId id) const {
        return table_.has(id) ? table_.get(id)->op() : SymbolicOp::None;
    }

    const SymbolicExprTable& table_;
    CTextUse use_;
    PreprocessorVCExpr printer_;
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
bool Finder::isZeroOrOne(SymbolicExprId id) const {
    const SymbolicOp kind = op(id);
    if (kind == SymbolicOp::IntValue) {
        const int value = static_cast<const SymbolicIntValue&>(*table_.get(id)).getValue();
        return value == 0 || value == 1;
    }
    if (kind == SymbolicOp::String) {
        const std::string& name = static_cast<const SymbolicString&>(*table_.get(id)).getName();
        return name == "true" || name == "false";
    }
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
    if (use_ == CTextUse::Program)
        return;
    if (kind == SymbolicOp::DoubleValue)
        note(CTextObstacle::RealConstant, id);
    if (kind == SymbolicOp::MemberValue) {
        const SymbolicOp owner = op(node.getInput(0));
        if (owner != SymbolicOp::MemberValue && owner != SymbolicOp::String)
            note(CTextObstacle::MemberOfNoName, id);
    }
    if (callOps.contains(kind) && (node.getNumInputs() == 0 || op(node.getInput(0)) != SymbolicOp::String))
        note(CTextObstacle::CalledNoName, id);
}

/// Takes note of a name that stands for itself rather than for the owner of a member.
void Finder::occurs(SymbolicExprId id, const SymbolicExpr* parent) {
    const SymbolicOp kind = op(id);
    if ((kind == SymbolicOp::String || kind == SymbolicOp::MemberValue) &&
        (parent == nullptr || parent->op() != SymbolicOp::MemberValue))
        names_.push_back(id);
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
    if (use_ == CTextUse::Directive)
        compareNames();
    return std::move(findings_);
}

} // namespace

std::vector<CTextFinding> findCTextObstacles(const SymbolicExprTable& table, SymbolicExprId id, CTextUse use,
                                             const SymbolicExprPrinter::PredicateHandle& predicate) {
    return Finder(table, use, predicate).find(id);
}

} // namespace VT
