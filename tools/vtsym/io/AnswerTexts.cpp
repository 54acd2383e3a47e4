// Answers texts one after another, or many lines at once.  Every line of standard input is answered by one line,
// whatever happens, so that a caller can pair them; an error leaves an empty line, or an object with `"error"`.
//
// Method: lines form chunks, by their number and bytes alone.  A chunk is answered as if nothing had been before it but
// the steps that its questions may still take, so that it does not matter which thread does that, and when.  Chunks
// that are read together are answered ahead of their turn with a number of steps that stands for enough of them; where
// that may have been more than there were, or was too little, the chunk is answered again when it is its turn.
//
// Answers are flushed whenever the next read would wait, so that another program can hold a dialogue.  Memory is
// bounded by the longest line, of which at most mostBytes are kept, and by what is read at once.
#include "tools/vtsym/io/Texts.hpp"

#include "tools/vtsym/io/ErrorText.hpp"
#include "tools/vtsym/io/Files.hpp"
#include "tools/vtsym/io/InOrder.hpp"
#include "tools/vtsym/io/Json.hpp"

#include <algorithm>
#include <array>
#include <atomic>
#include <cerrno>
#include <cstdint>
#include <cstring>
#include <limits>
#include <memory>
#include <poll.h>
#include <string_view>
#include <unistd.h>
#include <utility>
#include <vector>

namespace vtsym {

namespace {

/// Bytes that are kept of a line that is too long, to show which line it is.
constexpr std::size_t shownOfLong = 80;

// A chunk ends with the line that makes it as large as one of these.
constexpr std::size_t chunkLines = 128;
constexpr std::size_t chunkBytes = std::size_t{1} << 16U;

/// Bytes of lines that are read before they are answered.
constexpr std::size_t batchBytes = std::size_t{1} << 22U;

/// A text to answer.
struct AskedText {
    std::string text;
    bool isWhole = true;
    bool beginsChunk = false;
};

/// Answers, and the messages after the last of them.
struct Answered {
    std::string out;
    std::string err;
};

/// Answers texts in one thread at a time.
class Answerer {
public:
    Answerer(bool json, const Style& errStyle, Answering answering)
        : json_(json),
          errStyle_(errStyle),
          answering_(std::move(answering)) {}

    [[nodiscard]] const std::optional<TextSteps>& steps() const noexcept { return answering_.steps; }

    /// Goes on as if nothing had been before.
    void begin(std::uint64_t steps) {
        if (answering_.begin)
            answering_.begin(steps);
    }

    /// Appends the answer to a text with its number, from 1.  Returns whether there was one.
    bool answer(const AskedText& asked, std::uint64_t line, std::vector<Answered>& to);

private:
    [[nodiscard]] std::string warnings(std::uint64_t line) const;

    bool json_;
    const Style& errStyle_;
    Answering answering_;
};

bool Answerer::answer(const AskedText& asked, std::uint64_t line, std::vector<Answered>& to) {
    if (to.empty() || !to.back().err.empty())
        to.emplace_back();
    auto& [out, messages] = to.back();
    if (answering_.inBlocks && line > 1)
        out += '\n';
    if (json_)
        out.append("{\"line\":").append(std::to_string(line));
    const std::size_t begin = out.size();
    bool isAnswered = true;
    if (json_ && !answering_.writesInput)
        appendMember(out, "input", jsonString(asked.text));
    try {
        if (!asked.isWhole)
            throw CommandError("The line is longer than " + sizeText(mostBytes) + ": split it.");
        answering_.answer(asked.text, out);
        messages = warnings(line);
    } catch (...) {
        const std::vector<TextError> errors = currentTextErrors();
        isAnswered = false;
        out.resize(begin);
        if (json_) {
            appendMember(out, "input", jsonString(asked.text));
            appendMember(out, "error", jsonOf(errors));
        } else {
            messages = errorLines(line, asked.text, errors, errStyle_);
        }
    }
    out += json_ ? "}\n" : "\n";
    return isAnswered;
}

std::string Answerer::warnings(std::uint64_t line) const {
    std::string lines;
    if (answering_.warnings != nullptr)
        for (const std::string& warning : *answering_.warnings)
            lines += warningLine(line, warning, errStyle_);
    return lines;
}

/// A chunk on its way.
struct Chunk {
    std::size_t first = 0;  ///< of the texts that wait
    std::uint64_t line = 0; ///< of its first text
    std::size_t size = 0;
    std::vector<Answered> answers;
    bool allAnswered = true;
    bool isAnswered = false; ///< ahead of its turn
    std::uint64_t left = 0;  ///< of the steps ahead, in the end
    std::uint64_t least = 0; ///< that were left between texts
};

/// All texts of a command.
class TextRun {
public:
    TextRun(const TextOptions& options, Console& console, const MakeAnswering& make)
        : json_(options.json),
          console_(console),
          make_(make),
          jobs_(options.jobs == 0 ? processors() : options.jobs),
          turn_(json_, console.errStyle(), make()),
          ahead_(jobs_),
          left_(turn_.steps() ? turn_.steps()->atFirst : 0) {}

    /// Takes a text, and answers those that have waited once they are many.
    void ask(std::string text, bool isWhole = true);

    /// Answers all that wait.
    void answerAll() { answerWaiting(true); }

    [[nodiscard]] bool allAnswered() const noexcept { return allAnswered_; }

private:
    void answerWaiting(bool toTheEnd);
    void answerInTurn(std::size_t first, std::size_t end);
    void answerAhead(Chunk& chunk, std::size_t worker);
    void finish(Chunk& chunk);
    [[nodiscard]] std::size_t chunkEnd(std::size_t begin) const;
    void write(const std::vector<Answered>& answers);

    bool json_;
    Console& console_;
    const MakeAnswering& make_;
    std::size_t jobs_;
    Answerer turn_;                                ///< answers what it is the turn of
    std::vector<std::unique_ptr<Answerer>> ahead_; ///< by worker, made by it
    std::uint64_t left_;                           ///< steps, before the next text
    std::atomic<bool> isShort_ = false;            ///< so few are left that nothing is answered ahead
    std::vector<AskedText> waiting_;
    std::size_t waitingBytes_ = 0;
    std::size_t linesOfChunk_ = 0; ///< of the last chunk that waits, or was answered
    std::size_t bytesOfChunk_ = 0;
    std::uint64_t line_ = 0; ///< answered
    bool allAnswered_ = true;
};

void TextRun::ask(std::string text, bool isWhole) {
    const bool beginsChunk = linesOfChunk_ == 0;
    ++linesOfChunk_;
    bytesOfChunk_ += text.size();
    waitingBytes_ += text.size() + 1;
    waiting_.push_back({std::move(text), isWhole, beginsChunk});
    if (linesOfChunk_ == chunkLines || bytesOfChunk_ >= chunkBytes)
        linesOfChunk_ = bytesOfChunk_ = 0;
    if (waitingBytes_ >= batchBytes)
        answerWaiting(false);
}

/// The position after the chunk of a text that waits.
std::size_t TextRun::chunkEnd(std::size_t begin) const {
    const auto next = std::find_if(waiting_.begin() + static_cast<std::ptrdiff_t>(begin) + 1, waiting_.end(),
                                   [](const AskedText& text) { return text.beginsChunk; });
    return static_cast<std::size_t>(next - waiting_.begin());
}

/// Answers what waits; not the last chunk where it may go on, unless `toTheEnd`.
void TextRun::answerWaiting(bool toTheEnd) {
    const std::uint64_t answered = line_;
    std::size_t at = 0;
    if (!waiting_.empty() && !waiting_.front().beginsChunk) { // its beginning is answered
        at = chunkEnd(0);
        answerInTurn(0, at);
    }
    std::vector<Chunk> slots(slotsFor(jobs_));
    OrderedWork work;
    work.next = [&](std::size_t slot) {
        if (at == waiting_.size())
            return false;
        const std::size_t end = chunkEnd(at);
        if (end == waiting_.size() && linesOfChunk_ != 0) // it may go on
            return false;
        slots[slot] = {};
        slots[slot].first = std::exchange(at, end);
        slots[slot].size = end - slots[slot].first;
        slots[slot].line = answered + slots[slot].first + 1;
        return true;
    };
    work.work = [&](std::size_t slot, std::size_t worker) {
        if (jobs_ > 1)
            answerAhead(slots[slot], worker);
    };
    work.finish = [&](std::size_t slot) { finish(slots[slot]); };
    runInOrder(jobs_, work);
    if (toTheEnd || at == 0) {
        answerInTurn(at, waiting_.size());
        at = waiting_.size();
    }
    waiting_.erase(waiting_.begin(), waiting_.begin() + static_cast<std::ptrdiff_t>(at));
    waitingBytes_ = 0;
    for (const AskedText& text : waiting_)
        waitingBytes_ += text.text.size() + 1;
}

void TextRun::answerInTurn(std::size_t first, std::size_t end) {
    for (std::size_t at = first; at < end; ++at) {
        if (waiting_[at].beginsChunk)
            turn_.begin(left_);
        console_.working(++line_);
        std::vector<Answered> answers;
        allAnswered_ = turn_.answer(waiting_[at], line_, answers) && allAnswered_;
        if (turn_.steps())
            left_ = turn_.steps()->left();
        write(answers);
    }
}

void TextRun::answerAhead(Chunk& chunk, std::size_t worker) {
    if (isShort_)
        return;
    if (!ahead_[worker])
        ahead_[worker] = std::make_unique<Answerer>(json_, console_.errStyle(), make_());
    Answerer& answerer = *ahead_[worker];
    const std::optional<TextSteps>& steps = answerer.steps();
    answerer.begin(steps ? steps->spare + steps->ahead : 0);
    chunk.least = std::numeric_limits<std::uint64_t>::max();
    for (std::size_t i = 0; i < chunk.size; ++i) {
        const bool isAnswered = answerer.answer(waiting_[chunk.first + i], chunk.line + i, chunk.answers);
        chunk.allAnswered = chunk.allAnswered && isAnswered;
        if (!steps)
            continue;
        chunk.left = steps->left();
        chunk.least = std::min(chunk.least, chunk.left);
        if (chunk.least < steps->spare)
            return;
    }
    chunk.isAnswered = true;
}

/// Writes the answers of a chunk.
void TextRun::finish(Chunk& chunk) {
    const std::optional<TextSteps>& steps = turn_.steps();
    if (steps && chunk.isAnswered) {
        // What would have been left, had the chunk begun with what is left: if that is enough, answers are the same.
        const std::uint64_t given = steps->spare + steps->ahead;
        const std::uint64_t taken = given > chunk.least ? given - chunk.least : 0;
        chunk.isAnswered = left_ >= taken + steps->spare;
    }
    if (!chunk.isAnswered) {
        answerInTurn(chunk.first, chunk.first + chunk.size);
    } else {
        if (steps)
            left_ = left_ + chunk.left - (steps->spare + steps->ahead);
        line_ += chunk.size;
        console_.working(line_);
        allAnswered_ = allAnswered_ && chunk.allAnswered;
        write(chunk.answers);
    }
    isShort_ = steps && left_ < steps->spare + steps->ahead;
    chunk.answers.clear();
}

void TextRun::write(const std::vector<Answered>& answers) {
    for (const Answered& each : answers) {
        console_.out(each.out);
        if (!each.err.empty())
            console_.err(each.err);
    }
}

/// The line of standard input being read.
struct InputLine {
    std::string text;
    bool begun = false;
    bool isWhole = true;

    void append(std::string_view part) {
        begun = true;
        isWhole = isWhole && part.size() <= mostBytes - text.size();
        if (isWhole)
            text.append(part);
        else if (text.size() > shownOfLong)
            text = text.substr(0, shownOfLong);
    }
};

/// Whether reading would wait.
bool wouldWait() {
    pollfd input{STDIN_FILENO, POLLIN, 0};
    return poll(&input, 1, 0) == 0;
}

/// Answers every line of standard input.  Returns 0, or the error that ended reading.  Answers all lines so far before
/// it waits for more input.
int answerLines(TextRun& run, Console& console) {
    std::vector<char> buffer(std::size_t{1} << 16U);
    InputLine line;
    int error = 0;
    for (;;) {
        if (wouldWait()) {
            run.answerAll();
            console.flush();
            console.waiting();
        }
        const ssize_t got = read(STDIN_FILENO, buffer.data(), buffer.size());
        if (got < 0 && errno == EINTR)
            continue;
        error = got < 0 ? errno : 0;
        if (got <= 0)
            break;
        std::string_view rest(buffer.data(), static_cast<std::size_t>(got));
        for (std::size_t end = rest.find('\n'); end != std::string_view::npos; end = rest.find('\n')) {
            line.append(rest.substr(0, end));
            rest.remove_prefix(end + 1);
            if (line.text.ends_with('\r'))
                line.text.pop_back();
            run.ask(std::move(line.text), line.isWhole);
            line = {};
        }
        if (!rest.empty())
            line.append(rest);
    }
    if (line.begun && error == 0)
        run.ask(std::move(line.text), line.isWhole);
    run.answerAll();
    return error;
}

} // namespace

bool answerTexts(const TextOptions& options, Console& console, const MakeAnswering& make) {
    TextRun run(options, console, make);
    bool allRead = true;
    const auto readInput = [&] {
        if (const int error = answerLines(run, console)) {
            console.err(std::string("vtsym: standard input cannot be read: ") + std::strerror(error) + "\n");
            allRead = false;
        }
    };
    if (options.texts.empty())
        readInput();
    for (const std::string& text : options.texts) {
        if (text == "-")
            readInput();
        else
            run.ask(text);
    }
    run.answerAll();
    console.flush();
    return allRead && run.allAnswered();
}

bool answerOneByOne(const TextOptions& options, Console& console, const Answering& answering) {
    TextOptions one = options;
    one.jobs = 1;
    return answerTexts(one, console, [&] { return answering; });
}

} // namespace vtsym
