// The targets, each with what it promises.
#pragma once

#include <cstdint>
#include <span>

namespace VT::Fuzz {

using Input = std::span<const std::uint8_t>;

// Texts.

/// C text is read, and printed and read again as the same, or refused at a place within it with nothing interned.
void fuzzCGrammar(Input input);
/// The tokens of a Quill tree are those of the text, in order; a refusal has a place and a reason.
void fuzzQuillParser(Input input);
/// Quill text becomes a dimension that prints as a text that no longer changes, or there is a report.
void fuzzQuillDimensions(Input input);
/// The same for conditions.
void fuzzQuillConditions(Input input);

// Conditions as graphs of any operators, against the oracles.

void fuzzSimplify(Input input);
void fuzzShortest(Input input);
void fuzzReadBackC(Input input);
void fuzzReadBackQuill(Input input);
/// Conversion to Quill shape and back keeps the value and settles at once.
void fuzzConversion(Input input);
/// Evaluation, prepared evaluation and that of many rows agree with arithmetic over wide integers.
void fuzzEvaluate(Input input);

// Questions about two texts, or a set.

void fuzzDecide(Input input);
/// Unknowns of 32 bits: what is proven holds at their corners.
void fuzzDecide32Bits(Input input);
void fuzzGiven(Input input);
/// Findings about a set of choices are those of brute force.
void fuzzCheck(Input input);

// Sources.

/// Findings about directives hold under every definition of their macros.
void fuzzScan(Input input);
/// Findings about any bytes are in order and within the text.
void fuzzScanBytes(Input input);

// Calls.

/// Calls of the service with valid and invalid identifiers do what their documentation says.
void fuzzServiceCalls(Input input);
/// Tables and visitors of hosts, missing operands and circles.
void fuzzHostTables(Input input);

} // namespace VT::Fuzz
