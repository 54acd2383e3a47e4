// Reads C and C++ files and prints the findings of SourceChecker, writes their fixes, or compares two states of a
// repository.
//
// Method: workers take some files at once; what they find is written in the order of the files.  Files that are written
// are read one after another.
// Cost: that of the scanner, over the processors.
#include "tools/vtsym/commands/ScanRun.hpp"

#include "base/core/Limits.hpp"
#include "tools/vtsym/findings/SourceFiles.hpp"
#include "tools/vtsym/findings/cache/ScanCache.hpp"
#include "tools/vtsym/findings/source/Baseline.hpp"
#include "tools/vtsym/findings/source/GitRepository.hpp"
#include "tools/vtsym/findings/source/Patch.hpp"
#include "tools/vtsym/findings/source/ScanRules.hpp"
#include "tools/vtsym/findings/source/SourceChanges.hpp"
#include "tools/vtsym/findings/source/SourceChecker.hpp"
#include "tools/vtsym/io/Files.hpp"
#include "tools/vtsym/io/InOrder.hpp"
#include "tools/vtsym/io/Texts.hpp"

#include <algorithm>
#include <filesystem>
#include <memory>
#include <optional>
#include <utility>
#include <vector>

namespace vtsym {

namespace {

/// Whether a path is one of those given, or below one; any where none is given.
bool isBelow(const std::string& path, const std::vector<std::string>& given) {
    return given.empty() || std::ranges::any_of(given, [&](const std::string& each) {
               const std::string above = std::filesystem::path(each).lexically_normal().string();
               const bool isFolder = above.ends_with('/');
               return above == "." || path == above || path.starts_with(isFolder ? above : above + "/");
           });
}

/// Reads a baseline; an empty one where it is to be written and is not there.
Baseline baselineAt(const std::string& path, bool mayBeMissing) {
    if (path.empty() || (mayBeMissing && !std::filesystem::exists(path)))
        return {};
    return Baseline::read(readFile(path, mostBytes));
}

/// Files that a thread takes at once: small ones cost hardly more than to be handed over.
constexpr std::size_t filesAtOnce = 8;

/// A file on its way through a scan.
struct ScannedFile {
    std::string path;
    std::string text; ///< kept where the file is to be changed
    std::string problem;
    CheckedFile checked;
    std::optional<ContentKey> key{}; ///< of a result that is to be kept
};

/// Two states of a file on their way through a comparison.
struct ComparedFile {
    std::string path;
    std::string before;
    std::string after;
    const std::vector<VT::ChangedLines>* lines = nullptr;
    std::string problem;
    std::vector<Finding> changes;
};

/// One run of the command.
class Scan {
public:
    Scan(const ScanOptions& options, Console& console)
        : options_(options),
          settings_(options.settings),
          console_(console),
          writer_(makeFindingWriter(options.form, console, scanRules())),
          jobs_(options.fix && !options.dryRun ? 1
                : options.jobs == 0            ? processors()
                                               : options.jobs),
          first_(settings_, [this](const std::string& sentence) { writer_->note(sentence); }),
          others_(jobs_ - 1) {
        if (!options.cache.empty())
            cache_.emplace(options.cache, settingsKey(settings_, first_.buildKey()),
                           [this](const std::string& sentence) { writer_->note(sentence); });
    }

    SearchResult run();
    /// Compares two states of the repository.
    SearchResult compare();

private:
    void problem(const std::string& path, const std::string& sentence) {
        writer_->problem({path, 0, 0, 0, 0, {}}, sentence);
    }

    bool readBaselines();
    SourceChecker& checkerOf(std::size_t worker);
    void read(ScannedFile& file, SourceChecker& checker) const;
    void use(ScannedFile& file);
    void scanFiles(const std::vector<std::string>& paths);
    [[nodiscard]] bool isAsked(const std::string& path) const;
    void read(GitRepository& repository, const ChangedFile& changed, ComparedFile& file) const;
    void report(const FileFinding& found);
    void fix(const std::string& path, const std::string& text, const std::vector<FileFinding>& found);
    void writeSummary() const;

    const ScanOptions& options_;
    const ScanSettings& settings_;
    Console& console_;
    std::unique_ptr<FindingWriter> writer_;
    std::size_t jobs_; ///< files that are written are read one after another: two may be the same
    SourceChecker first_;
    std::vector<std::unique_ptr<SourceChecker>> others_; ///< of other workers, made by them
    std::optional<ScanCache> cache_;
    Baseline baseline_; ///< accepted before
    Baseline written_;
    std::chrono::sys_days today_ = today();
    VT::SourceScanCounts counts_;
    std::uint64_t files_ = 0;
    std::uint64_t fixed_ = 0;
};

bool Scan::readBaselines() {
    const std::string& known = settings_.baseline;
    try {
        baseline_ = baselineAt(known, false);
        written_ = baselineAt(options_.written, true);
        return true;
    } catch (const FileError& error) {
        problem(known.empty() ? options_.written : known, error.what());
        return false;
    }
}

SearchResult Scan::run() {
    if (!readBaselines())
        return writer_->finish();
    const FileProblem report = [this](const std::string& path, const std::string& sentence) {
        problem(path, sentence);
    };
    const std::vector<std::string> files = sourceFiles(settings_.paths, report);
    scanFiles(files);
    if (files_ == 0 && !writer_->failed())
        problem(settings_.paths.front(), "there is no C or C++ file: name a folder of sources, or a file");
    if (const std::uint64_t undecided = counts_.undecided; undecided > 0)
        writer_->note(std::to_string(undecided) + " decisions were given up: findings that depend on them are missing");
    if (const std::uint64_t leftOut = counts_.leftOut; leftOut > 0)
        writer_->note(std::to_string(leftOut) + " configurations of files were left out: a file is scanned for " +
                      std::to_string(VT::limits::scanConfigurations));
    if (const std::size_t gone = baseline_.notFound(files, settings_.severity); gone > 0)
        writer_->note(std::to_string(gone) + " findings of " + settings_.baseline +
                      " are not found any more: write it again with --write-baseline");
    if (!options_.written.empty() && writer_->failed()) {
        problem(options_.written, "is not written, because it would lack what could not be read: mend that first");
    } else if (!options_.written.empty()) {
        try {
            writeFile(options_.written, written_.text());
        } catch (const FileError& error) {
            problem(options_.written, error.what());
        }
    }
    const SearchResult result = writer_->finish();
    if (options_.fix && !options_.dryRun)
        console_.err("vtsym: " + std::to_string(fixed_) + " conditions were written anew\n");
    if (options_.summary)
        writeSummary();
    return result;
}

SearchResult Scan::compare() {
    GitRepository repository;
    std::size_t counted[2] = {0, 0}; // findings that remain, that are fixed
    const std::vector<ChangedFile> changed = repository.changes(options_.range);
    std::vector<ComparedFile> slots(slotsFor(jobs_));
    auto next = changed.begin();
    OrderedWork work;
    work.next = [&](std::size_t slot) {
        next = std::find_if(next, changed.end(), [this](const ChangedFile& file) { return isAsked(file.path); });
        if (next == changed.end())
            return false;
        slots[slot] = {};
        read(repository, *next++, slots[slot]);
        return true;
    };
    work.work = [&](std::size_t slot, std::size_t worker) {
        ComparedFile& file = slots[slot];
        if (file.problem.empty())
            file.changes = changesOf(checkerOf(worker), {file.path, file.before, file.after, *file.lines});
    };
    work.finish = [&](std::size_t slot) {
        const ComparedFile& file = slots[slot];
        if (!file.problem.empty())
            problem(file.path, file.problem);
        for (const Finding& finding : file.changes) {
            if (finding.state == "new") {
                writer_->write(finding);
                continue;
            }
            writer_->remark(finding);
            if (finding.state != "updated")
                ++counted[finding.state == "absent" ? 1 : 0];
        }
    };
    runInOrder(jobs_, work);
    const std::uint64_t found = writer_->found();
    const SearchResult result = writer_->finish();
    if (options_.summary)
        console_.err("vtsym: " + std::to_string(found) + " new findings, " + std::to_string(counted[0]) + " remain, " +
                     std::to_string(counted[1]) + " are fixed\n");
    return result;
}

/// Whether changes of a file are compared.
bool Scan::isAsked(const std::string& path) const {
    return isSourcePath(path) && !isExcluded(path, settings_.excluded) && isBelow(path, settings_.paths);
}

void Scan::read(GitRepository& repository, const ChangedFile& changed, ComparedFile& file) const {
    file.path = changed.path;
    file.lines = &changed.lines;
    const auto textOf = [&](const std::string& blob) {
        return blob.empty() ? std::string() : repository.read(blob, settings_.mostBytes);
    };
    try {
        file.before = textOf(changed.blobBefore);
        file.after = textOf(changed.blob);
    } catch (const FileError& error) {
        file.problem = error.what();
    }
}

SourceChecker& Scan::checkerOf(std::size_t worker) {
    if (worker == 0)
        return first_;
    std::unique_ptr<SourceChecker>& checker = others_[worker - 1];
    if (!checker)
        checker = std::make_unique<SourceChecker>(first_);
    return *checker;
}

/// Reads a file and finds what there is.  Changes nothing that threads share.
void Scan::read(ScannedFile& file, SourceChecker& checker) const {
    try {
        file.text = readFile(file.path, settings_.mostBytes);
    } catch (const FileError& error) {
        file.problem = error.what();
        return;
    }
    std::optional<ContentKey> key;
    if (cache_) {
        key = cache_->keyOf(file.path, file.text);
        if (std::optional<CheckedFile> known = cache_->find(*key)) {
            file.checked = *std::move(known);
            file.key = key;
        }
    }
    if (!file.key) {
        file.checked = checker.checkAndCount(file.path, file.text);
        file.key = key;
    }
    if (!options_.fix)
        file.text = {};
}

void Scan::use(ScannedFile& file) {
    if (!file.problem.empty()) {
        problem(file.path, file.problem);
        return;
    }
    ++files_;
    addCounts(counts_, file.checked.counts);
    if (file.key)
        cache_->keep(*file.key, file.checked);
    if (options_.fix)
        fix(file.path, file.text, file.checked.findings);
    else
        std::ranges::for_each(file.checked.findings, [this](const FileFinding& each) { report(each); });
}

void Scan::scanFiles(const std::vector<std::string>& paths) {
    std::vector<std::vector<ScannedFile>> slots(slotsFor(jobs_));
    const std::size_t atOnce = jobs_ == 1 ? 1 : filesAtOnce;
    auto path = paths.begin();
    OrderedWork work;
    work.next = [&](std::size_t slot) {
        std::vector<ScannedFile>& files = slots[slot];
        for (files.clear(); path != paths.end() && files.size() < atOnce; ++path)
            if (!isExcluded(*path, settings_.excluded))
                files.emplace_back().path = *path;
        return !files.empty();
    };
    work.work = [&](std::size_t slot, std::size_t worker) {
        for (ScannedFile& file : slots[slot])
            read(file, checkerOf(worker));
    };
    work.finish = [&](std::size_t slot) {
        for (ScannedFile& file : slots[slot])
            use(file);
    };
    runInOrder(jobs_, work);
    if (cache_)
        cache_->write();
}

void Scan::report(const FileFinding& found) {
    if (!options_.written.empty())
        written_.accept(found.finding, today_);
    else if (settings_.baseline.empty() || !baseline_.covers(found.finding, today_, options_.days))
        writer_->write(found.finding);
}

/// Writes the proposals into a file, or their patch.  What has no proposal is reported.
void Scan::fix(const std::string& path, const std::string& text, const std::vector<FileFinding>& found) {
    std::vector<VT::SourceEdit> edits;
    for (const FileFinding& each : found) {
        if (!settings_.baseline.empty() && baseline_.covers(each.finding, today_, options_.days))
            continue;
        if (!each.edit && !options_.dryRun)
            writer_->write(each.finding);
        if (!each.edit)
            continue;
        if (!edits.empty() &&
            each.edit->begin < edits.back().end) // of the same condition: what the build adds is later
            edits.pop_back();
        edits.push_back(*each.edit);
    }
    fixed_ += edits.size();
    if (options_.dryRun) {
        console_.out(patchOf(path, text, edits));
    } else if (!edits.empty()) {
        try {
            writeFile(path, VT::withEdits(text, edits));
        } catch (const FileError& error) {
            problem(path, error.what());
        }
    }
}

void Scan::writeSummary() const {
    console_.err("vtsym: " + std::to_string(files_) + " files, " + std::to_string(counts_.branches) + " branches, " +
                 std::to_string(writer_->found()) + " findings; " + std::to_string(counts_.unread) +
                 " conditions not understood, " + std::to_string(counts_.undecided) + " decisions given up\n");
}

} // namespace

SearchResult runScan(const ScanOptions& options, Console& console) {
    Scan scan(options, console);
    return options.range.empty() ? scan.run() : scan.compare();
}

} // namespace vtsym
