// Command lines of the program in which one call of the system fails, or one allocation or all from one on.  Whatever
// fails, the program answers as if nothing had, or ends with the status of a failure and a message, and a file that it
// writes is the old one or the new one.
#include "tests/campaign/Campaign.hpp"
#include "tests/support/Cases.hpp"
#include "tests/support/TemporaryFolder.hpp"

#include <array>
#include <filesystem>
#include <map>
#include <numeric>
#include <sstream>
#include <vector>

namespace VT::Campaign {

namespace {

const std::array<std::string, 5> systemCalls{"open", "read", "write", "close", "rename"};

struct Outcome {
    int status = 0;
    std::string out;
    std::string err;
    std::string file;
};

/// A command line, what it does where nothing fails, and the files that it works on.
class Scenario {
public:
    Scenario(std::string script, int failure, std::string written)
        : script_(std::move(script)),
          failure_(failure),
          written_(std::move(written)) {
        prepare();
        before_ = contentOfWritten();
        usual_ = run("VTSYM_FAULT_COUNTS=" + place_.path("counts"));
        std::istringstream counts(place_.read("counts"));
        for (const char* const kind : {"open", "read", "write", "close", "rename", "memory"})
            counts >> counts_[kind];
        Fuzz::demand(counts_["memory"] > 0 && usual_.status < failure_, "a scenario works where nothing fails",
                     script_ + ": " + usual_.err);
    }

    [[nodiscard]] std::uint64_t count(const std::string& kind) const { return counts_.at(kind); }

    /// Runs with a fault: kind, number, "once" or "on".
    void judge(const std::string& fault) {
        prepare();
        const Outcome outcome = run("VTSYM_FAULT='" + fault + "'");
        const std::string details = script_ + " with " + fault + ": status " + std::to_string(outcome.status) + "\n" +
                                    outcome.err.substr(0, 1000);
        Fuzz::demand(outcome.status < 124, "no fault crashes the program or makes it hang", details);
        Fuzz::demand(outcome.file == before_ || outcome.file == usual_.file, "a file is the old one or the new one",
                     details);
        for (const auto& entry : std::filesystem::directory_iterator(place_.path("work")))
            Fuzz::demand(entry.path().extension() != ".part", "no part of a file is left", details);
        if (outcome.status == usual_.status) {
            // A server answers that it failed, and goes on.
            Fuzz::demand((outcome.out == usual_.out || saysError(outcome)) && outcome.file == usual_.file,
                         "an answer that differs has another status", details);
            return;
        }
        Fuzz::demand(outcome.status == failure_ || outcome.status == 2, "a failure has its status", details);
        Fuzz::demand(!outcome.err.empty() || saysError(outcome) || fault.starts_with("write") || fault.ends_with("on"),
                     "a failure has a message", details);
    }

private:
    static bool saysError(const Outcome& outcome) { return outcome.out.find("\"error\"") != std::string::npos; }

    void prepare() const {
        const std::string examples = VTSYM_TEST_DATA "/../../examples/";
        std::filesystem::remove_all(place_.path("work"));
        std::filesystem::create_directory(place_.path("work"));
        for (const char* const name : {"model.json", "radio.h"})
            std::filesystem::copy_file(examples + name, place_.path(std::string("work/") + name));
        place_.write("work/words", "A == 1 && A == 1\nB > 2 || !(C < 1)\nx < 3 || x > 1\n");
        std::string frames;
        for (const std::string message :
             {R"({"jsonrpc":"2.0","id":1,"method":"initialize","params":{"capabilities":{}}})",
              R"({"jsonrpc":"2.0","method":"initialized","params":{}})",
              R"({"jsonrpc":"2.0","id":2,"method":"shutdown"})", R"({"jsonrpc":"2.0","method":"exit"})"})
            frames += "Content-Length: " + std::to_string(message.size()) + "\r\n\r\n" + message;
        place_.write("work/frames", frames);
    }

    [[nodiscard]] std::string contentOfWritten() const {
        return written_.empty() ? "" : place_.read("work/" + written_);
    }

    [[nodiscard]] Outcome run(const std::string& environment) const {
        const std::string function = "vtsym() { timeout --preserve-status -k 1 20 env LC_ALL=C.UTF-8 NO_COLOR=1 " +
                                     environment + " LD_PRELOAD=" VTSYM_FAULTY_CALLS " " VTSYM_PROGRAM " \"$@\"; }\n";
        place_.write("script", function + script_ + "\n");
        Outcome outcome;
        outcome.status = place_.run("cd work && sh ../script >../out 2>../err");
        outcome.out = place_.read("out");
        outcome.err = place_.read("err");
        outcome.file = contentOfWritten();
        return outcome;
    }

    std::string script_;
    int failure_;
    std::string written_;
    Testing::TemporaryFolder place_;
    std::string before_;
    Outcome usual_;
    std::map<std::string, std::uint64_t> counts_;
};

class Faults final : public Job {
public:
    explicit Faults(bool ofMemory) {
        for (const Testing::CaseRow& row : Testing::casesOf("faults.txt", "scenarios", 3)) {
            scenarios_.push_back(std::make_unique<Scenario>(row[0], std::stoi(row[1]), row[2]));
            for (const std::string& kind : systemCalls)
                if (!ofMemory)
                    addFaults(kind, "once");
            if (ofMemory) {
                addFaults("memory", "once");
                addFaults("memory", "on");
            }
        }
        Fuzz::demand(total_ > 0, "there are calls that can fail");
    }

    void run(std::uint64_t /*seed*/, std::uint64_t item) override {
        // A step without a common divisor leaps through all of them.
        std::uint64_t step = total_ * 5 / 13 + 1;
        while (std::gcd(step, total_) != 1)
            ++step;
        std::uint64_t number = item * step % total_;
        for (const Range& range : ranges_) {
            if (number < range.count) {
                range.scenario->judge(range.kind + " " + std::to_string(number + 1) + " " + range.how);
                ++done_;
                return;
            }
            number -= range.count;
        }
    }

    [[nodiscard]] std::string figure() const override {
        return std::to_string(done_) + " of " + std::to_string(total_) + " injections in " +
               std::to_string(scenarios_.size()) + " command lines";
    }

    [[nodiscard]] std::uint64_t items() const override { return total_; }

private:
    struct Range {
        Scenario* scenario;
        std::string kind;
        std::string how;
        std::uint64_t count;
    };

    void addFaults(const std::string& kind, const std::string& how) {
        ranges_.push_back({scenarios_.back().get(), kind, how, scenarios_.back()->count(kind)});
        total_ += ranges_.back().count;
    }

    std::vector<std::unique_ptr<Scenario>> scenarios_;
    std::vector<Range> ranges_;
    std::uint64_t total_ = 0;
    std::uint64_t done_ = 0;
};

} // namespace

std::unique_ptr<Job> makeFaults(const std::string& name) {
    return std::make_unique<Faults>(name == "program-memory");
}

} // namespace VT::Campaign
