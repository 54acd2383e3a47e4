// Draws a tree with an explicit stack.  A shared operator is drawn once and referred to by number, so the work is
// linear in the nodes; operators below drawnDepth levels are drawn as further trees, so that lines fit a screen.
#include "base/core/Walk.hpp"
#include "base/util/IdMap.hpp"
#include "tools/vtsym/answers/NodeText.hpp"
#include "tools/vtsym/answers/TreeWriters.hpp"

#include <string_view>
#include <vector>

namespace vtsym {

namespace {

constexpr std::size_t drawnDepth = 24; ///< levels of one drawing

/// The operators that occur as operands more than once.
VT::IdMap<bool> sharedOperators(const VT::SymbolicExprTable& table, VT::SymbolicExprId root) {
    VT::IdMap<bool> shared;
    VT::walkDistinct(
        table, root, [](VT::SymbolicExprId, const VT::SymbolicExpr&) {},
        [&](VT::SymbolicExprId id) {
            if (table.has(id) && isOperator(*table.get(id)))
                shared.insert(id, true);
        });
    return shared;
}

class Drawing {
public:
    Drawing(const VT::SymbolicExprTable& table, const Style& style, std::string& out)
        : table_(table),
          style_(style),
          out_(out) {}

    void draw(VT::SymbolicExprId root);

private:
    enum class State : unsigned char { Unknown, Deferred, Drawn };

    /// An operator whose operands are being drawn.
    struct Level {
        const VT::SymbolicExpr* node;
        std::size_t next;
        std::size_t indentBytes; ///< of the operator's own line
    };

    void drawPart(VT::SymbolicExprId root);
    void drawOperand(VT::SymbolicExprId id, bool last);
    void drawOperator(VT::SymbolicExprId id, bool numbered);

    [[nodiscard]] std::string number(VT::SymbolicExprId id) const { return style_.name("#" + std::to_string(id)); }

    const VT::SymbolicExprTable& table_;
    const Style& style_;
    std::string& out_;
    VT::IdMap<bool> shared_;
    VT::IdMap<State> states_;
    std::vector<VT::SymbolicExprId> deferred_;
    std::vector<Level> levels_;
    std::string indent_;
};

void Drawing::draw(VT::SymbolicExprId root) {
    shared_ = sharedOperators(table_, root);
    drawPart(root);
    for (std::size_t i = 0; i < deferred_.size(); ++i) { // NOLINT(modernize-loop-convert): it grows
        if (*states_.find(deferred_[i]) == State::Drawn)
            continue;
        out_.append("\n");
        drawPart(deferred_[i]);
    }
    out_.pop_back(); // the caller ends the last line
}

void Drawing::drawPart(VT::SymbolicExprId root) {
    indent_.clear();
    if (isOperator(*table_.get(root)))
        drawOperator(root, !deferred_.empty());
    else
        out_.append(labelOf(*table_.get(root))).append("\n");
    while (!levels_.empty()) {
        Level& level = levels_.back();
        indent_.resize(level.indentBytes);
        if (level.next == level.node->getNumInputs()) {
            levels_.pop_back();
            continue;
        }
        const VT::SymbolicExprId operand = level.node->getInput(level.next++);
        drawOperand(operand, level.next == level.node->getNumInputs());
    }
}

void Drawing::drawOperand(VT::SymbolicExprId id, bool last) {
    out_.append(indent_).append(style_.faint(last ? "└─ " : "├─ "));
    indent_.append(style_.faint(last ? "   " : "│  "));
    const VT::SymbolicExpr& node = *table_.get(id);
    if (!isOperator(node)) {
        out_.append(labelOf(node)).append("\n");
        return;
    }
    const State* const state = states_.find(id);
    if (state != nullptr && *state == State::Drawn) {
        out_.append(number(id)).append(style_.faint(" as above")).append("\n");
    } else if (state == nullptr && levels_.size() < drawnDepth) {
        drawOperator(id, shared_.find(id) != nullptr);
    } else {
        if (state == nullptr) {
            deferred_.push_back(id);
            states_.insert(id, State::Deferred);
        }
        out_.append(number(id)).append(style_.faint(" below")).append("\n");
    }
}

/// Draws the line of an operator and opens its level.
void Drawing::drawOperator(VT::SymbolicExprId id, bool numbered) {
    const VT::SymbolicExpr& node = *table_.get(id);
    if (numbered)
        out_.append(number(id)).append(" ");
    out_.append(labelOf(node)).append("\n");
    states_.insert(id, State::Drawn);
    levels_.push_back({&node, 0, indent_.size()});
}

} // namespace

void appendDrawing(const VT::SymbolicExprTable& table, VT::SymbolicExprId root, const Style& style, std::string& out) {
    Drawing(table, style, out).draw(root);
}

} // namespace vtsym
