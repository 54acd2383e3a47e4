// Writes findings as bytes and reads them.
//
// Method: one list of members for both directions, so that none is forgotten in one of them; numbers have seven bits a
// byte, the last byte below 128.  Kinds and causes are views of the program's own texts and are looked up when read.
// Cost: linear; a reader takes no more memory than the bytes allow.
#include "tools/vtsym/findings/cache/FindingBytes.hpp"

#include "tools/vtsym/findings/source/ScanRules.hpp"

#include <concepts>
#include <limits>
#include <type_traits>

namespace vtsym {

namespace {

class ByteWriter {
public:
    void number(std::uint64_t value) {
        for (; value >= 128; value >>= 7U)
            bytes_.push_back(static_cast<char>(value | 128U));
        bytes_.push_back(static_cast<char>(value));
    }

    void operator()(const std::string& text) { view(text); }

    void operator()(bool value) { number(value ? 1 : 0); }

    template <std::unsigned_integral Number>
    void operator()(Number value) {
        number(value);
    }

    void operator()(FindingLevel level) { number(static_cast<std::uint64_t>(level)); }

    void kind(std::string_view text) { view(text); }

    void cause(std::string_view text) { view(text); }

    template <class Member>
    void operator()(const std::vector<Member>& list) {
        number(list.size());
        for (const Member& each : list)
            all(*this, each);
    }

    template <class Member>
    void operator()(const std::optional<Member>& member) {
        number(member ? 1 : 0);
        if (member)
            all(*this, *member);
    }

    std::string take() { return std::move(bytes_); }

private:
    void view(std::string_view text) {
        number(text.size());
        bytes_.append(text);
    }

    std::string bytes_;
};

class ByteReader {
public:
    explicit ByteReader(std::string_view bytes) : bytes_(bytes) {}

    /// Whether everything was read, and nothing was wrong.
    [[nodiscard]] bool isRead() const { return bytes_.empty() && !isWrong_; }

    void operator()(std::string& text) { text = view(); }

    void operator()(bool& value) { value = upTo(1) == 1; }

    template <std::unsigned_integral Number>
    void operator()(Number& value) {
        value = static_cast<Number>(upTo(std::numeric_limits<Number>::max()));
    }

    void operator()(FindingLevel& level) { level = upTo(1) == 0 ? FindingLevel::Note : FindingLevel::Warning; }

    void kind(std::string_view& text) {
        const FindingRule* const rule = scanRule(view());
        isWrong_ = isWrong_ || rule == nullptr;
        text = rule == nullptr ? std::string_view() : rule->kind;
    }

    void cause(std::string_view& text) {
        const std::optional<std::string_view> known = findingCause(view());
        isWrong_ = isWrong_ || !known;
        text = known.value_or("");
    }

    template <class Member>
    void operator()(std::vector<Member>& list) {
        for (std::uint64_t left = upTo(bytes_.size()); left > 0 && !isWrong_; --left)
            all(*this, list.emplace_back());
    }

    template <class Member>
    void operator()(std::optional<Member>& member) {
        if (upTo(1) == 1)
            all(*this, member.emplace());
    }

private:
    std::uint64_t upTo(std::uint64_t most) {
        std::uint64_t value = 0;
        for (unsigned shift = 0; shift < 64 && !bytes_.empty(); shift += 7) {
            const auto byte = static_cast<unsigned char>(bytes_.front());
            bytes_.remove_prefix(1);
            value |= static_cast<std::uint64_t>(byte & 127U) << shift;
            if (byte < 128 && value <= most)
                return value;
            if (byte < 128)
                break;
        }
        isWrong_ = true;
        return 0;
    }

    std::string_view view() {
        const std::uint64_t size = upTo(bytes_.size());
        if (size > bytes_.size())
            isWrong_ = true;
        const std::string_view text = bytes_.substr(0, size);
        bytes_.remove_prefix(text.size());
        return text;
    }

    std::string_view bytes_;
    bool isWrong_ = false;
};

template <class Bytes, class Of>
void all(Bytes& bytes, Of& value) {
    bytes(value);
}

/// Applies `bytes` to all members.
template <class Bytes, class Of>
requires std::same_as<std::remove_const_t<Of>, Place>

void all(Bytes& bytes, Of& place) {
    bytes(place.file);
    bytes(place.line);
    bytes(place.column);
    bytes(place.endLine);
    bytes(place.endColumn);
    bytes(place.name);
}

template <class Bytes, class Of>
requires std::same_as<std::remove_const_t<Of>, RelatedPlace>

void all(Bytes& bytes, Of& related) {
    all(bytes, related.place);
    bytes(related.text);
}

template <class Bytes, class Of>
requires std::same_as<std::remove_const_t<Of>, Fix>

void all(Bytes& bytes, Of& fix) {
    bytes(fix.description);
    all(bytes, fix.region);
    bytes(fix.text);
}

template <class Bytes, class Of>
requires std::same_as<std::remove_const_t<Of>, VT::SourceEdit>

void all(Bytes& bytes, Of& edit) {
    bytes(edit.begin);
    bytes(edit.end);
    bytes(edit.text);
}

template <class Bytes, class Of>
requires std::same_as<std::remove_const_t<Of>, FileFinding>

void all(Bytes& bytes, Of& found) {
    auto& finding = found.finding;
    all(bytes, finding.place);
    bytes.kind(finding.kind);
    bytes(finding.message);
    bytes(finding.condition);
    bytes(finding.proposed);
    bytes(finding.follows);
    bytes(finding.fix);
    bytes(finding.witness);
    bytes(finding.because);
    bytes(finding.mayNeedFewer);
    bytes(finding.redundant);
    bytes(finding.level);
    bytes(finding.fingerprint);
    bytes(finding.state);
    bytes(finding.configurations);
    bytes(finding.ofConfigurations);
    bytes(finding.configurationNames);
    bytes.cause(finding.cause);
    bytes(found.edit);
}

template <class Bytes, class Of>
requires std::same_as<std::remove_const_t<Of>, CheckedFile>

void all(Bytes& bytes, Of& file) {
    bytes(file.findings);
    bytes(file.counts.branches);
    bytes(file.counts.unread);
    bytes(file.counts.undecided);
    bytes(file.counts.steps);
    bytes(file.counts.leftOut);
}

} // namespace

std::optional<CheckedFile> checkedFileOf(std::string_view bytes) {
    ByteReader reader(bytes);
    CheckedFile file;
    all(reader, file);
    return reader.isRead() ? std::optional(std::move(file)) : std::nullopt;
}

std::string bytesOf(const CheckedFile& file) {
    ByteWriter writer;
    all(writer, file);
    return writer.take();
}

} // namespace vtsym
