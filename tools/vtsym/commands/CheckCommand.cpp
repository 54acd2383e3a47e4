// vtsym check
#include "tools/vtsym/commands/Commands.hpp"
#include "tools/vtsym/findings/Findings.hpp"
#include "tools/vtsym/findings/ModelCheck.hpp"
#include "tools/vtsym/findings/ModelPage.hpp"
#include "tools/vtsym/io/Arguments.hpp"
#include "tools/vtsym/io/Files.hpp"
#include "tools/vtsym/io/Texts.hpp"

#include "host/embedded/ModelFile.hpp"

namespace vtsym {

namespace {

constexpr const char* examples =
    R"(A model is a JSON file of blocks in blocks; the choices of a block are alternatives, each with a condition of its own.
docs/model.schema.json describes it.  Every finding is proven; conditions are over integers without bounds.

The exit status is 0 where nothing was found, 1 where something was, and 2 where the model could not be read, something
could not be decided, or the page could not be written.

Examples:
  vtsym check model.json
  vtsym check --html page.html model.json
  vtsym check --sarif model.json > findings.sarif)";

constexpr std::array<FindingRule, 5> rules{{
    {"dead", "A block is never active.",
     "The condition cannot hold where those of the blocks around it hold. Correct the condition, or take the block "
     "away."},
    {"always-active", "A block is always active.",
     "The condition holds wherever those of the blocks around it hold. Take the condition away, or correct it."},
    {"redundant", "A condition has an operand that can go.",
     "Wherever the blocks around it are active, the condition means the same without the operand. Write the shorter "
     "one."},
    {"overlapping", "Two choices are active at once.",
     "An assignment makes the conditions of two choices hold together. Make one condition exclude the other."},
    {"missing", "No choice is active.",
     "An assignment makes the block active and none of its choices. Add a choice for it, or a \"(default)\" one."},
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

Command addCheck(CLI::App& program) {
    CLI::App* const command = program.add_subcommand("check", "Check the choices of a model against each other");
    const auto options = std::make_shared<CheckOptions>();
    addArgument(*command, "MODEL", options->file, "File of the model")->required();
    addArgument(*command, "--html", options->page, "Write a page that shows how the choices stand to each other")
        ->type_name("FILE");
    addSizeOption(*command, options->mostBytes);
    addFormOptions(*command, options->form);
    addBitsOption(*command, options->bits32);
    command->footer(examples);
    return {command, [options](Console& console) { return check(*options, console); }, SearchResult::Failed};
}

} // namespace vtsym
