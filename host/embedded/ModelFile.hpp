// Models in files.
#pragma once

#include "host/embedded/EmbeddedModel.hpp"

#include <stdexcept>
#include <string>

namespace VT::Embedded {

/// Thrown for a text that is not a model.  what() is a sentence that says what to change, with the JSON pointer of the
/// place.
class VTSYM_API ModelError : public std::runtime_error {
public:
    ModelError(const std::string& sentence, const TextPlace& place) : std::runtime_error(sentence), place_(place) {}

    [[nodiscard]] const TextPlace& place() const noexcept { return place_; }

private:
    TextPlace place_;
};

/// Reads a model from JSON text, as docs/model.schema.json describes it, into an empty root diagram.  Throws ModelError
/// for the first error; the diagram is in an unspecified state then.  Linear in the text; nesting needs
/// no stack.
VTSYM_API void readModel(const std::string& json, VTRootBD& model);

} // namespace VT::Embedded
