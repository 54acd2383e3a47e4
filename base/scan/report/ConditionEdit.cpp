// Writes a condition in place of another one.
//
// Method: a longest common subsequence of tokens (Wagner and Fischer, 1974) between the first and the last difference.
// A token that stays keeps the blanks before it; where tokens are left out, the blanks on one side and the comments of
// all stay.  The result is read again: unless it has the tokens of the condition, the condition is written plainly.
// Cost: the product of the tokens that differ, at most limits::comparedTokens.
#include "base/scan/report/ConditionEdit.hpp"

#include "base/core/Limits.hpp"
#include "base/scan/DirectiveOperators.hpp"
#include "base/scan/report/DirectiveTexts.hpp"

#include <algorithm>
#include <cstdint>
#include <span>

namespace VT {

namespace {

using Tokens = std::span<const DirectiveToken>;

constexpr std::size_t none = ~std::size_t{0};

/// Returns the comments of what lies between two tokens, with what lies between them.
std::string_view commentsOf(std::string_view gap) {
    const std::size_t first = gap.find('/');
    return first == std::string_view::npos ? std::string_view() : gap.substr(first, gap.rfind('/') - first + 1);
}

/// For each new token the position of the old one that stays for it; `none` for others.
std::vector<std::size_t> keptTokens(Tokens old, Tokens fresh) {
    std::vector<std::size_t> kept(fresh.size(), none);
    std::size_t first = 0;
    while (first < old.size() && first < fresh.size() && old[first].text == fresh[first].text) {
        kept[first] = first;
        ++first;
    }
    std::size_t rows = old.size() - first;
    std::size_t columns = fresh.size() - first;
    while (rows > 0 && columns > 0 && old[first + rows - 1].text == fresh[first + columns - 1].text)
        kept[first + --columns] = first + --rows;
    if (rows == 0 || columns == 0 || rows > limits::comparedTokens / columns)
        return kept;
    std::vector<std::uint32_t> common((rows + 1) * (columns + 1)); // from each pair of tokens on
    const auto at = [&](std::size_t row, std::size_t column) -> std::uint32_t& {
        return common[row * (columns + 1) + column];
    };
    const auto isSame = [&](std::size_t row, std::size_t column) {
        return old[first + row].text == fresh[first + column].text;
    };
    for (std::size_t row = rows; row-- > 0;) {
        for (std::size_t column = columns; column-- > 0;)
            at(row, column) =
                isSame(row, column) ? at(row + 1, column + 1) + 1 : std::max(at(row + 1, column), at(row, column + 1));
    }
    for (std::size_t row = 0, column = 0; row < rows && column < columns;) {
        if (isSame(row, column))
            kept[first + column++] = first + row++;
        else if (at(row + 1, column) >= at(row, column + 1))
            ++row;
        else
            ++column;
    }
    return kept;
}

/// Joins the tokens of a condition in the words of another one.
class Writer {
public:
    Writer(std::string_view text, Tokens old) : text_(text), old_(old) {}

    std::string write(Tokens fresh) {
        const std::vector<std::size_t> kept = keptTokens(old_, fresh);
        std::size_t after = 0; // the old tokens before are written or left out
        bool wasKept = true;
        for (std::size_t i = 0; i < fresh.size(); ++i) {
            if (kept[i] == none) {
                if (i != 0 && (fresh[i].afterBlank || wasKept))
                    result_.append(" ");
                result_.append(fresh[i].text);
                wasKept = false;
                continue;
            }
            leaveOut(after, kept[i], wasKept);
            if (!wasKept && fresh[i].afterBlank && !result_.ends_with(' '))
                result_.append(" ");
            const DirectiveToken& token = old_[kept[i]];
            result_.append(text_.substr(token.begin, token.end - token.begin));
            after = kept[i] + 1;
            wasKept = true;
        }
        for (std::size_t i = after; i < old_.size(); ++i)
            addComments(gapBefore(i));
        return std::move(result_);
    }

private:
    /// What lies before a token, or nothing before the first.
    [[nodiscard]] std::string_view gapBefore(std::size_t token) const {
        return token == 0 ? std::string_view()
                          : text_.substr(old_[token - 1].end, old_[token].begin - old_[token - 1].end);
    }

    void addComments(std::string_view gap) {
        const std::string_view comments = commentsOf(gap);
        if (!comments.empty())
            result_.append(result_.empty() || result_.ends_with(' ') ? "" : " ").append(comments).append(" ");
    }

    /// Writes what lies before a token that stays, where those from `after` on are left out.
    void leaveOut(std::size_t after, std::size_t token, bool wasKept) {
        const bool isSuffix = after < token && after != 0 && infixOf(old_[after]) != SymbolicOp::None;
        const std::size_t whole = isSuffix ? token : after;
        for (std::size_t i = after; i <= token; ++i) {
            if (i == whole && wasKept)
                result_.append(gapBefore(i));
            else
                addComments(gapBefore(i));
        }
    }

    std::string_view text_;
    Tokens old_;
    std::string result_;
};

/// Whether a text, as a condition, has these tokens.
bool hasTokens(const std::string& text, Tokens tokens) {
    const std::string line = "#if " + text + "\n";
    DirectiveReader reader(line);
    Directive directive{};
    return reader.next(directive) &&
           std::ranges::equal(directive.tokens, tokens, {}, &DirectiveToken::text, &DirectiveToken::text);
}

/// A condition after the comments of the tokens that it replaces.
std::string plainly(std::string_view text, std::size_t begin, Tokens old, const std::string& condition) {
    std::string result = condition;
    for (const DirectiveToken& token : old) {
        const std::string_view comments = commentsOf(text.substr(begin, token.begin - begin));
        if (!comments.empty())
            result.append(" ").append(comments);
        begin = token.end;
    }
    return result;
}

} // namespace

SourceEdit conditionEdit(std::string_view text, const Directive& directive, const std::string& condition) {
    if (!isExpression(directive.kind)) {
        std::string changed = opensChain(directive.kind) ? "if " : "elif ";
        changed.append(plainly(text, directive.keywordEnd, directive.tokens, condition));
        return {directive.keyword, directive.end, std::move(changed)};
    }
    const std::size_t begin = directive.tokens.front().begin;
    const std::string line = "#if " + condition + "\n";
    DirectiveReader reader(line);
    Directive fresh{};
    if (reader.next(fresh)) {
        std::string written = Writer(text, directive.tokens).write(fresh.tokens);
        written.erase(written.find_last_not_of(' ') + 1);
        if (hasTokens(written, fresh.tokens))
            return {begin, directive.end, std::move(written)};
    }
    return {begin, directive.end, plainly(text, begin, directive.tokens, condition)};
}

std::string withEdits(std::string_view text, const std::vector<SourceEdit>& edits) {
    std::string result;
    std::size_t at = 0;
    for (const SourceEdit& edit : edits) {
        result.append(text.substr(at, edit.begin - at)).append(edit.text);
        at = edit.end;
    }
    return result.append(text.substr(at));
}

} // namespace VT
