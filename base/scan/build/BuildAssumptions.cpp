// Finds and reads the assumptions that have to do with a condition.
//
// Method: breadth first through shared names.  A name that many assumptions share leads to those that begin with it
// alone, so that a configuration of thousands of names stays a neighbourhood of some dozen conditions: fewer
// assumptions find less, and nothing wrong.  An assumption is read again after each #include, so that it is about
// macros as they are there; never where the file changed one of its macros.
// Cost: at most limits::relatedAssumptions for each condition; each is read once for each epoch.
#include "base/scan/build/BuildAssumptions.hpp"

#include "base/core/Limits.hpp"
#include "base/core/Make.hpp"
#include "base/decide/Decider.hpp"

#include <algorithm>

namespace VT {

namespace {

/// Reads a line as a directive; false where it is none, or several.
bool readLine(DirectiveReader& reader, std::string_view line, Directive& directive) {
    return line.find('\n') == std::string_view::npos && reader.next(directive) && !directive.tokens.empty();
}

bool isText(const DirectiveToken& token, std::string_view text) {
    return token.text == text;
}

} // namespace

/// The lines that were read, with a reader of conditions outside of any file.
struct BuildAssumptions::Lines {
    /// Reads conditions; its memory is used again from time to time.
    struct Check {
        Check() : unknowns(table, states), reader(table, states, unknowns, false) { table.addBoolSymbols(); }

        SymbolicExprTable table;
        MacroStates states;
        MacroUnknowns unknowns;
        DirectiveConditionReader reader;
    };

    /// Whether #if can have a condition.
    bool isCondition(const Directive& directive) {
        if (!check || check->table.size() > limits::assumptionNodes)
            check.emplace();
        return check->reader.read(directive).understood;
    }

    std::optional<std::string> read(std::string_view condition, std::shared_ptr<const Item>& item);

    std::optional<Check> check;
    std::unordered_map<std::string_view, std::shared_ptr<const Item>> known; ///< by condition, a view of its line
};

/// Makes an item of a condition.  Returns what is wrong with it.
std::optional<std::string> BuildAssumptions::Lines::read(std::string_view condition,
                                                         std::shared_ptr<const Item>& item) {
    if (const auto same = known.find(condition); same != known.end()) {
        item = same->second;
        return std::nullopt;
    }
    Item made;
    made.line = std::make_shared<const std::string>("#if " + std::string(condition));
    DirectiveReader reader(*made.line);
    Directive directive{};
    if (condition.find('\n') != std::string_view::npos)
        return "has several lines";
    if (!readLine(reader, *made.line, directive))
        return "holds no condition";
    if (!isCondition(directive))
        return "is not a condition that #if can have";
    for (const DirectiveToken& token : directive.tokens) {
        const bool isMacro = token.kind == DirectiveTokenKind::Name && token.text != "defined";
        // A view of the line: its tokens have no splices.
        const std::string_view name = std::string_view(*made.line).substr(token.begin, token.end - token.begin);
        if (isMacro && std::ranges::find(made.names, name) == made.names.end())
            made.names.push_back(name);
    }
    item = std::make_shared<const Item>(std::move(made));
    known.emplace(std::string_view(*item->line).substr(4), item);
    return std::nullopt;
}

std::shared_ptr<BuildAssumptions::Lines> BuildAssumptions::newLines() {
    return std::make_shared<Lines>();
}

std::optional<std::string> BuildAssumptions::add(std::string_view condition) {
    if (condition.starts_with("#define"))
        return addMeaning(condition);
    if (condition.starts_with("#pragma"))
        return addPragma(condition);
    std::shared_ptr<const Item> item;
    if (auto wrong = lines_->read(condition, item))
        return wrong;
    for (const std::string_view name : item->names)
        byName_[name].push_back(items_.size());
    if (!item->names.empty())
        byFirst_[item->names.front()].push_back(items_.size());
    items_.push_back(std::move(item));
    return std::nullopt;
}

std::optional<std::string> BuildAssumptions::addMeaning(std::string_view line) {
    constexpr const char* wrong = "does not define a macro of one parameter: write #define F(x) CONDITION";
    Meaning meaning;
    meaning.line = std::make_shared<const std::string>(line);
    DirectiveReader reader(*meaning.line);
    Directive directive{};
    if (!readLine(reader, *meaning.line, directive) || directive.kind != DirectiveKind::Define)
        return wrong;
    const std::span<const DirectiveToken> tokens = directive.tokens;
    const bool isCall = tokens.size() > 4 && tokens[0].kind == DirectiveTokenKind::Name && isText(tokens[1], "(") &&
                        !tokens[1].afterBlank && tokens[2].kind == DirectiveTokenKind::Name && isText(tokens[3], ")");
    if (!isCall || isText(tokens[0], "defined") || isText(tokens[2], "defined"))
        return wrong;
    const std::string_view text = *meaning.line;
    meaning.parameter = text.substr(tokens[2].begin, tokens[2].end - tokens[2].begin);
    for (const DirectiveToken& token : tokens.subspan(4)) {
        meaning.body.push_back(token);
        meaning.body.back().text = text.substr(token.begin, token.end - token.begin);
    }
    if (isText(meaning.body.front(), "##") || isText(meaning.body.back(), "##"))
        return "pastes nothing: ## is between two tokens";
    const std::string name(tokens[0].text);
    meanings_.insert_or_assign(name, std::move(meaning));
    const std::optional<Item> example = meaningOf(name, "A");
    DirectiveReader exampleReader(*example->line);
    Directive read{};
    if (readLine(exampleReader, *example->line, read) && lines_->isCondition(read))
        return std::nullopt;
    meanings_.erase(name);
    return "does not define a condition that #if can have";
}

std::optional<std::string> BuildAssumptions::addPragma(std::string_view line) {
    const std::string text(line);
    DirectiveReader reader(text);
    Directive directive{};
    const bool isPragma = readLine(reader, text, directive) && directive.kind == DirectiveKind::Pragma &&
                          directive.tokens.size() == 2 && directive.tokens[1].kind == DirectiveTokenKind::Name;
    if (isPragma && isText(directive.tokens[0], "closed"))
        closed_.emplace_back(directive.tokens[1].text);
    else if (isPragma && isText(directive.tokens[0], "open"))
        open_.emplace(directive.tokens[1].text);
    else
        return "is not an assumption: write #pragma closed PREFIX or #pragma open NAME";
    return std::nullopt;
}

std::vector<DirectiveToken> BuildAssumptions::tokensOf(const Item& item) {
    DirectiveReader reader(*item.line);
    Directive directive{};
    reader.next(directive);
    std::vector<DirectiveToken> tokens(directive.tokens.begin(), directive.tokens.end());
    for (DirectiveToken& token : tokens)
        if (token.kind != DirectiveTokenKind::Operator) // whose spelling is the ordinary one
            token.text = std::string_view(*item.line).substr(token.begin, token.end - token.begin);
    return tokens;
}

bool BuildAssumptions::canHold() const {
    SymbolicExprTable table;
    table.addBoolSymbols();
    MacroStates states;
    MacroUnknowns unknowns(table, states);
    DirectiveConditionReader reader(table, states, unknowns, false);
    std::vector<SymbolicExprId> all;
    if (items_.empty() || items_.size() > limits::assumptionsTogether)
        return true;
    for (const std::shared_ptr<const Item>& item : items_) {
        Directive directive{};
        directive.kind = DirectiveKind::If;
        const std::vector<DirectiveToken> tokens = tokensOf(*item);
        directive.tokens = tokens;
        all.push_back(reader.read(directive).node);
    }
    Decider decider(table, {.keywordsInForce = false});
    return !decider.canHold(makeChain(table, SymbolicOp::And, all)).isNo();
}

bool BuildAssumptions::mayConcern(std::string_view text) const {
    return closed_.empty() || std::ranges::any_of(closed_, [&](const std::string& prefix) {
               return text.find(prefix) != std::string_view::npos;
           });
}

bool BuildAssumptions::leadsTo(std::string_view name, const Item& item) const {
    const auto about = byName_.find(name);
    return about == byName_.end() || about->second.size() <= limits::assumptionsAboutName ||
           item.kind != Item::Kind::Condition || item.names.front() == name;
}

std::vector<std::size_t> BuildAssumptions::relatedTo(const std::set<std::string_view>& names) const {
    std::vector<std::size_t> found;
    std::set<std::size_t> isFound;
    std::set<std::string_view> seen;
    const auto addAbout = [&](std::string_view name) {
        const auto about = byName_.find(name);
        if (!seen.insert(name).second || about == byName_.end())
            return;
        const bool isShared = about->second.size() > limits::assumptionsAboutName;
        const auto own = isShared ? byFirst_.find(name) : about;
        if (isShared && own == byFirst_.end())
            return;
        for (const std::size_t item : own->second) {
            if (found.size() == limits::relatedAssumptions)
                return;
            if (isFound.insert(item).second)
                found.push_back(item);
        }
    };
    std::ranges::for_each(names, addAbout);
    std::size_t next = 0;
    while (next < found.size()) // which grows
        std::ranges::for_each(items_[found[next++]]->names, addAbout);
    return found;
}

bool BuildAssumptions::isClosed(std::string_view name) const {
    return std::ranges::any_of(
        closed_, [&](const std::string& prefix) { return name.size() > prefix.size() && name.starts_with(prefix); });
}

bool BuildAssumptions::isSettled(std::string_view name) const {
    return (isClosed(name) && !open_.contains(name)) || meanings_.contains(name);
}

bool BuildAssumptions::isLogical(std::string_view name) const {
    const auto about = byFirst_.find(name);
    const std::string is = std::string(name) + " == 1";
    return about != byFirst_.end() && std::ranges::any_of(about->second, [&](std::size_t item) {
               const std::string_view line = std::string_view(*items_[item]->line).substr(4);
               return line.starts_with(is) || line.starts_with("!defined(" + std::string(name) + ") || " + is);
           });
}

std::optional<BuildAssumptions::Item> BuildAssumptions::absenceOf(std::string_view name, bool isWritten) const {
    if (!isClosed(name) || open_.contains(name) || byName_.contains(name))
        return std::nullopt;
    Item item;
    item.line = std::make_shared<const std::string>("#if !defined(" + std::string(name) + ")");
    item.names = {std::string_view(*item.line).substr(13, name.size())};
    if (isWritten) {
        item.kind = Item::Kind::Absence;
        item.shown = name;
    }
    return item;
}

std::optional<BuildAssumptions::Item> BuildAssumptions::meaningOf(std::string_view macro,
                                                                  std::string_view argument) const {
    const auto known = meanings_.find(macro);
    if (known == meanings_.end())
        return std::nullopt;
    std::string body;
    for (const DirectiveToken& token : known->second.body) {
        if (isText(token, "##"))
            body.erase(body.find_last_not_of(' ') + 1);
        else
            body.append(isText(token, known->second.parameter) ? argument : token.text).push_back(' ');
    }
    const std::string call = std::string(macro) + "(" + std::string(argument) + ")";
    Item item;
    item.line = std::make_shared<const std::string>("#if !" + call + " && !(" + body + ") || " + call + " == 1 && (" +
                                                    body + ")");
    for (const DirectiveToken& token : tokensOf(item)) {
        if (token.kind == DirectiveTokenKind::Name && token.text != "defined" &&
            std::ranges::find(item.names, token.text) == item.names.end())
            item.names.push_back(token.text);
    }
    item.kind = Item::Kind::Meaning;
    item.shown = *known->second.line;
    return item;
}

FileAssumptions::FileAssumptions(const BuildAssumptions& all, MacroStates& states, MacroUnknowns& unknowns,
                                 DirectiveConditionReader& reader)
    : all_(all),
      states_(states),
      unknowns_(unknowns),
      reader_(reader) {
    if (!all.empty())
        states.settle([&all](std::string_view name) { return all.isSettled(name); });
}

void FileAssumptions::readFor(std::span<const DirectiveToken> condition) {
    if (all_.empty())
        return;
    std::set<std::string_view> names;
    for (const DirectiveToken& token : condition)
        if (token.kind == DirectiveTokenKind::Name)
            names.insert(token.text);
    for (const std::string_view name : names)
        readMade(all_.absenceOf(name, true));
    for (std::size_t i = 0; i < condition.size(); ++i) {
        const bool isCall = condition[i].kind == DirectiveTokenKind::Name && i + 3 < condition.size() &&
                            isText(condition[i + 1], "(") && condition[i + 2].kind == DirectiveTokenKind::Name &&
                            isText(condition[i + 3], ")") && all_.isSettled(condition[i + 2].text);
        if (!isCall)
            continue;
        const auto* const meaning = readMade(all_.meaningOf(condition[i].text, condition[i + 2].text));
        if (meaning == nullptr)
            continue;
        for (const std::string_view name : meaning->names)
            if (names.insert(name).second)
                readMade(all_.absenceOf(name, false));
    }
    for (const std::size_t item : all_.relatedTo(names))
        read(all_[item]);
}

/// Keeps and reads an assumption that was made for a name or a call; nullptr for nothing.
const BuildAssumptions::Item* FileAssumptions::readMade(std::optional<BuildAssumptions::Item> item) {
    if (!item)
        return nullptr;
    const std::string line = *item->line;
    const BuildAssumptions::Item& kept = made_.try_emplace(line, *std::move(item)).first->second;
    read(kept);
    return &kept;
}

void FileAssumptions::read(const BuildAssumptions::Item& item) {
    std::uint64_t epoch = 0;
    const bool isChanged = std::ranges::any_of(item.names, [&](std::string_view name) {
        const MacroStates::State state = states_.stateOf(states_.nameOf(name));
        epoch = std::max(epoch, state.epoch);
        return state.version != 0 || state.derived || state.varies;
    });
    if (isChanged || !read_.emplace(&item, epoch).second)
        return;
    const std::vector<DirectiveToken> tokens = BuildAssumptions::tokensOf(item);
    Directive directive{};
    directive.kind = DirectiveKind::If;
    directive.tokens = tokens;
    facts_.push_back({&item, reader_.read(directive)});
    for (const MacroUnknownId unknown : facts_.back().condition.unknowns)
        if (all_.leadsTo(states_.textOf(unknowns_[unknown].subject), item))
            byGroup_[unknowns_[unknown].group].push_back(facts_.size() - 1);
}

bool FileAssumptions::concern(const std::vector<MacroUnknownId>& unknowns) const {
    return std::ranges::any_of(unknowns,
                               [&](MacroUnknownId unknown) { return byGroup_.contains(unknowns_[unknown].group); });
}

std::vector<std::size_t> FileAssumptions::relatedTo(const std::vector<MacroUnknownId>& unknowns) const {
    std::vector<std::size_t> found;
    std::set<std::size_t> isFound;
    const auto addAbout = [&](MacroUnknownId unknown) {
        const auto about = byGroup_.find(unknowns_[unknown].group);
        if (about == byGroup_.end())
            return;
        for (const std::size_t fact : about->second)
            if (found.size() < limits::relatedAssumptions && isFound.insert(fact).second)
                found.push_back(fact);
    };
    std::ranges::for_each(unknowns, addAbout);
    std::size_t next = 0;
    while (next < found.size()) // which grows
        std::ranges::for_each(facts_[found[next++]].condition.unknowns, addAbout);
    return found;
}

} // namespace VT
