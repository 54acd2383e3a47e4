// Feature flags: the library's only configuration.
#pragma once

#include "host/Export.hpp"

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

/// A named integer switch that its host can set.  A flag lives as long as the component that declares it, usually from
/// load to unload, and can be found by name during that time.  Flags are used by one thread at a time.
class VTSYM_API VtFeature {
public:
    /// Called after a new value was set.
    using ChangeCallback = void (*)(const VtFeature& feature);

    /// Registers the flag.  The host may start it with another value than the default: the embedded host looks for it
    /// in the environment variable VTSYM_FEATURES (NAME=VALUE,NAME=VALUE,...).
    ///
    /// @param sourceUnit  the unit that declares the flag
    /// @param identifier  number of the flag in the host's records
    VtFeature(std::string_view name, std::string_view description, std::string_view sourceUnit,
              std::string_view category, int identifier, std::int32_t defaultValue, ChangeCallback callback);
    ~VtFeature();
    VtFeature(const VtFeature&) = delete;
    VtFeature& operator=(const VtFeature&) = delete;

    const std::string& name() const noexcept { return name_; }

    const std::string& description() const noexcept { return description_; }

    const std::string& sourceUnit() const noexcept { return sourceUnit_; }

    const std::string& category() const noexcept { return category_; }

    int identifier() const noexcept { return identifier_; }

    std::int32_t defaultValue() const noexcept { return defaultValue_; }

    std::int32_t value() const;
    void setValue(std::int32_t value);

    /// A flag is on when its value is above 0.
    bool isOn() const { return value() > 0; }

    /// The flag of that name (the oldest of several), or nullptr.
    static VtFeature* find(std::string_view name);

    /// All flags in the order of their creation.
    static std::vector<VtFeature*> all();

    /// Carries out an assignment NAME=VALUE, VALUE being a decimal integer of 32 bits.
    ///
    /// @return what is wrong with the assignment, in words for its author; empty on success.
    static std::string assign(std::string_view assignment);

private:
    std::string name_;
    std::string description_;
    std::string sourceUnit_;
    std::string category_;
    int identifier_;
    std::int32_t defaultValue_;
    std::int32_t value_ = 0;
    ChangeCallback callback_;
};

namespace VT {

/// NAME=VALUE taken apart.
struct FeatureAssignment {
    std::string name;
    std::int32_t value = 0;
    std::string error; ///< what is wrong with the text; empty for a valid one
};

/// Reads NAME=VALUE; blanks around both are ignored.  Reports an invalid text in `error`.
VTSYM_API FeatureAssignment parseFeatureAssignment(std::string_view text);

} // namespace VT
