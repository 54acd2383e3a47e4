// Reads two states of a repository with commands that look at objects alone: rev-parse, merge-base, diff-tree,
// cat-file. Cost: one process for the list of files, one for their changes, one for all contents.
#include "tools/vtsym/findings/source/GitRepository.hpp"

#include "tools/vtsym/findings/source/GitProcess.hpp"
#include "tools/vtsym/io/CommandLine.hpp"
#include "tools/vtsym/io/Files.hpp"

#include <algorithm>
#include <charconv>
#include <map>
#include <string_view>
#include <utility>

namespace vtsym {

namespace {

/// Runs a command to its end; its output.
std::string outputOf(const std::vector<std::string>& arguments) {
    return GitProcess(arguments).readAll();
}

std::string firstLine(const std::string& text) {
    return text.substr(0, text.find('\n'));
}

/// The name of a state's object.
std::string stateOf(const std::string& name) {
    try {
        return firstLine(outputOf({"rev-parse", "--verify", "--quiet", "--end-of-options", name + "^{commit}"}));
    } catch (const GitError&) {
        throw GitError("there is no state " + quotedArgument(name) + " in a git repository here");
    }
}

/// Takes the part of a text before a separator, which is removed with it.
std::string_view take(std::string_view& text, char separator) {
    const std::size_t end = std::min(text.find(separator), text.size());
    const std::string_view part = text.substr(0, end);
    text.remove_prefix(std::min(end + 1, text.size()));
    return part;
}

/// Reads `12,3` or `12`, which is one line.
void readRange(std::string_view text, std::uint64_t& first, std::uint64_t& count) {
    count = 1;
    const char* const end = text.data() + text.size();
    const auto [at, error] = std::from_chars(text.data(), end, first);
    if (error == std::errc() && at != end && *at == ',')
        std::from_chars(at + 1, end, count);
}

bool isNothing(std::string_view blob) {
    return blob.find_first_not_of('0') == std::string_view::npos;
}

/// The list of files: `:MODE MODE BLOB BLOB STATUS` NUL PATH NUL, and a second path for a rename.
std::vector<ChangedFile> filesOf(std::string_view list) {
    std::vector<ChangedFile> files;
    while (!list.empty()) {
        std::string_view row = take(list, '\0');
        const std::string_view modeBefore = take(row, ' ');
        const std::string_view mode = take(row, ' ');
        ChangedFile file;
        const std::string_view blobBefore = take(row, ' ');
        const std::string_view blob = take(row, ' ');
        file.pathBefore = take(list, '\0');
        file.path = row.starts_with('R') || row.starts_with('C') ? std::string(take(list, '\0')) : file.pathBefore;
        const auto isFile = [](std::string_view each) { return each.ends_with("100644") || each.ends_with("100755"); };
        if (!isNothing(blobBefore) && isFile(modeBefore))
            file.blobBefore = blobBefore;
        if (!isNothing(blob) && isFile(mode))
            file.blob = blob;
        if (file.blobBefore != file.blob)
            files.push_back(std::move(file));
    }
    return files;
}

using Blobs = std::pair<std::string, std::string>;

/// The lines that a patch changes, by the blobs of its files.
std::map<Blobs, std::vector<VT::ChangedLines>> linesOf(std::string_view patch) {
    std::map<Blobs, std::vector<VT::ChangedLines>> lines;
    std::vector<VT::ChangedLines>* own = nullptr;
    while (!patch.empty()) {
        std::string_view line = take(patch, '\n');
        if (line.starts_with("index ")) {
            line.remove_prefix(6);
            line = line.substr(0, line.find(' '));
            const std::size_t dots = line.find("..");
            if (dots != std::string_view::npos)
                own = &lines[{std::string(line.substr(0, dots)), std::string(line.substr(dots + 2))}];
            own->clear(); // the same change of another file
        } else if (line.starts_with("@@ -") && own != nullptr) {
            line.remove_prefix(4);
            VT::ChangedLines change;
            readRange(take(line, ' '), change.firstBefore, change.countBefore);
            line.remove_prefix(std::min<std::size_t>(1, line.size()));
            readRange(take(line, ' '), change.firstAfter, change.countAfter);
            own->push_back(change);
        }
    }
    return lines;
}

} // namespace

class GitRepository::Objects : public GitProcess {
public:
    Objects() : GitProcess({"cat-file", "--batch"}) {}
};

GitRepository::GitRepository() = default;
GitRepository::~GitRepository() = default;

std::vector<ChangedFile> GitRepository::changes(const std::string& range) {
    const std::size_t dots = range.find("..");
    if (dots == std::string::npos || dots == 0)
        throw GitError(quotedArgument(range) + " is not two states: write A..B");
    const bool isSinceBase = range.compare(dots, 3, "...") == 0;
    std::string before = stateOf(range.substr(0, dots));
    const std::string last = range.substr(dots + (isSinceBase ? 3 : 2));
    const std::string after = stateOf(last.empty() ? "HEAD" : last);
    if (isSinceBase)
        before = firstLine(outputOf({"merge-base", before, after}));
    std::vector<ChangedFile> files = filesOf(outputOf({"diff-tree", "-r", "-z", "-M", "--full-index", before, after}));
    const auto lines = linesOf(outputOf({"diff-tree", "-r", "-p", "-U0", "-M", "--full-index", "--no-color",
                                         "--no-ext-diff", "--no-textconv", before, after}));
    for (ChangedFile& file : files)
        if (const auto own = lines.find({file.blobBefore, file.blob}); own != lines.end())
            file.lines = own->second;
    return files;
}

std::string GitRepository::read(const std::string& blob, std::size_t bound) {
    if (!objects_)
        objects_ = std::make_unique<Objects>();
    objects_->ask(blob);
    const std::string header = objects_->readLine(); // BLOB TYPE SIZE
    std::size_t size = 0;
    const std::size_t blank = header.rfind(' ');
    const char* const end = header.data() + header.size();
    if (blank == std::string::npos || std::from_chars(header.data() + blank + 1, end, size).ptr != end)
        throw GitError("git does not have the object " + blob);
    if (size > bound) {
        objects_.reset(); // rather than read it
        throw FileError("is larger than " + sizeText(bound) + ": --max-size allows more");
    }
    std::string text = objects_->read(size);
    objects_->readLine();
    if (std::string_view(text).substr(0, 8192).find('\0') != std::string_view::npos)
        throw FileError("is not a text: there is a NUL in it");
    return text;
}

} // namespace vtsym
