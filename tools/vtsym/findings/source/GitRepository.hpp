// Files of two states of a git repository, read from its objects: the work tree and the index are not touched.
#pragma once

#include "base/scan/changes/BranchMeanings.hpp"

#include <cstddef>
#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

namespace vtsym {

/// The git program failed; what() is a sentence without its full stop.
class GitError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// A file that two states have in different forms.
struct ChangedFile {
    std::string pathBefore; ///< another one where the file was renamed
    std::string path;
    std::string blobBefore; ///< names of objects; empty where the file is not there
    std::string blob;
    std::vector<VT::ChangedLines> lines{};
};

/// The repository around the working directory.
class GitRepository {
public:
    GitRepository();
    GitRepository(const GitRepository&) = delete;
    GitRepository& operator=(const GitRepository&) = delete;
    ~GitRepository();

    /// Returns the files that differ between two states, `A..B`, or since the last state that both have in common,
    /// `A...B`.  Links and submodules are left out.  Throws GitError.
    std::vector<ChangedFile> changes(const std::string& range);

    /// The content of a blob.  Throws GitError; FileError for more bytes than `bound`, and for a NUL among the first.
    std::string read(const std::string& blob, std::size_t bound);

private:
    class Objects;
    std::unique_ptr<Objects> objects_; ///< a process that hands out objects, while there is need
};

} // namespace vtsym
