// What is found in sources and models, as marks of documents.
#pragma once

#include "tools/vtsym/findings/source/SourceChecker.hpp"
#include "tools/vtsym/lsp/OpenDocument.hpp"

#include <functional>

namespace vtsym {

/// Whether a finding is not to be shown.
using IsAccepted = std::function<bool(const Finding& finding)>;

/// Scans a source.
DocumentAnalysis analyseSource(SourceChecker& checker, const OpenDocument& document, const IsAccepted& isAccepted);

/// Checks a model.
DocumentAnalysis analyseModel(const OpenDocument& document);

/// Whether a JSON text, which need not be complete, is a model: its object has a list of blocks.  Linear.
bool isModelText(std::string_view json);

} // namespace vtsym
