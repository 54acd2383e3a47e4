// Writes one section for each choice set: the matrix, in which a cell is a pair of choices, and the findings.
// Names and conditions are escaped and cut; the numbers of sets, columns and findings are bounded, and the page says
// what it leaves out.
#include "tools/vtsym/findings/ModelPage.hpp"

#include "host/Text.hpp"
#include "tools/vtsym/findings/ModelPageParts.hpp"

#include <algorithm>
#include <map>

namespace vtsym {

namespace {

// The most that a page shows.
constexpr std::size_t mostSets = 200;
constexpr std::size_t mostColumns = 60;
constexpr std::size_t denseColumns = 20;
constexpr std::size_t mostFindings = 200;    ///< of one set
constexpr std::size_t shownTextBytes = 2000; ///< of one text

/// A text that is safe between tags and in attributes.
std::string escaped(const std::string& text) {
    std::string html;
    for (const char c : VT::shownText(text, shownTextBytes)) {
        switch (c) {
        case '&':
            html.append("&amp;");
            break;
        case '<':
            html.append("&lt;");
            break;
        case '>':
            html.append("&gt;");
            break;
        case '"':
            html.append("&quot;");
            break;
        case '\'':
            html.append("&#39;");
            break;
        default:
            html.push_back(c);
        }
    }
    return html;
}

std::string counted(std::size_t count, const std::string& noun) {
    return std::to_string(count) + " " + noun + (count == 1 ? "" : "s");
}

/// A cell whose tip has one line or two.
std::string cell(const std::string& kind, const std::string& mark, const std::string& tip,
                 const std::string& second = {}) {
    const std::string title = escaped(tip) + (second.empty() ? "" : "&#10;" + escaped(second));
    return "<span class=\"cell " + kind + R"(" tabindex="0" role="img" title=")" + title + "\">" + mark + "</span>";
}

/// One choice set.
class SetPage {
public:
    SetPage(const ModelCheck& check, const ModelCheck::ChoiceSet& set) : check_(check), set_(set) {}

    void append(std::string& html, std::size_t number);

private:
    using Pair = std::pair<std::size_t, std::size_t>;

    void sortFindings();
    void appendMatrix(std::string& html) const;
    void appendRow(std::string& html, std::size_t row) const;
    [[nodiscard]] std::string pairCell(std::size_t row, std::size_t column) const;
    [[nodiscard]] std::string ownCell(std::size_t row) const;

    [[nodiscard]] const VTBlock& choice(std::size_t position) const { return *set_.block->choices()[position]; }

    const ModelCheck& check_;
    const ModelCheck::ChoiceSet& set_;
    std::map<Pair, const VT::ChoiceFinding*> pairs_; ///< the smaller position first
    std::map<Pair, const VT::ChoiceFinding*> openPairs_;
    std::map<std::size_t, const VT::ChoiceFinding*> singles_;
    std::map<std::size_t, const VT::ChoiceFinding*> openSingles_;
};

void SetPage::sortFindings() {
    const auto sort = [](const std::vector<VT::ChoiceFinding>& findings, auto& pairs, auto& singles) {
        for (const VT::ChoiceFinding& finding : findings) {
            if (finding.fault == VT::ChoiceFault::Overlap)
                pairs.emplace(Pair(finding.choice, finding.other), &finding);
            else if (finding.fault != VT::ChoiceFault::Missing)
                singles.emplace(finding.choice, &finding);
        }
    };
    sort(set_.report.findings, pairs_, singles_);
    sort(set_.report.undecided, openPairs_, openSingles_);
}

std::string SetPage::ownCell(std::size_t row) const {
    const std::string& name = choice(row).name();
    const std::string number = std::to_string(row + 1);
    if (openSingles_.contains(row))
        return cell("open", "?", name + ": whether it can be active, or always is, stays undecided");
    const auto found = singles_.find(row);
    if (found == singles_.end())
        return "<span class=\"cell self\">" + number + "</span>";
    switch (found->second->fault) {
    case VT::ChoiceFault::Dead:
        return cell("dead", "&#10005;", name + " is never active");
    case VT::ChoiceFault::AlwaysActive:
        return cell("always", "&#9679;", name + " is always active");
    default:
        return cell("redundant", number, name + " has a redundant operand");
    }
}

std::string SetPage::pairCell(std::size_t row, std::size_t column) const {
    const Pair pair = std::minmax(row, column);
    const std::string names = choice(row).name() + " and " + choice(column).name();
    if (openPairs_.contains(pair))
        return cell("open", "?", names + ": whether both can be active stays undecided");
    const auto found = pairs_.find(pair);
    if (found == pairs_.end())
        return "<span class=\"cell none\">&#183;</span>";
    const VT::ChoiceFinding& finding = *found->second;
    const bool rowCovered = row == pair.first ? finding.firstCovered : finding.secondCovered;
    const bool columnCovered = row == pair.first ? finding.secondCovered : finding.firstCovered;
    const std::string tip = names + " are both active for " + check_.witnessText(finding.witness);
    if (rowCovered && columnCovered)
        return cell("covered", "=", tip, "Neither is ever active without the other.");
    if (rowCovered)
        return cell("covered", "&#8834;", tip,
                    choice(row).name() + " is never active without " + choice(column).name() + ".");
    if (columnCovered)
        return cell("covered", "&#8835;", tip,
                    choice(column).name() + " is never active without " + choice(row).name() + ".");
    return cell("overlap", "&#8745;", tip);
}

void SetPage::appendRow(std::string& html, std::size_t row) const {
    const VTBlock& block = choice(row);
    const std::string condition = block.variantCondition().empty() ? "no condition" : block.variantCondition();
    html.append(R"(<tr><th scope="row"><span class="who"><span class="no">)").append(std::to_string(row + 1));
    html.append("</span><b>").append(escaped(block.name())).append(R"(</b></span><code tabindex="0" title=")");
    html.append(escaped(condition)).append("\">").append(escaped(condition)).append("</code></th>");
    for (std::size_t column = 0; column < set_.block->choices().size(); ++column)
        html.append("<td>").append(row == column ? ownCell(row) : pairCell(row, column)).append("</td>");
    html.append("</tr>\n");
}

void SetPage::appendMatrix(std::string& html) const {
    const std::size_t count = set_.block->choices().size();
    if (count > mostColumns) {
        html.append("<p class=\"soft\">The matrix of more than ").append(std::to_string(mostColumns));
        html.append(" choices is left out; the findings are below.</p>\n");
        return;
    }
    html.append("<div class=\"scroll\"><table").append(count > denseColumns ? " class=\"dense\"" : "");
    html.append("><thead><tr><td></td>");
    for (std::size_t column = 0; column < count; ++column)
        html.append("<th scope=\"col\">").append(std::to_string(column + 1)).append("</th>");
    html.append("</tr></thead><tbody>\n");
    for (std::size_t row = 0; row < count; ++row)
        appendRow(html, row);
    html.append("</tbody></table></div>\n");
}

void appendFindings(const std::vector<Finding>& findings, std::string& html) {
    html.append("<ul class=\"found\">\n");
    for (std::size_t i = 0; i < std::min(findings.size(), mostFindings); ++i) {
        const Finding& finding = findings[i];
        html.append("<li><span class=\"kind\">").append(finding.kind).append("</span><span>");
        html.append(escaped(sentenceOf(finding))).append(" <span class=\"soft\">line ");
        html.append(std::to_string(finding.place.line)).append("</span></span></li>\n");
    }
    html.append("</ul>\n");
    if (findings.size() > mostFindings) {
        html.append("<p class=\"soft\">")
            .append(std::to_string(findings.size() - mostFindings))
            .append(" more findings are not on this page.</p>\n");
    }
}

void SetPage::append(std::string& html, std::size_t number) {
    sortFindings();
    const VTBlock& block = *set_.block;
    html.append("<section id=\"set").append(std::to_string(number)).append("\"><h2>").append(escaped(block.path()));
    html.append("</h2>\n<p class=\"soft\">").append(counted(block.choices().size(), "choice"));
    if (!block.variantCondition().empty())
        html.append(", where <code>").append(escaped(block.variantCondition())).append("</code>");
    html.append("</p>\n");
    appendMatrix(html);
    for (const std::string& advice : set_.advice)
        html.append("<p class=\"soft\">").append(escaped(advice)).append("</p>\n");
    if (!set_.report.allOverlaps) {
        html.append("<p class=\"soft\">Not shown: ")
            .append(ModelCheck::furtherOverlaps(set_.report))
            .append(" of choices that overlap.</p>\n");
    }
    if (set_.findings.empty() && set_.report.undecided.empty())
        html.append("<p class=\"fine\">Exactly one choice is active, whatever the values.</p>\n");
    else
        appendFindings(set_.findings, html);
    html.append("</section>\n");
}

constexpr const char* key = "<ul class=\"key\" aria-label=\"Signs\">"
                            "<li><span class=\"cell overlap\">&#8745;</span>both can be active</li>"
                            "<li><span class=\"cell covered\">&#8834;</span>the row is covered by the column</li>"
                            "<li><span class=\"cell covered\">&#8835;</span>the row covers the column</li>"
                            "<li><span class=\"cell covered\">=</span>always together</li>"
                            "<li><span class=\"cell dead\">&#10005;</span>never active</li>"
                            "<li><span class=\"cell always\">&#9679;</span>always active</li>"
                            "<li><span class=\"cell redundant\">1</span>redundant operand</li>"
                            "<li><span class=\"cell open\">?</span>undecided</li></ul>\n";

} // namespace

std::string modelPage(const VTRootBD& model, const ModelCheck& check) {
    std::vector<const ModelCheck::ChoiceSet*> sets;
    for (const ModelCheck::ChoiceSet& set : check.choiceSets())
        sets.push_back(&set);
    std::stable_partition(sets.begin(), sets.end(), [](const auto* set) { return !set->findings.empty(); });
    std::size_t found = check.otherFindings().size();
    for (const ModelCheck::ChoiceSet* const set : sets)
        found += set->findings.size();

    const std::string title = escaped(model.name().empty() ? check.file() : model.name());
    std::string html = "<!DOCTYPE html>\n<html lang=\"en\">\n<head>\n<meta charset=\"utf-8\">\n"
                       "<meta name=\"viewport\" content=\"width=device-width, initial-scale=1\">\n<title>" +
                       title + ": choices</title>\n<style>" + pageStyle + "</style>\n</head>\n<body>\n<h1>" + title +
                       "</h1>\n<p class=\"sum soft\">" + escaped(check.file()) + ": " +
                       counted(model.blocks().size(), "block") + ", " + counted(sets.size(), "choice set") + ", " +
                       counted(found, "finding") + "</p>\n";
    for (const std::string& problem : check.problems())
        html.append("<p class=\"kind\">").append(escaped(problem)).append("</p>\n");
    html.append(key);
    const std::size_t shown = std::min(sets.size(), mostSets);
    if (shown > 1) {
        html.append("<nav aria-label=\"Choice sets\"><ul>\n");
        for (std::size_t i = 0; i < shown; ++i) {
            html.append("<li><a href=\"#set")
                .append(std::to_string(i))
                .append("\">")
                .append(escaped(sets[i]->block->path()) + "</a> <span class=\"soft\">" +
                        (sets[i]->findings.empty() ? "fine" : counted(sets[i]->findings.size(), "finding")) +
                        "</span></li>\n");
        }
        html.append("</ul></nav>\n");
    }
    for (std::size_t i = 0; i < shown; ++i)
        SetPage(check, *sets[i]).append(html, i);
    if (sets.size() > shown) {
        html.append("<p class=\"soft\">")
            .append(std::to_string(sets.size() - shown))
            .append(" more choice sets are not on this page.</p>\n");
    }
    if (!check.otherFindings().empty()) {
        html.append("<section><h2>Other blocks and ports</h2>\n");
        appendFindings(check.otherFindings(), html);
        html.append("</section>\n");
    }
    return html + "<div id=\"tip\" role=\"tooltip\" hidden></div>\n<script>" + pageScript +
           "</script>\n</body>\n</html>\n";
}

} // namespace vtsym
