// A host with services of its own, as small as they can be.  Linking it proves that the library asks for nothing but
// what the headers in host/ declare; running it, that the library uses what it is given.
#include "base/VCService.hpp"
#include "base/variants/Features.hpp"
#include "base/variants/Loggers.hpp"
#include "base/variants/VariantKeywords.hpp"
#include "host/Diagnostics.hpp"
#include "host/Feature.hpp"
#include "host/Log.hpp"
#include "host/Model.hpp"
#include "host/Numbers.hpp"
#include "host/QuillParser.hpp"
#include "host/Text.hpp"

#include <cstdio>
#include <cstdlib>

namespace {

std::vector<VtFeature*>& flags() {
    static std::vector<VtFeature*> all;
    return all;
}

std::string lastLine; // of any logger
bool assertionsOn = true;
int failures = 0;

void expect(bool condition, const char* what) {
    if (condition)
        return;
    std::printf("failed: %s\n", what);
    ++failures;
}

} // namespace

// This host starts every flag at 0.
VtFeature::VtFeature(std::string_view name, std::string_view description, std::string_view sourceUnit,
                     std::string_view category, int identifier, std::int32_t defaultValue, ChangeCallback callback)
    : name_(name),
      description_(description),
      sourceUnit_(sourceUnit),
      category_(category),
      identifier_(identifier),
      defaultValue_(defaultValue),
      value_(0),
      callback_(callback) {
    flags().push_back(this);
}

VtFeature::~VtFeature() {
    std::erase(flags(), this);
}

std::int32_t VtFeature::value() const {
    return value_;
}

void VtFeature::setValue(std::int32_t value) {
    value_ = value;
    if (callback_ != nullptr)
        callback_(*this);
}

VtFeature* VtFeature::find(std::string_view name) {
    for (VtFeature* flag : flags())
        if (flag->name() == name)
            return flag;
    return nullptr;
}

std::vector<VtFeature*> VtFeature::all() {
    return flags();
}

namespace foundation::core::log {

struct basic_diagnostic_logger<char>::Sink {};

basic_diagnostic_logger<char>::basic_diagnostic_logger(std::string_view name) : name_(name) {}

basic_diagnostic_logger<char>::~basic_diagnostic_logger() = default;

void basic_diagnostic_logger<char>::write(Level /*level*/, std::string_view line) {
    lastLine.assign(name_).append(": ").append(line);
}

} // namespace foundation::core::log

VT::HostDiagnostic vtsvCreateDiagnostic(std::string messageId, std::vector<VT::DiagnosticArgument> arguments,
                                        std::string additionalText, std::optional<std::size_t> offset) {
    const std::string sentence = "own host says " + messageId;
    return {std::move(messageId), std::move(arguments), std::move(additionalText), offset, sentence};
}

void vtsvThrowIExceptionFromDiagnostic(const VT::HostDiagnostic& diagnostic) {
    throw VT::HostDiagnostic(diagnostic);
}

void vtsvFatalDiagnostic(const char* message, const char* /*file*/, int /*line*/, const char* /*function*/) {
    throw std::logic_error(message);
}

bool vtsvAssertionsEnabled() noexcept {
    return assertionsOn;
}

void vtsvSetAssertionsEnabled(bool enabled) noexcept {
    assertionsOn = enabled;
}

std::string vtsv_dtoa(double value, bool /*shortest*/) {
    return std::to_string(value);
}

VT::ParsedNumber vtsv_strtod(std::string_view text) {
    return {std::strtod(std::string(text).c_str(), nullptr), VT::NumberError::None};
}

std::string cvt_ustring_string(std::u16string_view text) {
    return {text.begin(), text.end()};
}

namespace {

/// This host reads no Quill.
class NoQuill final : public PARSER_T<char> {
public:
    const Tree* generate_parse_tree(const char* /*text*/, std::size_t /*length*/) override { return nullptr; }

    void delete_parse_tree(const Tree* /*tree*/) noexcept override {}

    VT::QuillFailure failure() const noexcept override { return {0, "this host reads no Quill"}; }
};

} // namespace

template <>
std::unique_ptr<PARSER_T<char>> PARSER_T<char>::create(std::size_t /*nesting*/,
                                                       std::span<const std::string> /*keywords*/) {
    return std::make_unique<NoQuill>();
}

const char* vtuQParserTerminalName(std::int32_t /*code*/) noexcept {
    return "terminal";
}

const char* vtuQParserNonTerminalName(std::int32_t /*code*/) noexcept {
    return "non-terminal";
}

// The blocks of this host have a parent and a condition in C, and each of its ports is on a block.
class VTBlock {
public:
    const VTBlock* parent;
    const char* condition;
};

class vtPort {
public:
    const VTBlock* block;
};

const VTBlock* vtsvGetBlockParent(const VTBlock& block) {
    return block.parent;
}

VT::VariantCondition vtsvGetBlockVariantCondition(const VTBlock& block) {
    return {block.condition};
}

std::span<const VTBlock* const> vtsvGetBlockChoices(const VTBlock& /*block*/) {
    return {};
}

const VTBlock* vtsvGetPortSource(const vtPort& port) {
    return port.block;
}

std::span<const VTBlock* const> vtsvGetPortDestinations(const vtPort& /*port*/) {
    return {};
}

int main() {
    expect(VtFeature::all().size() == 3, "the library has three flags");
    expect(!VT::isVariantKeywordsSimCodegenFeatureOn(), "flags start as this host has them start");
    expect(VtFeature::assign("VariantKeywordsSimCodegen=1").empty(), "flags of this host can be assigned");
    expect(VT::isVariantKeywordsSimCodegenFeatureOn(), "the library reads the flag of this host");
    vt::variants::vred::getLogger().error("gone");
    expect(lastLine == "vt::variants::reducer: gone", "the library's loggers write to this host");

    const VT::VCServiceHandle service;
    expect(service->simplifyCExprFromCCondition("A == 1 && A == 2") == "false", "the service works on this host");
    const VTBlock engine{nullptr, "A > 1"};
    const VTBlock gear{&engine, "A > 2 && B"};
    const vtPort port{&gear};
    expect(service->getCExprNetAAVCEString(&port, false) == "A>1 && (A>2 && B)", "conditions of this host's model");
    std::string said;
    try {
        service->parseC("A ===");
    } catch (const VT::HostDiagnostic& diagnostic) {
        said = diagnostic.what();
    }
    expect(said == "own host says Vantor:Variants:ExpressionParseError", "errors are this host's diagnostics");
    return failures == 0 ? EXIT_SUCCESS : EXIT_FAILURE;
}
