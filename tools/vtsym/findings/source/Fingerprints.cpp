// Computes fingerprints: FNV-1a with 64 bits (Fowler, Noll, Vo), which stays the same on every machine.
#include "tools/vtsym/findings/source/Fingerprints.hpp"

#include <cstdint>
#include <map>

namespace vtsym {

namespace {

class Hash {
public:
    void add(std::string_view text) {
        for (const char c : text)
            addByte(static_cast<unsigned char>(c));
        addByte(0);
    }

    [[nodiscard]] std::uint64_t value() const { return value_; }

private:
    void addByte(unsigned byte) { value_ = (value_ ^ byte) * 0x100000001b3U; }

    std::uint64_t value_ = 0xcbf29ce484222325U;
};

std::string hexadecimal(std::uint64_t value) {
    std::string text(16, '0');
    for (std::size_t i = text.size(); i-- > 0; value >>= 4U)
        text[i] = "0123456789abcdef"[value & 15U];
    return text;
}

} // namespace

void addFingerprints(std::vector<Finding>& findings) {
    std::map<std::uint64_t, std::uint64_t> times;
    const auto number = [&](Finding& finding) {
        Hash content;
        content.add(finding.place.file);
        content.add(finding.kind);
        content.add(finding.condition);
        content.add(finding.proposed.value_or(""));
        for (const RelatedPlace& related : finding.follows)
            content.add(related.text);
        Hash numbered = content;
        numbered.add(std::to_string(++times[content.value()]));
        finding.fingerprint = hexadecimal(numbered.value());
    };
    // What holds in some configurations alone comes last: a scan that leaves it out numbers the others alike.
    const auto isPartial = [](const Finding& finding) {
        return finding.configurations.size() != finding.ofConfigurations;
    };
    for (Finding& finding : findings)
        if (!isPartial(finding))
            number(finding);
    for (Finding& finding : findings)
        if (isPartial(finding))
            number(finding);
}

} // namespace vtsym
