// Feature flags in a registry of the process, started from the environment variable VTSYM_FEATURES.
//
// Look-ups search the registry from the front: there are a handful of flags.
#include "host/Feature.hpp"
#include "host/Log.hpp"
#include "host/Text.hpp"

#include <fmt/format.h>

#include <algorithm>
#include <cstdlib>

namespace {

/// The assignments in VTSYM_FEATURES.
struct Settings {
    std::vector<VT::FeatureAssignment> assignments; ///< in the order written, bad ones too

    Settings() {
        const char* const variable = std::getenv("VTSYM_FEATURES");
        std::string_view rest = variable == nullptr ? "" : variable;
        while (!rest.empty()) {
            const std::size_t comma = std::min(rest.find(','), rest.size());
            const std::string_view item = rest.substr(0, comma);
            if (item.find_first_not_of(" \t\r\n") != std::string_view::npos)
                assignments.push_back(VT::parseFeatureAssignment(item));
            rest.remove_prefix(std::min(comma + 1, rest.size()));
        }
    }
};

const Settings& settings() {
    static const Settings fromEnvironment;
    return fromEnvironment;
}

// Made by the first flag, and therefore destroyed after the last one.
std::vector<VtFeature*>& registry() {
    static std::vector<VtFeature*> flags;
    return flags;
}

bool reportSettings() {
    constexpr std::size_t shownBytes = 60;
    foundation::core::log::basic_diagnostic_logger<char> log("vtsym::features");
    for (const VT::FeatureAssignment& assignment : settings().assignments) {
        if (!assignment.error.empty())
            log.warning(fmt::format("VTSYM_FEATURES: {}; ignored", assignment.error));
        else if (VtFeature::find(assignment.name) == nullptr)
            log.warning(fmt::format("VTSYM_FEATURES: there is no feature flag \"{}\"; ignored",
                                    VT::shownText(assignment.name, shownBytes)));
    }
    return true;
}

} // namespace

VtFeature::VtFeature(std::string_view name, std::string_view description, std::string_view sourceUnit,
                     std::string_view category, int identifier, std::int32_t defaultValue, ChangeCallback callback)
    : name_(name),
      description_(description),
      sourceUnit_(sourceUnit),
      category_(category),
      identifier_(identifier),
      defaultValue_(defaultValue),
      value_(defaultValue),
      callback_(callback) {
    for (const VT::FeatureAssignment& assignment : settings().assignments)
        if (assignment.error.empty() && assignment.name == name_)
            value_ = assignment.value;
    registry().push_back(this);
}

VtFeature::~VtFeature() {
    std::erase(registry(), this);
}

std::int32_t VtFeature::value() const {
    // Reported on the first reading: by then every flag of the library has been made, and an assignment that still has
    // no flag is a mistake.
    static const bool reported = reportSettings();
    static_cast<void>(reported);
    return value_;
}

void VtFeature::setValue(std::int32_t value) {
    value_ = value;
    if (callback_ != nullptr)
        callback_(*this);
}

VtFeature* VtFeature::find(std::string_view name) {
    const auto found = std::ranges::find(registry(), name, &VtFeature::name);
    return found == registry().end() ? nullptr : *found;
}

std::vector<VtFeature*> VtFeature::all() {
    return registry();
}
