// Wraps libedit: its callbacks find the editor's state through EL_CLIENTDATA, and Tab completes from a sorted set, in
// which the words that begin alike are neighbours.
#include "tools/vtsym/io/LineEditor.hpp"

#include <cstdio>
#include <histedit.h>
#include <stdexcept>
#include <string_view>
#include <utility>

namespace vtsym {

namespace {

constexpr int rememberedLines = 1000;

/// The beginning of a name or a command at the end of a text.
std::string lastWord(const std::string& text) {
    constexpr std::string_view letters = "abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ0123456789_.";
    std::size_t begin = text.find_last_not_of(letters);
    begin = begin == std::string::npos ? 0 : begin + 1;
    if (begin > 0 && text.find_first_not_of(" \t") == begin - 1 && text[begin - 1] == ':')
        --begin;
    return text.substr(begin);
}

} // namespace

Completion complete(const std::string& text, const std::set<std::string>& words) {
    const std::string begun = lastWord(text);
    Completion result;
    for (auto word = words.lower_bound(begun); word != words.end() && word->starts_with(begun); ++word)
        result.candidates.insert(*word);
    if (result.candidates.empty())
        return result;
    // The candidates are sorted: letters that the first and the last share are shared by all.
    const std::string& first = *result.candidates.begin();
    const std::string& last = *result.candidates.rbegin();
    std::size_t common = begun.size();
    while (common < first.size() && common < last.size() && first[common] == last[common])
        ++common;
    result.addition = first.substr(begun.size(), common - begun.size());
    return result;
}

struct LineEditor::State {
    State(std::string text, std::function<const std::set<std::string>&()> source);
    State(const State&) = delete;
    State& operator=(const State&) = delete;

    ~State() {
        history_end(history);
        el_end(editor);
    }

    static unsigned char completeHere(EditLine* editor, wint_t key);
    void list(const std::set<std::string>& candidates) const;

    std::string prompt;
    std::function<const std::set<std::string>&()> words;
    EditLine* editor;
    History* history;
    HistEvent event{};
};

LineEditor::State::State(std::string text, std::function<const std::set<std::string>&()> source)
    : prompt(std::move(text)),
      words(std::move(source)),
      editor(el_init("vtsym", stdin, stdout, stderr)),
      history(editor != nullptr ? history_init() : nullptr) {
    if (history == nullptr) {
        if (editor != nullptr)
            el_end(editor);
        throw std::runtime_error("the terminal cannot be used: set TERM to its kind, or pipe the lines in");
    }
    ::history(history, &event, H_SETSIZE, rememberedLines);
    ::history(history, &event, H_SETUNIQUE, 1);
    el_set(editor, EL_CLIENTDATA, this);
    el_set(
        editor, EL_PROMPT, +[](EditLine* asking) {
            State* state = nullptr;
            el_get(asking, EL_CLIENTDATA, &state);
            return state->prompt.data();
        });
    el_set(editor, EL_EDITOR, "emacs");
    el_set(editor, EL_SIGNAL, 1);
    el_set(editor, EL_HIST, ::history, history);
    el_wset(editor, EL_ADDFN, L"complete", L"Complete a name", &completeHere); // el_set leaks copies of its texts
    el_set(editor, EL_BIND, "^I", "complete", nullptr);
    el_source(editor, nullptr);
}

unsigned char LineEditor::State::completeHere(EditLine* editor, wint_t) {
    State* state = nullptr;
    el_get(editor, EL_CLIENTDATA, &state);
    const LineInfo* const line = el_line(editor);
    const Completion completion = complete(std::string(line->buffer, line->cursor), state->words());
    if (!completion.addition.empty())
        return el_insertstr(editor, completion.addition.c_str()) == 0 ? CC_REFRESH : CC_ERROR;
    if (completion.candidates.size() < 2)
        return CC_ERROR;
    state->list(completion.candidates);
    return CC_REDISPLAY;
}

void LineEditor::State::list(const std::set<std::string>& candidates) const {
    std::string row = "\n";
    for (const std::string& word : candidates)
        row.append(word).append("  ");
    row.append("\n");
    std::fwrite(row.data(), 1, row.size(), stdout);
    std::fflush(stdout);
}

LineEditor::LineEditor(std::string prompt, std::function<const std::set<std::string>&()> words)
    : state_(std::make_unique<State>(std::move(prompt), std::move(words))) {}

LineEditor::~LineEditor() = default;

std::optional<std::string> LineEditor::read() {
    int count = 0;
    const char* const line = el_gets(state_->editor, &count);
    if (line == nullptr || count <= 0)
        return std::nullopt;
    std::string text(line, static_cast<std::size_t>(count));
    while (text.ends_with('\n') || text.ends_with('\r'))
        text.pop_back();
    if (text.find_first_not_of(" \t") != std::string::npos)
        ::history(state_->history, &state_->event, H_ENTER, text.c_str());
    return text;
}

} // namespace vtsym
