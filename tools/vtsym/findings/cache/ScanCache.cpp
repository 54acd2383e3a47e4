// Keeps findings in one file of a folder.
//
// Method: a file of entries sorted by their keys, which are searched where they are, under one checksum.  A scan that
// found something new joins it with the file as it is by then, writes the result beside it and renames it, so that
// others read a whole file at any time.  Of two scans that do so at once, the results of one may be computed again.
// Cost: n log n in the entries to write; nothing is written where nothing is new.
#include "tools/vtsym/findings/cache/ScanCache.hpp"

#include "base/core/Limits.hpp"
#include "base/decide/external/SolverPlugin.hpp"
#include "tools/vtsym/findings/cache/FindingBytes.hpp"

#include <cstring>
#include <filesystem>
#include <utility>

namespace vtsym {

namespace fs = std::filesystem;

namespace {

/// The first bytes of a file.  The order of the mark's bytes is that of the machine's numbers.
struct PackHeader {
    std::uint64_t mark = 0x76'74'73'79'6d'73'63'31; // "vtsymsc1"
    std::uint64_t count = 0;
    std::uint64_t sum = 0; ///< of what follows
};

/// Adds the state of a program's file, which is another one after a build.
void addProgramFile(ContentHash& hash, const std::string& path) {
    std::error_code error;
    const auto size = fs::file_size(path, error);
    hash.add(error ? 0 : size);
    const auto time = fs::last_write_time(path, error);
    hash.add(error ? 0 : static_cast<std::uint64_t>(time.time_since_epoch().count()));
}

} // namespace

ContentKey settingsKey(const ScanSettings& settings, const ContentKey& build) {
    ContentHash hash;
    hash.add(VTSYM_VERSION);
    addProgramFile(hash, "/proc/self/exe");
    for (const std::string& path : VT::SolverPlugin::installed().files())
        addProgramFile(hash, path);
    hash.add((settings.strictIncludes ? 1U : 0U) | (settings.why ? 2U : 0U));
    hash.add(static_cast<std::uint64_t>(settings.severity)).add(settings.mostBytes);
    const auto addAll = [&hash](const std::vector<std::string>& texts) {
        hash.add(texts.size());
        for (const std::string& text : texts)
            hash.add(text);
    };
    for (const auto* const texts :
         {&settings.kinds, &settings.defines, &settings.undefines, &settings.macroFiles, &settings.assumptions})
        addAll(*texts);
    hash.add(settings.configurations.size());
    for (const AssumedConfiguration& each : settings.configurations) {
        hash.add(each.name);
        addAll(each.assumptions);
    }
    hash.add(settings.compileCommands).add(build.high).add(build.low);
    return hash.key();
}

ScanCache::ScanCache(std::string folder, const ContentKey& settings, Note note)
    : folder_(std::move(folder)),
      path_((fs::path(folder_) / "findings.vtsym").string()),
      settings_(settings),
      note_(std::move(note)) {
    std::error_code error;
    if (!fs::exists(path_, error))
        return;
    try {
        known_ = read();
        if (!known_.isWhole())
            note_("the cache " + path_ + " is damaged, or of another program; it is written anew");
    } catch (const FileError& problem) {
        note_("the cache " + path_ + " " + problem.what() + "; it is not used");
    }
    isFound_.resize(known_.size());
}

ScanCache::Pack ScanCache::read() const {
    return Pack(readBytes(path_, VT::limits::scanCacheBytes));
}

ContentKey ScanCache::keyOf(std::string_view path, std::string_view text) const {
    return ContentHash().add(settings_.high).add(settings_.low).add(path).add(text).key();
}

std::optional<CheckedFile> ScanCache::find(const ContentKey& key) const {
    const std::size_t at = known_.find(key);
    return at == known_.size() ? std::nullopt : checkedFileOf(known_.bytes(known_.entry(at)));
}

void ScanCache::keep(const ContentKey& key, const CheckedFile& file) {
    if (const std::size_t at = known_.find(key); at != known_.size())
        isFound_[at] = true;
    else
        added_.emplace(key, bytesOf(file));
}

void ScanCache::write() {
    if (added_.empty())
        return;
    try {
        fs::create_directories(folder_);
        std::error_code error;
        const Pack others = fs::exists(path_, error) ? read() : Pack();
        std::map<ContentKey, std::string_view> entries;
        std::size_t left = VT::limits::scanCacheBytes - sizeof(PackHeader);
        const auto add = [&](const ContentKey& key, std::string_view bytes) {
            const std::size_t size = sizeof(Pack::Entry) + bytes.size();
            if (size <= left && entries.emplace(key, bytes).second)
                left -= size;
        };
        for (const auto& [key, bytes] : added_)
            add(key, bytes);
        for (const bool areFound : {true, false}) {
            for (std::size_t at = 0; at < known_.size(); ++at)
                if (isFound_[at] == areFound)
                    add(known_.entry(at).key, known_.bytes(known_.entry(at)));
        }
        for (std::size_t at = 0; at < others.size(); ++at)
            add(others.entry(at).key, others.bytes(others.entry(at)));
        writeFile(path_, Pack::text(entries));
    } catch (const FileError& problem) {
        note_("the cache " + path_ + " " + problem.what());
    } catch (const fs::filesystem_error& problem) {
        note_("the cache " + folder_ + " cannot be made: " + problem.code().message());
    }
}

ScanCache::Pack::Pack(std::string bytes) : bytes_(std::move(bytes)) {
    PackHeader header;
    const PackHeader expected;
    if (bytes_.size() < sizeof header)
        return;
    std::memcpy(&header, bytes_.data(), sizeof header);
    const std::string_view rest = std::string_view(bytes_).substr(sizeof header);
    if (header.mark != expected.mark || header.count > rest.size() / sizeof(Entry) || header.sum != checksum(rest))
        return;
    count_ = header.count;
    isWhole_ = true;
    for (std::size_t at = 0; at < count_ && isWhole_; ++at) {
        const Entry each = entry(at);
        isWhole_ = each.begin <= bytes_.size() && each.size <= bytes_.size() - each.begin;
    }
    count_ = isWhole_ ? count_ : 0;
}

ScanCache::Pack::Entry ScanCache::Pack::entry(std::size_t at) const {
    Entry entry; // NOLINT(cppcoreguidelines-pro-type-member-init): set below
    std::memcpy(&entry, bytes_.data() + sizeof(PackHeader) + at * sizeof entry, sizeof entry);
    return entry;
}

std::string_view ScanCache::Pack::bytes(const Entry& entry) const {
    return std::string_view(bytes_).substr(entry.begin, entry.size);
}

std::size_t ScanCache::Pack::find(const ContentKey& key) const {
    std::size_t begin = 0;
    std::size_t end = count_;
    while (begin < end) {
        const std::size_t middle = begin + (end - begin) / 2;
        const ContentKey there = entry(middle).key;
        if (there == key)
            return middle;
        (there < key ? begin : end) = there < key ? middle + 1 : middle;
    }
    return count_;
}

std::string ScanCache::Pack::text(const std::map<ContentKey, std::string_view>& entries) {
    std::string index;
    std::size_t begin = sizeof(PackHeader) + entries.size() * sizeof(Entry);
    for (const auto& [key, bytes] : entries) {
        const Entry entry{key, begin, bytes.size()};
        index.append(reinterpret_cast<const char*>(&entry), sizeof entry);
        begin += bytes.size();
    }
    for (const auto& [key, bytes] : entries)
        index.append(bytes);
    const PackHeader header{.count = entries.size(), .sum = checksum(index)};
    index.insert(0, reinterpret_cast<const char*>(&header), sizeof header);
    return index;
}

} // namespace vtsym
