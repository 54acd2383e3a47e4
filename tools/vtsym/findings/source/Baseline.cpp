// Reads and writes baselines as JSON, one finding a line, so that merges of two branches rarely conflict.
#include "tools/vtsym/findings/source/Baseline.hpp"

#include "tools/vtsym/io/Files.hpp"
#include "tools/vtsym/io/Json.hpp"

#include <nlohmann/json.hpp>

#include <algorithm>
#include <charconv>
#include <cstdlib>
#include <ctime>
#include <filesystem>
#include <system_error>
#include <tuple>
#include <vector>

namespace vtsym {

namespace {

using Json = nlohmann::json;
using std::chrono::sys_days;

[[noreturn]] void refuse(const std::string& what) {
    throw FileError("is not a baseline: " + what + "; write it again with --write-baseline");
}

/// Reads a day: "2030-01-31".
sys_days dayOf(const std::string& text) {
    int year = 0;
    unsigned month = 0;
    unsigned day = 0;
    const char* const end = text.data() + text.size();
    const auto number = [&](std::size_t at, std::size_t size, auto& value) {
        return text.size() == 10 &&
               std::from_chars(text.data() + at, text.data() + at + size, value).ptr == text.data() + at + size;
    };
    const bool isRead = number(0, 4, year) && number(5, 2, month) && number(8, 2, day) && end == text.data() + 10;
    const std::chrono::year_month_day date{std::chrono::year(year), std::chrono::month(month), std::chrono::day(day)};
    if (!isRead || !date.ok())
        refuse("'" + text + "' is not a day");
    return sys_days(date);
}

/// The level of an accepted finding, which only notes have a member for.
FindingLevel levelOf(const Json& finding) {
    return finding.contains("level") && finding["level"] == "note" ? FindingLevel::Note : FindingLevel::Warning;
}

std::string dayText(sys_days day) {
    const std::chrono::year_month_day date(day);
    std::string text = std::to_string(static_cast<int>(date.year()));
    const auto append = [&text](unsigned number) {
        text.append(number < 10 ? "-0" : "-").append(std::to_string(number));
    };
    append(static_cast<unsigned>(date.month()));
    append(static_cast<unsigned>(date.day()));
    return text;
}

} // namespace

Baseline Baseline::read(std::string_view text) {
    const Json json = Json::parse(text, nullptr, false);
    if (!json.is_object() || !json.contains("findings") || !json["findings"].is_array())
        refuse("it is no JSON object with a list of findings");
    Baseline baseline;
    for (const Json& each : json["findings"]) {
        const auto member = [&each](const char* name) {
            if (!each.is_object() || !each.contains(name) || !each[name].is_string())
                refuse(std::string("a finding has no ") + name);
            return each[name].get<std::string>();
        };
        baseline.entries_[member("fingerprint")] = {member("file"), member("kind"), member("condition"),
                                                    dayOf(member("since")), levelOf(each)};
    }
    return baseline;
}

void Baseline::accept(const Finding& finding, sys_days today) {
    const Entry fresh{finding.place.file, std::string(finding.kind), finding.condition, today, finding.level};
    entries_.emplace(finding.fingerprint, fresh).first->second.isFound = true;
}

bool Baseline::covers(const Finding& finding, sys_days today, std::size_t days) {
    const auto entry = entries_.find(finding.fingerprint);
    if (entry == entries_.end())
        return false;
    entry->second.isFound = true;
    const auto age = (today - entry->second.since).count();
    return age < 0 || static_cast<std::size_t>(age) <= days;
}

std::size_t Baseline::notFound(std::span<const std::string> files, FindingLevel least) const {
    const auto isGone = [&](const auto& each) {
        const Entry& entry = each.second;
        std::error_code error;
        return !entry.isFound && entry.level >= least &&
               (std::ranges::binary_search(files, entry.file) || !std::filesystem::exists(entry.file, error));
    };
    return static_cast<std::size_t>(std::ranges::count_if(entries_, isGone));
}

std::string Baseline::text() const {
    std::vector<const std::pair<const std::string, Entry>*> found;
    for (const auto& entry : entries_)
        if (entry.second.isFound)
            found.push_back(&entry);
    std::ranges::sort(found, {}, [](const auto* entry) {
        return std::tie(entry->second.file, entry->second.condition, entry->first);
    });
    std::string text = R"({"version":1,"findings":[)";
    for (const auto* entry : found) {
        text.append(entry == found.front() ? "\n" : ",\n").append("{\"fingerprint\":").append(jsonString(entry->first));
        appendMember(text, "file", jsonString(entry->second.file));
        appendMember(text, "kind", jsonString(entry->second.kind));
        appendMember(text, "condition", jsonString(entry->second.condition));
        appendMember(text, "since", jsonString(dayText(entry->second.since)));
        if (entry->second.level == FindingLevel::Note)
            appendMember(text, "level", jsonString("note"));
        text.push_back('}');
    }
    return text + "\n]}\n";
}

sys_days today() {
    std::int64_t seconds = std::time(nullptr);
    if (const char* const epoch = std::getenv("SOURCE_DATE_EPOCH")) {
        const std::string_view text(epoch);
        std::from_chars(text.data(), text.data() + text.size(), seconds);
    }
    constexpr std::int64_t aDay = std::int64_t{24} * 60 * 60;
    constexpr std::int64_t lastDay = 2'932'896; // 9999-12-31
    return sys_days(std::chrono::days(std::clamp<std::int64_t>(seconds / aDay, 0, lastDay)));
}

} // namespace vtsym
