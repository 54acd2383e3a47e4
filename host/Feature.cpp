// Assignments to feature flags: NAME=VALUE is read and checked here; the host keeps the flags.  Linear in the text and
// in the number of flags.
#include "host/Feature.hpp"

#include "host/Text.hpp"

#include <charconv>

namespace {

constexpr std::size_t shownBytes = 60;

std::string_view trimmed(std::string_view text) {
    constexpr std::string_view blanks = " \t\r\n";
    const std::size_t first = text.find_first_not_of(blanks);
    if (first == std::string_view::npos)
        return {};
    return text.substr(first, text.find_last_not_of(blanks) - first + 1);
}

} // namespace

VT::FeatureAssignment VT::parseFeatureAssignment(std::string_view text) {
    FeatureAssignment assignment;
    const std::size_t equals = text.find('=');
    const std::string_view name = trimmed(text.substr(0, equals));
    if (equals == std::string_view::npos || name.empty()) {
        assignment.error = "expected NAME=VALUE instead of \"" + shownText(text, shownBytes) + '"';
        return assignment;
    }
    assignment.name = name;
    const std::string_view digits = trimmed(text.substr(equals + 1));
    const char* const end = digits.data() + digits.size();
    const auto [stop, error] = std::from_chars(digits.data(), end, assignment.value);
    if (error != std::errc{} || stop != end)
        assignment.error = "the value of " + shownText(name, shownBytes) + " is an integer of 32 bits, not \"" +
                           shownText(digits, shownBytes) + '"';
    return assignment;
}

std::string VtFeature::assign(std::string_view assignment) {
    const VT::FeatureAssignment parsed = VT::parseFeatureAssignment(assignment);
    if (!parsed.error.empty())
        return parsed.error;
    VtFeature* const feature = find(parsed.name);
    if (feature != nullptr) {
        feature->setValue(parsed.value);
        return {};
    }
    std::string error = "there is no feature flag \"" + VT::shownText(parsed.name, shownBytes) + '"';
    std::string_view separator = "; flags are ";
    for (const VtFeature* known : all()) {
        error.append(separator).append(known->name());
        separator = ", ";
    }
    return error;
}
