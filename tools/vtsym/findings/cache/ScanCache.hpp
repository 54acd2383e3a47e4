// Findings of files that did not change since an earlier scan.
#pragma once

#include "tools/vtsym/findings/cache/ContentHash.hpp"
#include "tools/vtsym/findings/source/SourceChecker.hpp"

#include <functional>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace vtsym {

/// A hash of everything but a file itself that its findings depend on: the program, the solver, settings, and the files
/// read of the build.
ContentKey settingsKey(const ScanSettings& settings, const ContentKey& build);

/// Findings by the contents that they depend on, in a folder that scans may share.  A scan that is under way reads what
/// was there when it began.
class ScanCache {
public:
    using Note = std::function<void(const std::string& sentence)>;

    /// Reads what the folder has; `note` receives what is wrong with that.
    ScanCache(std::string folder, const ContentKey& settings, Note note);

    /// The key of a file's findings.
    [[nodiscard]] ContentKey keyOf(std::string_view path, std::string_view text) const;

    /// What an earlier scan has found.  May be called by several threads, beside keep() too.
    [[nodiscard]] std::optional<CheckedFile> find(const ContentKey& key) const;

    /// Keeps what was found, or what find() has returned.
    void keep(const ContentKey& key, const CheckedFile& file);

    /// Writes what was kept and is new, with what the folder has by now.  At most limits::scanCacheBytes stay: what
    /// this scan did not find goes first.
    void write();

private:
    /// A file of findings: a header, entries in the order of their keys, and their bytes.
    class Pack {
    public:
        struct Entry {
            ContentKey key;
            std::uint64_t begin;
            std::uint64_t size;
        };

        Pack() = default;
        /// Takes the bytes of a file; has no entries where they are not what text() returns.
        explicit Pack(std::string bytes);

        [[nodiscard]] bool isWhole() const noexcept { return isWhole_; }

        [[nodiscard]] std::size_t size() const noexcept { return count_; }

        [[nodiscard]] Entry entry(std::size_t at) const;
        [[nodiscard]] std::string_view bytes(const Entry& entry) const;
        /// The position of a key; size() for none.
        [[nodiscard]] std::size_t find(const ContentKey& key) const;

        /// The bytes of a file with these entries.
        static std::string text(const std::map<ContentKey, std::string_view>& entries);

    private:
        std::string bytes_;
        std::size_t count_ = 0;
        bool isWhole_ = false;
    };

    [[nodiscard]] Pack read() const;

    std::string folder_;
    std::string path_;
    ContentKey settings_;
    Note note_;
    Pack known_;
    std::vector<bool> isFound_; ///< by position in known_
    std::map<ContentKey, std::string> added_;
};

} // namespace vtsym
