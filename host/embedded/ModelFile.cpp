// Reads a model from JSON.
//
// Method: an event-driven (SAX) reader with a stack of open objects and lists, checked against a table of members.
// Ports are joined to their blocks at the end, when all blocks have their names.  A counting iterator recovers the
// place of each token, which the JSON parser does not report.
// Cost: linear in the text.
#include "host/embedded/ModelFile.hpp"

#include "host/Text.hpp"
#include "host/embedded/ModelMembers.hpp"
#include "host/embedded/TextPlaces.hpp"

#include <nlohmann/json.hpp>

#include <algorithm>
#include <array>
#include <limits>
#include <optional>
#include <unordered_set>
#include <utility>

namespace VT::Embedded {

namespace {

using Json = nlohmann::json;

constexpr std::size_t shownBytes = 80;

class Reader final : public nlohmann::json_sax<Json> {
public:
    Reader(const std::string& text, VTRootBD& model, const char*& furthest)
        : text_(text),
          model_(model),
          furthest_(furthest),
          places_(text),
          end_(text.starts_with("\xef\xbb\xbf") ? 3 : 0) {}

    void finish();

    bool null() override { refuse(); }

    bool boolean(bool) override { refuse(); }

    bool number_integer(number_integer_t value) override { return integer(value); }

    bool number_unsigned(number_unsigned_t value) override {
        return integer(
            static_cast<std::int64_t>(std::min<std::uint64_t>(value, std::numeric_limits<int>::max() + 1ULL)));
    }

    bool number_float(number_float_t, const string_t&) override { refuse(); }

    bool binary(binary_t&) override { refuse(); }

    bool string(string_t& text) override;
    bool start_object(std::size_t) override;
    bool key(string_t& name) override;
    bool end_object() override;
    bool start_array(std::size_t) override;
    bool end_array() override;
    bool parse_error(std::size_t position, const std::string& token, const Json::exception& error) override;

private:
    /// An object or a list that is being read.
    struct Open {
        Part part;
        TextPlace place;                ///< of its bracket
        VTBlock* block = nullptr;       ///< that it is, or that owns the list
        std::size_t begin = 0;          ///< of its bracket, in bytes
        std::uint64_t index = 0;        ///< elements read before, in a list
        const Member* member = nullptr; ///< whose value comes next, in an object
        std::vector<std::string_view> seen = {};
    };

    struct PendingName {
        std::string path;
        TextPlace place;
        std::string pointer;
    };

    struct PendingPort {
        std::string name;
        TextPlace place;
        std::optional<PendingName> source;
        std::vector<PendingName> destinations;
    };

    [[noreturn]] void fail(const std::string& sentence, const TextPlace& place, const std::string& pointer) const {
        throw ModelError(pointer + ": " + sentence + ".", place);
    }

    [[noreturn]] void fail(const std::string& sentence) const { fail(sentence, place_, pointer()); }

    /// Refuses a value of a type that nothing here has.
    [[noreturn]] void refuse() {
        step();
        refuseShape();
    }

    [[noreturn]] void refuseShape() const;
    void step();
    [[nodiscard]] std::string pointer() const;
    void open(Part part, VTBlock* block);
    void close();
    bool integer(std::int64_t value);
    void setText(const std::string& text);
    void setPolicy(const std::string& text);
    void endSymbol();
    void setLanguage(const std::string& text);
    const VTBlock& resolve(const PendingName& name) const;

    const std::string& text_;
    VTRootBD& model_;
    const char*& furthest_;
    Places places_;
    TextPlace place_;     ///< of the token that was read last
    std::size_t end_ = 0; ///< after it
    std::vector<Open> open_;
    std::vector<PendingPort> ports_;
    std::unordered_set<std::string> symbolNames_;
};

/// Finds the place of the token that the parser has just read.
void Reader::step() {
    std::size_t begin = end_;
    while (begin < text_.size() && std::string_view(" \t\r\n,:").find(text_[begin]) != std::string_view::npos)
        ++begin;
    end_ = std::max(begin, static_cast<std::size_t>(furthest_ - text_.data()));
    // The parser reads one byte beyond a number.
    if (begin < end_ && std::string_view("\"{}[]").find(text_[begin]) == std::string_view::npos)
        end_ = begin + 1;
    place_ = places_.of(begin, end_);
}

/// The JSON pointer of the value that is being read, of a deep one the end.
std::string Reader::pointer() const {
    constexpr std::size_t shown = 16;
    std::string pointer = open_.size() > shown ? "..." : "";
    for (std::size_t i = open_.size() > shown ? open_.size() - shown : 0; i < open_.size(); ++i) {
        if (open_[i].part == Part::Symbols) {
            pointer.append("/").append(model_.symbols().empty() ? ""
                                                                : shownText(model_.symbols().back().name, shownBytes));
        } else if (!isObject(open_[i].part)) {
            pointer.append("/").append(std::to_string(open_[i].index));
        } else if (open_[i].member != nullptr) {
            pointer.append("/").append(open_[i].member->name);
        }
    }
    return pointer.empty() ? "the model" : pointer;
}

void Reader::refuseShape() const {
    if (open_.empty())
        fail(R"(a model is an object: write {"name": ..., "blocks": [...]})");
    const Open& top = open_.back();
    fail(isObject(top.part) ? valueWanted(*top.member) : elementWanted(top.part));
}

void Reader::open(Part part, VTBlock* block) {
    open_.push_back({part, place_, block, end_ - 1});
}

void Reader::close() {
    open_.pop_back();
    if (open_.empty())
        return;
    if (isObject(open_.back().part))
        open_.back().member = nullptr;
    else
        ++open_.back().index;
}

bool Reader::start_object(std::size_t) {
    step();
    if (open_.empty()) {
        open(Part::Model, nullptr);
        return true;
    }
    const Open& top = open_.back();
    if (top.part == Part::Blocks || top.part == Part::Choices) {
        open(Part::Block, &model_.addBlock(top.block, top.part == Part::Choices));
    } else if (top.part == Part::Ports) {
        ports_.emplace_back();
        ports_.back().place = place_;
        open(Part::Port, nullptr);
    } else if (top.part == Part::Symbols) {
        open(Part::Symbol, nullptr);
    } else if (top.member != nullptr && top.member->shape == Shape::Object) {
        open(top.member->list, nullptr);
    } else {
        refuseShape();
    }
    return true;
}

bool Reader::start_array(std::size_t) {
    step();
    if (open_.empty() || open_.back().member == nullptr ||
        (open_.back().member->shape != Shape::List && open_.back().member->shape != Shape::TextOrList))
        refuseShape();
    if (open_.back().member->list == Part::Values)
        model_.lastSymbol().values.emplace();
    open(open_.back().member->list, open_.back().block);
    return true;
}

bool Reader::key(string_t& name) {
    step();
    Open& top = open_.back();
    if (top.part == Part::Symbols) {
        const bool isNew = symbolNames_.insert(name).second;
        model_.addSymbol(name, place_);
        if (!isNew)
            fail("this symbol is here twice: take one away");
        return true;
    }
    const Member* const member = memberOf(top.part, name);
    if (member == nullptr)
        fail(noMember(top.part, name));
    top.member = member;
    if (std::ranges::find(top.seen, member->name) != top.seen.end())
        fail("this member is here twice: take one away");
    top.seen.push_back(member->name);
    return true;
}

bool Reader::string(string_t& text) {
    step();
    if (open_.empty())
        refuseShape();
    Open& top = open_.back();
    if (top.part == Part::Destinations) {
        ports_.back().destinations.push_back({text, place_, pointer()});
        ++top.index;
        return true;
    }
    if (top.member == nullptr || (top.member->shape != Shape::Text && top.member->shape != Shape::TextOrList))
        refuseShape();
    setText(text);
    top.member = nullptr;
    return true;
}

void Reader::setText(const std::string& text) {
    const Open& top = open_.back();
    const std::string_view member = top.member->name;
    if (top.part == Part::Port) {
        PendingPort& port = ports_.back();
        if (member == "name")
            port.name = text;
        else if (member == "from")
            port.source = PendingName{text, place_, pointer()};
        else
            port.destinations.push_back({text, place_, pointer()});
        if (member == "name")
            port.place = place_;
    } else if (member == "name" && top.part == Part::Block) {
        if (const std::string problem = model_.nameBlock(*top.block, text, place_); !problem.empty())
            fail(problem);
    } else if (member == "name") {
        model_.setName(text);
    } else if (member == "condition") {
        top.block->setVariantCondition(text, place_);
    } else if (member == "language") {
        setLanguage(text);
    } else if (member == "policy") {
        setPolicy(text);
    }
}

void Reader::setPolicy(const std::string& text) {
    static constexpr std::array<std::string_view, 3> words{"unique", "first", "collect"}; // in the order of ChoiceRule
    const auto* const word = std::ranges::find(words, text);
    if (word == words.end())
        fail("there is no policy " + inQuotes(text) + R"(: write "unique", "first" or "collect")");
    open_.back().block->setChoiceRule(static_cast<ChoiceRule>(word - words.begin()));
}

bool Reader::integer(std::int64_t value) {
    step();
    const bool isIn = value >= std::numeric_limits<int>::min() && value <= std::numeric_limits<int>::max();
    const bool isElement = !open_.empty() && open_.back().part == Part::Values;
    const Member* const member = open_.empty() ? nullptr : open_.back().member;
    if (!isIn || !(isElement || (member != nullptr && member->shape == Shape::Integer)))
        refuseShape();
    DeclaredSymbol& symbol = model_.lastSymbol();
    if (isElement) {
        symbol.values->push_back(static_cast<int>(value));
        ++open_.back().index;
        return true;
    }
    (member->name == "min" ? symbol.min : symbol.max) = static_cast<int>(value);
    open_.back().member = nullptr;
    return true;
}

/// A symbol has at least one value.
void Reader::endSymbol() {
    const DeclaredSymbol& symbol = model_.lastSymbol();
    const auto isIn = [&](int value) {
        return (!symbol.min || value >= *symbol.min) && (!symbol.max || value <= *symbol.max);
    };
    const bool hasValue = symbol.values ? std::ranges::any_of(*symbol.values, isIn)
                                        : !symbol.min || !symbol.max || *symbol.min <= *symbol.max;
    if (!hasValue)
        fail("this symbol has no value: add one, or correct its bounds", symbol.place, pointer());
}

void Reader::setLanguage(const std::string& text) {
    if (text != "c" && text != "quill")
        fail("there is no language " + inQuotes(text) + R"(: write "c" or "quill")");
    model_.setQuill(text == "quill");
}

bool Reader::end_object() {
    const TextPlace begin = open_.back().place;
    const Part part = open_.back().part;
    const auto has = [&](std::string_view name) {
        return std::ranges::find(open_.back().seen, name) != open_.back().seen.end();
    };
    for (const std::string_view needed : {"name", "from"}) {
        if ((part == Part::Block && needed == "name") || part == Part::Port)
            if (!has(needed))
                fail(std::string(nameOf(part)) + " without " + inQuotes(needed) + ": add it", begin, pointer());
    }
    if (part == Part::Symbol)
        endSymbol();
    step();
    if (part == Part::Block)
        open_.back().block->setTextRange({open_.back().begin, end_});
    close();
    return true;
}

bool Reader::end_array() {
    step();
    close();
    return true;
}

bool Reader::parse_error(std::size_t position, const std::string&, const Json::exception& error) {
    // "[...] parse error at line 1, column 2: while ... - what is wrong"
    std::string sentence = error.what();
    if (const std::size_t colon = sentence.find(": "); colon != std::string::npos)
        sentence.erase(0, colon + 2);
    const std::size_t at = std::min(position == 0 ? 0 : position - 1, text_.size());
    throw ModelError("This is not JSON: " + shownText(sentence, 4 * shownBytes) + ".", Places(text_).of(at, at));
}

const VTBlock& Reader::resolve(const PendingName& name) const {
    const VTBlock* const block = model_.find(name.path);
    if (block == nullptr)
        fail("there is no block " + inQuotes(name.path) + ": write the names from the top, separated by \"/\"",
             name.place, name.pointer);
    return *block;
}

/// Joins the ports to their blocks once all have their names.
void Reader::finish() {
    for (const PendingPort& port : ports_) {
        const VTBlock& source = resolve(*port.source);
        std::vector<const VTBlock*> destinations;
        for (const PendingName& destination : port.destinations)
            destinations.push_back(&resolve(destination));
        model_.addPort({port.name, source, std::move(destinations), port.place});
    }
}

} // namespace

void readModel(const std::string& json, VTRootBD& model) {
    const char* furthest = json.data();
    Reader reader(json, model, furthest);
    Json::sax_parse(CountingIterator(json.data(), furthest), CountingIterator(json.data() + json.size(), furthest),
                    &reader);
    reader.finish();
}

} // namespace VT::Embedded
