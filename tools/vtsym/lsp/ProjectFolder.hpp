// A folder that an editor works in, with the settings of its project.
#pragma once

#include "tools/vtsym/findings/source/Baseline.hpp"
#include "tools/vtsym/findings/source/SourceChecker.hpp"
#include "tools/vtsym/lsp/OpenDocument.hpp"

#include <filesystem>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace vtsym {

/// A project: its settings, the scanner that they make, and what its baseline accepts.  Paths are relative to its
/// folder, which is that of the process while it is asked, so that a finding is the one of `vtsym scan` there.
class ProjectFolder {
public:
    /// Receives what is wrong with the settings, which are left out then.
    using Problem = std::function<void(const std::string& sentence)>;

    /// The folder is an absolute path, or empty for documents that are in no folder.
    ProjectFolder(std::string folder, Problem problem);

    [[nodiscard]] const std::string& folder() const noexcept { return folder_; }

    /// Whether an absolute path is in the folder.
    [[nodiscard]] bool holds(const std::string& path) const;
    /// A path in the folder as `vtsym scan` has it; any other as it is.
    [[nodiscard]] std::string relative(const std::string& path) const;

    /// Finds what is to be shown of a document.  What `ask` throws, which is called before each condition of a source,
    /// ends that.
    DocumentAnalysis analyse(const OpenDocument& document, const std::function<void()>& ask);

    /// Reads the settings anew where one of their files changed; returns whether one did.
    bool refresh();

private:
    /// The state of a file that the settings come from.
    struct Source {
        std::string path;
        std::optional<std::filesystem::file_time_type> written;
    };

    bool enter() const;
    void read();
    void watch(const std::string& path);

    std::string folder_;
    Problem problem_;
    ScanSettings settings_;
    Baseline baseline_;
    std::unique_ptr<SourceChecker> checker_;
    std::vector<Source> sources_;
};

} // namespace vtsym
