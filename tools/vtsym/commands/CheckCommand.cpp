// vtsym check: reads models, runs ModelCheck on them, and writes the findings and, if wanted, a page.
// A model that cannot be read, a page that cannot be written and an undecided question end with status 2.
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/findings/Findings.hpp"
#include "tools/vtsym/findings/ModelCheck.hpp"
#include "tools/vtsym/findings/ModelPage.hpp"
#include "tools/vtsym/findings/ModelRemovals.hpp"
#include "tools/vtsym/io/CommandLine.hpp"
#include "tools/vtsym/io/Files.hpp"
#include "tools/vtsym/io/InOrder.hpp"
#include "tools/vtsym/io/Texts.hpp"

#include "host/embedded/ModelFile.hpp"

#include <algorithm>
#include <functional>
#include <memory>
#include <unordered_set>
#include <utility>

namespace vtsym {

namespace {

constexpr const char* checkNotes =
    R"(A model is a JSON file of nested blocks; wherever a block is active, exactly one of its choices should be.
docs/model.schema.json describes the file.  Every finding is proven, over integers without bounds unless --bits is given.

Exit status: 0 no findings, 1 findings, 2 the model could not be read, a question could not be decided, or the page could
not be written.

Examples:
  vtsym check model.json
  vtsym check --why --merge model.json
  vtsym check --html page.html model.json
  vtsym check --sarif model.json > findings.sarif)";

constexpr std::array<FindingRule, 6> checkRules{{
    {"dead", "A block is never active.",
     "The condition contradicts those of the blocks around it. Correct the condition, or remove the block."},
    {"always-active", "A block is always active.",
     "The conditions of the blocks around it imply the condition. Remove the condition, or correct it."},
    {"redundant", "A condition has a redundant operand.",
     "Wherever the blocks around it are active, the condition has the same value without the operand. Write the "
     "shorter condition."},
    {"overlapping", "Two choices are active at once.",
     "An assignment makes the conditions of two choices hold together. Let one condition exclude the other."},
    {"missing", "No choice is active.",
     "An assignment makes the block active, but no choice of it. Add a choice, or one with \"(default)\"."},
    {"mergeable", "Choices can be one.",
     "Together the conditions of the choices are one comparison, or an And. Write them as one choice if they select "
     "the "
     "same."},
}};

struct CheckOptions {
    std::vector<std::string> files;
    std::string page;
    FindingForm form = FindingForm::Compiler;
    std::size_t mostBytes = vtsym::mostBytes;
    bool fix = false;
    std::size_t jobs = 0; ///< 0 for all processors
    ModelCheckOptions check;
};

void writePage(const std::string& path, const std::string& page, FindingWriter& writer) {
    try {
        writeFile(path, page);
    } catch (const FileError& error) {
        writer.problem({path, 0, 0, 0, 0, {}}, error.what());
    }
}

/// Writes the model without redundant operands and dead choices.
void fix(const std::string& path, const std::string& text, const VTRootBD& model, const ModelCheck& check,
         FindingWriter& writer) {
    const std::unordered_set<const VTBlock*> joined = joinedBlocks(model);
    std::vector<Removal> removals;
    std::vector<Fix> fixes;
    const auto collect = [&](const std::vector<Finding>& findings) {
        for (const Finding& finding : findings)
            if (finding.fix)
                fixes.push_back(*finding.fix);
    };
    collect(check.otherFindings());
    for (const ModelCheck::ChoiceSet& set : check.choiceSets()) {
        collect(set.findings);
        for (const RemovableChoice& choice : removableChoices(set, joined, text))
            removals.push_back(choice.removal);
    }
    if (!fixes.empty() || !removals.empty()) {
        try {
            writeFile(path, fixed(text, std::move(fixes), std::move(removals)));
        } catch (const FileError& error) {
            writer.problem({path, 0, 0, 0, 0, {}}, error.what());
        }
    }
}

/// Keeps what a listener receives, for another one.
class KeptFindings : public FindingListener {
public:
    void write(const Finding& finding) override {
        kept_.emplace_back([finding](FindingListener& to) { to.write(finding); });
    }

    void problem(const Place& place, const std::string& sentence) override {
        kept_.emplace_back([place, sentence](FindingListener& to) { to.problem(place, sentence); });
    }

    void note(const std::string& sentence) override {
        kept_.emplace_back([sentence](FindingListener& to) { to.note(sentence); });
    }

    void remark(const Place& place, std::span<const std::string> sentences, const std::string& members) override {
        const std::vector<std::string> all(sentences.begin(), sentences.end());
        kept_.emplace_back([place, all, members](FindingListener& to) { to.remark(place, all, members); });
    }

    /// Hands over what was kept.
    void pass(FindingListener& to) {
        for (const auto& each : std::exchange(kept_, {}))
            each(to);
    }

private:
    std::vector<std::function<void(FindingListener&)>> kept_;
};

/// A model on its way.
struct CheckedModel {
    std::string file;
    std::string text;
    std::unique_ptr<VTRootBD> model{};
    std::unique_ptr<ModelCheck> check{}; ///< nullptr where the model cannot be read
    KeptFindings kept{};
};

void checkModel(CheckedModel& checked, const CheckOptions& options, FindingListener& listener) {
    try {
        checked.text = readFile(checked.file, options.mostBytes);
        checked.model = std::make_unique<VTRootBD>();
        VT::Embedded::readModel(checked.text, *checked.model);
        auto check = std::make_unique<ModelCheck>(*checked.model, checked.file, options.check);
        check->run(listener);
        checked.check = std::move(check);
    } catch (const OutputError&) {
        throw;
    } catch (const VT::Embedded::ModelError& error) {
        listener.problem({checked.file, error.place().line, error.place().column, 0, 0, {}}, error.what());
    } catch (const std::runtime_error& error) {
        listener.problem({checked.file, 0, 0, 0, 0, {}}, error.what());
    }
}

SearchResult check(const CheckOptions& options, Console& console) {
    const std::unique_ptr<FindingWriter> writer = makeFindingWriter(options.form, console, checkRules);
    if (!options.page.empty() && isSameFile(options.page, options.files.front())) {
        writer->problem({options.page, 0, 0, 0, 0, {}}, "is the model: name another file for the page");
        return writer->finish();
    }
    // Models that are written are read one after another: two may be the same.
    const bool isAlone = options.fix || options.files.size() == 1;
    const std::size_t jobs = isAlone ? 1 : options.jobs == 0 ? processors() : options.jobs;
    std::vector<CheckedModel> slots(slotsFor(jobs));
    auto next = options.files.begin();
    OrderedWork work;
    work.next = [&](std::size_t slot) {
        if (next == options.files.end())
            return false;
        console.working(static_cast<std::uint64_t>(next - options.files.begin()) + 1);
        slots[slot] = {*next++, {}};
        return true;
    };
    work.work = [&](std::size_t slot, std::size_t) {
        CheckedModel& checked = slots[slot];
        checkModel(checked, options, isAlone ? static_cast<FindingListener&>(*writer) : checked.kept);
    };
    work.finish = [&](std::size_t slot) {
        CheckedModel& checked = slots[slot];
        checked.kept.pass(*writer);
        if (checked.check && options.fix)
            fix(checked.file, checked.text, *checked.model, *checked.check, *writer);
        if (checked.check && !options.page.empty())
            writePage(options.page, modelPage(*checked.model, *checked.check), *writer);
        checked.check.reset();
        checked = {};
    };
    runInOrder(jobs, work);
    return writer->finish();
}

} // namespace

void addCheck(CommandLine& program) {
    Command& command = program.add("check", "Find dead, overlapping and missing choices in a model", checkNotes);
    const auto options = std::make_shared<CheckOptions>();
    command.addArguments({"MODEL", "Files of models"},
                         [options](std::vector<std::string> files) { options->files = std::move(files); });
    command.require("MODEL");
    command.addArgument({"--html", "Write an HTML page with a matrix of the choices of each block", "FILE"},
                        options->page);
    addSizeOption(command, options->mostBytes);
    addFormOptions(command, options->form);
    addBitsOption(command, options->check.bits32);
    addAssumeOption(command, options->check.assumptions);
    command.addFlag("--why", "Say which operands force each finding, what to remove, and counted assignments",
                    options->check.why);
    command.addFlag("--merge", "Find choices that can be one", options->check.merges);
    command.addFlag("--fix", "Write the model without redundant operands and without dead choices that no port needs",
                    options->fix);
    addJobsOption(command, options->jobs);
    command.afterOptions = [options] {
        if (!options->page.empty() && options->files.size() > 1)
            throw UsageError("--html", "a page shows one model; check the others without it");
    };
    command.run = [options](Console& console) { return check(*options, console); };
    command.onError = SearchResult::Failed;
}

} // namespace vtsym
