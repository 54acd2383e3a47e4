// Reads the settings of a project as `vtsym scan` does, and keeps the scanner from one change to the next.
#include "tools/vtsym/lsp/ProjectFolder.hpp"

#include "tools/vtsym/findings/SourceFiles.hpp"
#include "tools/vtsym/io/CommandLine.hpp"
#include "tools/vtsym/lsp/SourceMarks.hpp"

#include <algorithm>
#include <limits>
#include <system_error>

namespace vtsym {

namespace fs = std::filesystem;

namespace {

std::optional<fs::file_time_type> writtenAt(const std::string& path) {
    std::error_code error;
    const fs::file_time_type time = fs::last_write_time(path, error);
    return error ? std::nullopt : std::optional(time);
}

} // namespace

ProjectFolder::ProjectFolder(std::string folder, Problem problem)
    : folder_(std::move(folder)),
      problem_(std::move(problem)) {
    while (folder_.size() > 1 && folder_.ends_with('/'))
        folder_.pop_back();
    read();
}

bool ProjectFolder::holds(const std::string& path) const {
    return !folder_.empty() && path.starts_with(folder_) &&
           (folder_ == "/" || path.size() == folder_.size() || path[folder_.size()] == '/');
}

std::string ProjectFolder::relative(const std::string& path) const {
    if (!holds(path) || path.size() <= folder_.size() + 1)
        return path;
    return path.substr(folder_ == "/" ? 1 : folder_.size() + 1);
}

bool ProjectFolder::enter() const {
    std::error_code error;
    fs::current_path(folder_.empty() ? "/" : folder_, error);
    return !error;
}

void ProjectFolder::watch(const std::string& path) {
    if (!path.empty())
        sources_.push_back({path, writtenAt(path)});
}

void ProjectFolder::read() {
    settings_ = {};
    baseline_ = {};
    sources_.clear();
    try {
        if (enter() && !folder_.empty()) {
            watch(settingsName);
            if (std::error_code error; fs::is_regular_file(settingsName, error))
                settings_ = readSettings(settingsName);
            watch(settings_.compileCommands);
            watch(settings_.baseline);
            for (const std::string& path : settings_.macroFiles)
                watch(path);
        }
        settings_.why = true;
        checker_ = std::make_unique<SourceChecker>(settings_, [](const std::string&) {});
        if (!settings_.baseline.empty())
            baseline_ = Baseline::read(readFile(settings_.baseline, settings_.mostBytes));
        return;
    } catch (const FileError& error) {
        problem_(folder_ + "/" + settingsName + ": " + error.what());
    } catch (const UsageError& error) {
        problem_(folder_ + "/" + settingsName + ": " + error.what());
    }
    settings_ = {};
    settings_.why = true;
    checker_ = std::make_unique<SourceChecker>(settings_, [](const std::string&) {});
}

bool ProjectFolder::refresh() {
    if (!enter() ||
        std::ranges::all_of(sources_, [](const Source& source) { return writtenAt(source.path) == source.written; }))
        return false;
    read();
    return true;
}

DocumentAnalysis ProjectFolder::analyse(const OpenDocument& document, const std::function<void()>& ask) {
    enter();
    if (document.kind == DocumentKind::Json)
        return isModelText(document.text.text()) ? analyseModel(document)
                                                 : DocumentAnalysis{VT::ConditionalRegions({}), {}};
    if (document.kind == DocumentKind::Other || isExcluded(document.path, settings_.excluded))
        return {VT::ConditionalRegions({}), {}};
    const auto now = today();
    checker_->beforeEachCondition(ask);
    return analyseSource(*checker_, document, [&](const Finding& finding) {
        return baseline_.covers(finding, now, std::numeric_limits<std::size_t>::max());
    });
}

} // namespace vtsym
