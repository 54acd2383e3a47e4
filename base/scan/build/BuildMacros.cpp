// The macros of a build.
//
// Method: definitions are kept as tokens.  A file of definitions is interpreted: a chain of branches whose conditions
// have values is followed, and what a branch of unknown value changes is forgotten.
// Cost: linear in the texts.
#include "base/scan/build/BuildMacros.hpp"

#include "base/scan/DirectiveCondition.hpp"
#include "base/scan/MacroBody.hpp"
#include "base/scan/report/DirectiveTexts.hpp"

#include <algorithm>

namespace VT {

namespace {

/// The tokens of a line, which begins with a directive of any kind.
std::vector<DirectiveToken> tokensOf(const std::string& line) {
    DirectiveReader reader(line);
    Directive directive{};
    if (!reader.next(directive))
        return {};
    return {directive.tokens.begin(), directive.tokens.end()};
}

bool isName(const DirectiveToken& token) {
    return token.kind == DirectiveTokenKind::Name && !isOddName(token);
}

/// Whether a branch is read: a condition may have no value.
enum class Reading : std::uint8_t { No, Maybe, Yes };

/// The chains of branches around a place in a file of definitions.
class Branches {
public:
    [[nodiscard]] Reading reading() const { return open_.empty() ? Reading::Yes : open_.back().reading; }

    void open() { open_.push_back({reading(), Reading::No, Reading::No}); }

    [[nodiscard]] bool isOpen() const { return !open_.empty(); }

    /// Begins the next branch of the innermost chain.
    void next(std::optional<bool> condition) {
        Chain& chain = open_.back();
        const Reading own = !condition ? Reading::Maybe : *condition ? Reading::Yes : Reading::No;
        const Reading left = chain.earlier == Reading::Yes  ? Reading::No
                             : chain.earlier == Reading::No ? Reading::Yes
                                                            : Reading::Maybe;
        chain.reading = std::min({chain.around, own, left});
        chain.earlier = std::max(chain.earlier, own);
    }

    void close() { open_.pop_back(); }

private:
    struct Chain {
        Reading around;
        Reading reading; ///< the branch
        Reading earlier; ///< one of those before it, or itself
    };

    std::vector<Chain> open_;
};

/// The text of a macro's definition as one line of a file.
std::string definitionLine(std::span<const DirectiveToken> tokens) {
    return "#define " + spelledTokens(tokens);
}

} // namespace

void BuildMacros::set(std::string name, Macro macro) {
    key_.append(macro.isDefined ? "+" : "-").append(name).append(macro.isFunction ? "(" : " ");
    key_.append(spelledTokens(macro.body)).push_back('\n');
    macros_[std::move(name)] = std::move(macro);
}

/// Adds a definition: its text after #define.  The tokens are views of a line that begins with it.
bool BuildMacros::add(std::string_view definition, BuildPlace place) {
    auto text = std::make_shared<const std::string>("#define " + std::string(definition));
    const std::vector<DirectiveToken> tokens = tokensOf(*text);
    if (tokens.empty() || !isName(tokens.front()))
        return false;
    Macro macro{.isDefined = true, .place = std::move(place)};
    std::span<const DirectiveToken> rest = std::span(tokens).subspan(1);
    macro.isFunction = !rest.empty() && rest.front().text == "(" && !rest.front().afterBlank;
    if (macro.isFunction) {
        const auto close = std::ranges::find(rest, ")", &DirectiveToken::text);
        rest = rest.subspan(std::min<std::size_t>(static_cast<std::size_t>(close - rest.begin()) + 1, rest.size()));
    }
    macro.body.assign(rest.begin(), rest.end());
    texts_.push_back(std::move(text));
    set(std::string(tokens.front().text), std::move(macro));
    return true;
}

bool BuildMacros::define(std::string_view text) {
    const std::string shown = quotedDirective("-D" + std::string(text));
    const std::size_t equals = text.find('=');
    std::string definition(text.substr(0, equals));
    definition.append(" ").append(equals == std::string_view::npos ? "1" : text.substr(equals + 1));
    return add(definition, {{}, 0, shown});
}

bool BuildMacros::undefine(std::string_view name) {
    const std::string line = "#undef " + std::string(name);
    const std::vector<DirectiveToken> tokens = tokensOf(line);
    if (tokens.size() != 1 || !isName(tokens.front()))
        return false;
    set(std::string(name), {.place = {{}, 0, "-U" + std::string(name)}});
    return true;
}

void BuildMacros::addFile(const std::string& name, std::string_view text, bool isCpp) {
    key_.append("file ").append(name).push_back('\n');
    if (hasManyReadings(text)) {
        macros_.clear();
        return;
    }
    const auto lookup = [this](std::string_view macro) { return find(macro); };
    Branches branches;
    Budget budget;
    DirectiveReader reader(text);
    for (Directive directive; reader.next(directive);) {
        const std::span<const DirectiveToken> tokens = directive.tokens;
        const auto isDefined = [&]() -> std::optional<bool> {
            const Macro* const macro = tokens.empty() ? nullptr : find(tokens.front().text);
            return macro == nullptr ? std::nullopt : std::optional(macro->isDefined);
        };
        const auto holds = [&]() -> std::optional<bool> {
            const auto value = valueOf(tokens, lookup, isCpp, budget);
            return value ? std::optional(value->bits != 0) : std::nullopt;
        };
        const auto opposite = [](std::optional<bool> value) { return value ? std::optional(!*value) : value; };
        const auto next = [&](std::optional<bool> condition) {
            if (branches.isOpen())
                branches.next(condition);
        };
        switch (directive.kind) {
        case DirectiveKind::If:
            branches.open();
            next(holds());
            break;
        case DirectiveKind::Ifdef:
            branches.open();
            next(isDefined());
            break;
        case DirectiveKind::Ifndef:
            branches.open();
            next(opposite(isDefined()));
            break;
        case DirectiveKind::Elif:
            next(holds());
            break;
        case DirectiveKind::Elifdef:
            next(isDefined());
            break;
        case DirectiveKind::Elifndef:
            next(opposite(isDefined()));
            break;
        case DirectiveKind::Else:
            next(true);
            break;
        case DirectiveKind::Endif:
            if (branches.isOpen())
                branches.close();
            break;
        case DirectiveKind::Include:
            if (branches.reading() != Reading::No)
                forgetUndefined();
            break;
        case DirectiveKind::Pragma:
            if (branches.reading() != Reading::No && pragmaChangesMacros(tokens))
                macros_.clear();
            break;
        case DirectiveKind::Define:
        case DirectiveKind::Undef: {
            if (branches.reading() == Reading::No || tokens.empty())
                break;
            const bool defines = directive.kind == DirectiveKind::Define;
            if (!isName(tokens.front()))
                macros_.clear();
            else if (branches.reading() == Reading::Maybe)
                macros_.erase(std::string(tokens.front().text));
            else if (defines)
                add(spelledTokens(tokens), {name, directive.line, quotedDirective(definitionLine(tokens))});
            else
                set(std::string(tokens.front().text),
                    {.place = {name, directive.line, "#undef " + std::string(tokens.front().text)}});
            break;
        }
        }
    }
}

void BuildMacros::forgetUndefined() {
    std::erase_if(macros_, [](const auto& each) { return !each.second.isDefined; });
    key_.append("known\n");
}

const BuildMacros::Macro* BuildMacros::find(std::string_view name) const {
    const auto known = macros_.find(std::string(name));
    return known == macros_.end() ? nullptr : &known->second;
}

} // namespace VT
