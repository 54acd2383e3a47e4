// Receives the reports of the converters of Quill text.
#pragma once

#include "base/core/Node.hpp"
#include "host/Diagnostics.hpp"
#include "host/QuillParser.hpp"

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace VT {

/// Turns every report of a converter into one host diagnostic "Vantor:SymbolicDims:<key>" and collects them in order.
/// A diagnostic carries the name or the literal where it is about one, the text and the position, and the position as
/// its offset.  Positions are characters from the start of the text, and so bytes.
///
/// A converter reports once for a text that it refuses.
class VTSYM_API VTSymbolicExprErrorChecker {
public:
    using ParseTree = _Q_parse_tree_T<char>;

    VTSymbolicExprErrorChecker() = default;
    VTSymbolicExprErrorChecker(const VTSymbolicExprErrorChecker&) = delete;
    VTSymbolicExprErrorChecker& operator=(const VTSymbolicExprErrorChecker&) = delete;
    virtual ~VTSymbolicExprErrorChecker();

    /// Whether reports are dropped; they are collected from the start.
    [[nodiscard]] bool skipDiagnostics() const noexcept { return skip_; }

    void enableDiagnostics() noexcept { skip_ = false; }

    void disableDiagnostics() noexcept { skip_ = true; }

    /// The reports since the last clear().
    [[nodiscard]] const std::vector<HostDiagnostic>& diagnostics() const noexcept { return diagnostics_; }

    void clear() noexcept { diagnostics_.clear(); }

    /// The position of a token, or of the first token of a rule.
    [[nodiscard]] virtual std::size_t getNodeStartIdx(const ParseTree& node) const;
    /// Called by a converter when it begins another text.
    virtual void startText();
    /// Returns the whole text that a report is about.  A NUL does not end it while a converter works on that text.
    [[nodiscard]] std::string wholeText(const char* text) const;

    virtual void reportInvalidLiteralValue(const std::string& literal, const char* text, std::size_t position);
    virtual void reportNonScalarValue(const std::string& name, const char* text, std::size_t position);
    virtual void reportComplexValue(const std::string& name, const char* text, std::size_t position);
    virtual void reportLogicalValue(const std::string& name, const char* text, std::size_t position);
    virtual void reportNonIntegerLiteralValue(const std::string& literal, const char* text, std::size_t position);
    virtual void reportNonIntegerValue(const std::string& name, const char* text, std::size_t position);
    /// "NonNumericValue".
    virtual void reportUnsupportedValue(const std::string& name, const char* text, std::size_t position);
    /// A diagnostic that a converter made itself: see symbolicDimsDiagnostic().
    virtual void reportDiagnostic(const HostDiagnostic& diagnostic);
    /// Names the token, or the rule as the host's parser calls it.
    virtual void reportUnhandledExpr(const ParseTree& node, const char* text);
    virtual void reportDivisionExpr(const ParseTree& node, const char* text);
    /// Names the callee of the node, which is a call.
    virtual void reportUnsupportedFcn(SymbolicExprId functionNameId, const ParseTree& node, const char* text);
    /// The same; both numbers follow the position.
    virtual void reportInvalidNumArgs(SymbolicExprId functionNameId, std::size_t expected, std::size_t actual,
                                      const ParseTree& node, const char* text);
    /// @param failure  where and why the host's parser stopped
    virtual void reportInvalidExpr(const char* text, const QuillFailure& failure = {});

private:
    friend class SymbolicExprFromQParseTree;

    void collect(std::string_view key, std::vector<DiagnosticArgument> arguments, std::size_t position,
                 std::string additionalText = {});
    void collectNamed(std::string_view key, std::string name, const char* text, std::size_t position);

    std::vector<HostDiagnostic> diagnostics_;
    std::string_view text_; ///< of the conversion under way
    bool skip_ = false;
};

/// The checker of the conditions of variant blocks.  A condition that is refused is an exception of its own, so that
/// only the reports of the latest text are kept: a checker may serve any number of conditions.
class VTSYM_API VTSymbolicExprErrorCheckerBlockVariants : public VTSymbolicExprErrorChecker {
public:
    void startText() override;
};

/// The diagnostic "Vantor:SymbolicDims:<key>".  The position is added to the arguments.
VTSYM_API HostDiagnostic symbolicDimsDiagnostic(std::string_view key, std::vector<DiagnosticArgument> arguments,
                                                std::size_t position, std::string additionalText = {});

/// The reason of a failure as a sentence to follow another one; empty without a reason.
VTSYM_API std::string sentenceOf(const QuillFailure& failure);

} // namespace VT
