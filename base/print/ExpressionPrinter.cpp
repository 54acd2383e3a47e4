// Prints expressions by identifier, with two stores: printed nodes, which share their texts in a pool, and finished
// texts.
//
// Method: an expression that is asked for once is written in one pass, without the pool, unless the pass gives up.
// Cost: a text costs its length, and each distinct node that the pool holds was looked at once in the printer's life.
// textLength() and compareUsingCache() write no text.
// Relies on: StringifySymbolicExpr for the texts, the predicate's version() for names that change.
#include "base/print/ExpressionPrinter.hpp"

#include "base/core/Check.hpp"
#include "base/core/Limits.hpp"
#include "base/print/DirectText.hpp"
#include "base/print/StringifySymbolicExpr.hpp"
#include "base/print/StructuralOrder.hpp"

#include <boost/container/small_vector.hpp>
#include <boost/unordered_map.hpp>

#include <algorithm>
#include <optional>
#include <utility>

namespace VT {

struct SymbolicExprPrinter::State {
    State(const SymbolicExprTable& expressions, bool quillSyntax, bool spacedLogicalOperators,
          const PredicateHandle& predicate)
        : table(expressions),
          names(predicate),
          plainNames(predicate.isPlain()),
          quill(quillSyntax),
          spaced(spacedLogicalOperators),
          direct(expressions, quillSyntax, spacedLogicalOperators),
          stringify(expressions, quillSyntax, spacedLogicalOperators, predicate) {}

    std::string print(SymbolicExprId id) {
        if (plainNames && table.isPlain() && !stringify.hasMet(id)) {
            // Where nodes are shared, a pass may write more than the pool would hold; not for long.
            const std::size_t most = limits::directBytes + limits::directBytesPerNode * table.size();
            if (std::optional<std::string> text = direct.print(id, std::min(most, textBound))) {
                VTSYM_CHECK_SAMPLED(isAsPrintedAnew(id, *text));
                return *std::move(text);
            }
        }
        return printPooled(id);
    }

    template <class Expression>
    std::string printPooled(const Expression& expression) {
        if (!plainNames)
            stringify.forget(); // names may have changed since
        const std::size_t before = stringify.texts().size();
        std::string text = stringify.print(expression);
        VTSYM_CHECK_SAMPLED(isAsPrintedAnew(expression, text));
        if (stringify.texts().size() - before > limits::keptTexts)
            stringify.forget();
        return text;
    }

    /// Whether a visitor that has met nothing prints the same.  Names may have changed without a new version.
    template <class Expression>
    [[nodiscard]] bool isAsPrintedAnew(const Expression& expression, const std::string& text) const {
        StringifySymbolicExpr fresh(table, quill, spaced, names);
        fresh.setTextBound(text.size());
        return !plainNames || fresh.print(expression) == text;
    }

    /// Drops what was printed under names that are others now.
    void followNames() {
        if (plainNames || names.version() == version)
            return;
        stringify.forget();
        finished.clear();
        version = names.version();
    }

    const SymbolicExprTable& table;
    PredicateHandle names;
    bool plainNames;
    bool quill;
    bool spaced;
    std::size_t textBound = limits::textBytes;
    DirectText direct;
    StringifySymbolicExpr stringify;
    boost::unordered_map<SymbolicExprId, std::string> finished;
    std::uint64_t version = 0; ///< of the names
};

SymbolicExprPrinter::SymbolicExprPrinter(const SymbolicExprTable& table, bool quillSyntax, bool spacedLogicalOperators,
                                         const PredicateHandle& predicate)
    : state_(std::make_unique<State>(table, quillSyntax, spacedLogicalOperators, predicate)) {}

SymbolicExprPrinter::SymbolicExprPrinter(SymbolicExprPrinter&&) noexcept = default;
SymbolicExprPrinter& SymbolicExprPrinter::operator=(SymbolicExprPrinter&&) noexcept = default;
SymbolicExprPrinter::~SymbolicExprPrinter() = default;

std::string SymbolicExprPrinter::operator()(SymbolicExprId id) const {
    return state_->print(id);
}

std::string SymbolicExprPrinter::operator()(const SymbolicExpr& node) const {
    return state_->printPooled(node);
}

std::string SymbolicExprPrinter::printIdUsingCache(SymbolicExprId id) const {
    state_->followNames();
    const auto found = state_->finished.find(id);
    if (found != state_->finished.end()) {
        VTSYM_CHECK_SAMPLED(state_->isAsPrintedAnew(id, found->second));
        return found->second;
    }
    return state_->finished.emplace(id, state_->print(id)).first->second;
}

std::uint64_t SymbolicExprPrinter::textLength(SymbolicExprId id) const {
    state_->followNames();
    return state_->stringify.texts().length(state_->stringify.printed(id).text);
}

int SymbolicExprPrinter::compareUsingCache(SymbolicExprId left, SymbolicExprId right) const {
    state_->followNames();
    const Text leftText = state_->stringify.printed(left).text;
    const Text rightText = state_->stringify.printed(right).text;
    if (left == right)
        return 0;
    const int order = state_->stringify.texts().compare(leftText, rightText);
    return order != 0 ? order : compareStructure(state_->table, left, right);
}

void SymbolicExprPrinter::sortUsingCache(std::span<SymbolicExprId> ids) const {
    struct Entry {
        Text text;
        SymbolicExprId id;
    };

    if (ids.size() < 2)
        return;
    state_->followNames();
    boost::container::small_vector<Entry, 16> entries;
    for (const SymbolicExprId id : ids)
        entries.push_back({state_->stringify.printed(id).text, id});
    const TextPool& texts = state_->stringify.texts();
    const auto isBefore = [&](const Entry& left, const Entry& right) {
        const int order = texts.compare(left.text, right.text);
        return order < 0 || (order == 0 && compareStructure(state_->table, left.id, right.id) < 0);
    };
    if (std::ranges::is_sorted(entries, isBefore)) // a result that is simplified again
        return;
    std::ranges::sort(entries, isBefore);
    std::ranges::transform(entries, ids.begin(), &Entry::id);
}

void SymbolicExprPrinter::setTextBound(std::size_t bytes) {
    state_->textBound = bytes;
    state_->stringify.setTextBound(bytes);
}

} // namespace VT
