// A document that an editor has open, and what is found in it.
#pragma once

#include "base/scan/regions/ConditionalRegions.hpp"
#include "base/scan/report/ConditionEdit.hpp"
#include "tools/vtsym/findings/Findings.hpp"
#include "tools/vtsym/lsp/TextDocument.hpp"

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace vtsym {

/// The language of a document, as far as it matters.
enum class DocumentKind : std::uint8_t { Other, C, Cpp, Json };

/// How an editor shows a finding; the numbers are those of the protocol.
enum class MarkLevel : std::uint8_t { Error = 1, Warning = 2, Information = 3, Hint = 4 };

/// Bytes of a document, or of another file, where its name is not empty.
struct MarkPlace {
    std::string file;
    std::uint64_t line = 0; ///< of another file, from 1
    std::size_t begin = 0;
    std::size_t end = 0;
    std::string text; ///< what is there
};

/// A finding, as bytes of a document.
struct DocumentMark {
    std::size_t begin = 0;
    std::size_t end = 0;
    MarkLevel level = MarkLevel::Warning;
    std::string kind;
    std::string sentence;
    std::string explanation{}; ///< the sentence, with the operands that force the finding
    std::vector<MarkPlace> related{};
    std::optional<VT::SourceEdit> edit{};
    std::string action{};                                ///< what the edit does, for a title
    std::uint32_t region = VT::ConditionalRegions::none; ///< the branch that it is about
    bool isUnbuilt = false;                              ///< no build has what is marked
};

/// What is found in one version of a document.
struct DocumentAnalysis {
    VT::ConditionalRegions regions;
    std::vector<DocumentMark> marks;
};

/// An open document.
struct OpenDocument {
    std::string uri;
    std::string path; ///< from the folder of its project, or whole; made up for a document without a file
    DocumentKind kind = DocumentKind::Other;
    std::optional<std::int64_t> version{};
    TextDocument text;
    std::optional<DocumentAnalysis> analysis{}; ///< of this version
    bool isSent = false;                        ///< its diagnostics were sent
};

} // namespace vtsym
