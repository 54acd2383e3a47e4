// vtsym check: reads a model, runs ModelCheck on it, and writes the findings and, if wanted, a page.
// A model that cannot be read, a page that cannot be written and an undecided question end with status 2.
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/findings/Findings.hpp"
#include "tools/vtsym/findings/ModelCheck.hpp"
#include "tools/vtsym/findings/ModelPage.hpp"
#include "tools/vtsym/io/CommandLine.hpp"
#include "tools/vtsym/io/Files.hpp"
#include "tools/vtsym/io/Texts.hpp"

#include "host/embedded/ModelFile.hpp"

namespace vtsym {

namespace {

constexpr const char* notes =
    R"(A model is a JSON file of nested blocks; wherever a block is active, exactly one of its choices should be.
docs/model.schema.json describes the file.  Every finding is proven, over integers without bounds unless --bits is given.

Exit status: 0 no findings, 1 findings, 2 the model could not be read, a question could not be decided, or the page could
not be written.

Examples:
  vtsym check model.json
  vtsym check --html page.html model.json
  vtsym check --sarif model.json > findings.sarif)";

constexpr std::array<FindingRule, 5> rules{{
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
}};

struct CheckOptions {
    std::string file;
    std::string page;
    FindingForm form = FindingForm::Compiler;
    std::size_t mostBytes = vtsym::mostBytes;
    bool bits32 = false;
};

void writePage(const std::string& path, const std::string& page, FindingWriter& writer) {
    try {
        writeFile(path, page);
    } catch (const FileError& error) {
        writer.problem({path, 0, 0, 0, 0, {}}, error.what());
    }
}

SearchResult check(const CheckOptions& options, Console& console) {
    const std::unique_ptr<FindingWriter> writer = makeFindingWriter(options.form, console, rules);
    if (!options.page.empty() && isSameFile(options.page, options.file)) {
        writer->problem({options.page, 0, 0, 0, 0, {}}, "is the model: name another file for the page");
        return writer->finish();
    }
    try {
        console.working(1);
        VTRootBD model;
        VT::Embedded::readModel(readFile(options.file, options.mostBytes), model);
        ModelCheck modelCheck(model, options.file, options.bits32);
        modelCheck.run(*writer);
        if (!options.page.empty())
            writePage(options.page, modelPage(model, modelCheck), *writer);
    } catch (const VT::Embedded::ModelError& error) {
        writer->problem({options.file, error.place().line, error.place().column, 0, 0, {}}, error.what());
    } catch (const std::runtime_error& error) {
        writer->problem({options.file, 0, 0, 0, 0, {}}, error.what());
    }
    return writer->finish();
}

} // namespace

void addCheck(CommandLine& program) {
    Command& command = program.add("check", "Find dead, overlapping and missing choices in a model", notes);
    const auto options = std::make_shared<CheckOptions>();
    command.addArgument({"MODEL", "File of the model"}, options->file);
    command.require("MODEL");
    command.addArgument({"--html", "Write an HTML page with a matrix of the choices of each block", "FILE"},
                        options->page);
    addSizeOption(command, options->mostBytes);
    addFormOptions(command, options->form);
    addBitsOption(command, options->bits32);
    command.run = [options](Console& console) { return check(*options, console); };
    command.onError = SearchResult::Failed;
}

} // namespace vtsym
