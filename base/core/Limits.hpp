// Every bound of the library: its unit, its reason and its consequence.
#pragma once

#include <cstddef>
#include <cstdint>

namespace VT::limits {

/// Passes of the simplifier over one condition.  Rules reach a fixed point in two or three; the bound ends what
/// oscillates. The result of the last pass is returned.
inline constexpr std::uint64_t simplifyPasses = 10;

/// Operands of one flattened And or Or chain, and products of one distribution.  Distribution multiplies operands;
/// beyond the bound the simplifier gives up the pass and returns what it was given.
inline constexpr std::uint64_t chainOperands = 1000;

/// Literals of all products that one call of the simplifier multiplies out, in all of its passes.  At most about half a
/// second; real conditions take up to a hundred.  Beyond the bound the call gives up and returns what it was given.
inline constexpr std::size_t multipliedLiterals = 50'000;

/// Literals that the search for redundant parts of one sum of products looks at: a fixed number, and a number for each
/// literal of the sum.  Beyond the bound the sum stays as it is.
inline constexpr std::size_t coverSteps = 50'000;
inline constexpr std::size_t coverStepsPerLiteral = 64;

/// The search for a smallest sum of products: symbols, points of the grid that its bounds make, boxes that it is picked
/// from, and integers that a product may leave out between two neighbouring ranges.  A sum beyond the first three stays
/// as it is and is not proven smallest; products with larger holes are not looked for.
inline constexpr std::size_t coverAtoms = 12;
inline constexpr std::size_t coverPoints = 4096;
inline constexpr std::size_t coverBoxes = 256;
inline constexpr std::int64_t coverHole = 3;

/// Comparisons of an And up to which each restricts its symbol at once; those of a longer one are gathered first.
inline constexpr std::size_t restrictedOneByOne = 32;

/// Symbols of a sum of products up to which it is known at once whether the bounds of each are nested, so that no
/// search is needed.
inline constexpr std::size_t nestedAtoms = 32;

/// Nested case distinctions of a search for what cubes cover.  Beyond the bound it counts as exhausted.
inline constexpr std::size_t coverDepth = 200;

/// Nesting of brackets and runs of prefix operators in a text: what the strictest common C compilers read.  One more is
/// a parse error at that place.
inline constexpr std::size_t nesting = 256;

/// Visits of one rebuilding run whose results serve only one occurrence of their node: where a host's table leads in
/// circles, or a host's visitor does not leave one result for a node.  Beyond the bound the first result of a node
/// serves for all of its occurrences.
inline constexpr std::size_t repeatedVisits = std::size_t{1} << 20U;

/// Bytes of one printed text.  A shared graph of a few nodes can stand for more text than any memory holds; beyond the
/// bound printing throws std::length_error.
inline constexpr std::size_t textBytes = std::size_t{1} << 30U;

/// Bytes of two operands' texts that the simplifier compares when it sorts them; operands that agree in all of them
/// are ordered by their structure.
inline constexpr std::size_t orderedTextBytes = std::size_t{1} << 16U;

/// Bytes of a text that a printer writes in one pass, and as many more for each node of the table.  A longer text is
/// that of shared nodes, and is put together from texts that each of them has once.
inline constexpr std::size_t directBytes = 4096;
inline constexpr std::size_t directBytesPerNode = 16;

/// Texts that a printer keeps from one print, in records of 48 bytes.  A print that made more frees them, which costs
/// less than printing did.
inline constexpr std::size_t keptTexts = std::size_t{1} << 16U;

/// Bytes of an expression's text in an error of evaluation: more than a message shows.  A longer text is replaced by
/// the name of its operator.
inline constexpr std::size_t namedBytes = 4096;

/// In evaluation a real divisor below it counts as zero, and real values that differ by less are equal: the square root
/// of the machine epsilon.
inline constexpr double zeroThreshold = 0x1p-26;

/// Elements of all vectors that one evaluation makes, and operations of a prepared expression.  Each node of a graph
/// may make one more vector as long as the longest; beyond the bound evaluation throws std::length_error.
inline constexpr std::size_t evaluatedElements = std::size_t{1} << 26U;

/// Bytes of the values that an evaluation of many rows works on at once: most of the cache nearest to a core.  Fewer
/// rows are taken at a time where the expression has more values; at least minimumBlockRows, which bound the overhead.
inline constexpr std::size_t blockBytes = std::size_t{1} << 15U;
inline constexpr std::size_t minimumBlockRows = 64;

/// Steps that one question about conditions may cost: operands read and added up, edges of diagrams joined, literals
/// propagated, bounds looked at, nodes evaluated.  At most about a quarter of a second and 150 MB; real conditions take
/// tens to thousands, ten thousand choices of a set some hundred thousand.  Beyond the bound the question is undecided.
inline constexpr std::uint64_t decisionSteps = std::uint64_t{1} << 21U;

/// Steps that a caller may allow one question: numbers of nodes and edges have 31 bits.  Larger bounds count as this.
inline constexpr std::uint64_t settableSteps = std::uint64_t{1} << 24U;

/// Steps that all questions of one command may cost together: about ten seconds at most, and further ones for each line
/// of its input, since commands read files of any length.  Real conditions take tens to thousands.  Once they are used
/// up, questions are undecided.
inline constexpr std::uint64_t commandSteps = std::uint64_t{1} << 26U;
inline constexpr std::uint64_t commandStepsPerLine = std::uint64_t{1} << 13U;

/// Steps that lines which are answered before their turn, beside others, may take together beyond those of each line:
/// about a second.  Beyond them they are answered when it is their turn.
inline constexpr std::uint64_t commandStepsAhead = std::uint64_t{1} << 23U;

/// Slots of an index of diagrams that stay allocated from question to question.  A larger index is freed.
inline constexpr std::size_t keptSlots = 4096;

/// The largest magnitude of a factor or constant of a linear form of 64 bits; larger ones are big integers.  A path of
/// differences adds up at most limits::systemUnknowns of them, which leaves every sum within 64 bits.
inline constexpr std::int64_t formNumber = std::int64_t{1} << 40U;
inline constexpr std::size_t systemUnknowns = std::size_t{1} << 20U;

/// Floors of floors that are followed to bound one sum; the bits of a mask take 62.  A deeper one is unbounded.
inline constexpr int nestedFloors = 64;

/// Constraints that the elimination of one variable may add.  A variable that adds more is left to the search for an
/// integer point.
inline constexpr std::int64_t eliminationGrowth = 2;

/// Splits of a body as it is before that search makes it round, and of that before it takes the widths of all slabs.
inline constexpr std::size_t firstBranches = 64;

/// Rounds in which that search rounds the bounds of all sums to what the others leave of them.  Beyond it they are as
/// tight as they became.
inline constexpr std::size_t tighteningRounds = 4;

/// Steps of the further questions of a comparison after one that used up its own, so that a hard pair costs little more
/// than one question.
inline constexpr std::uint64_t furtherSteps = std::uint64_t{1} << 17U;

/// The part of a question's steps that decision diagrams may take, one in so many, and what they may take in any case.
/// Beyond the bound a search over the comparisons decides the question with what is left.
inline constexpr std::uint64_t diagramShare = 2;
inline constexpr std::uint64_t diagramSteps = std::uint64_t{1} << 12U;

/// Steps to find the smallest witness of a question that is decided.  Beyond the bound, which is lower for questions
/// that were easy to decide, the smallest found so far is reported.
inline constexpr std::uint64_t witnessSteps = std::uint64_t{1} << 19U;

/// Steps that work on the smallest witness may cost: so many times what the question took so far, and so many in any
/// case.  At most the former is charged, so that how names are spelt changes the cost of a question by no more than a
/// factor of two.  Beyond the bound the smallest found so far is reported.
inline constexpr std::uint64_t spellingFactor = 8;
inline constexpr std::uint64_t spellingSteps = 8192;

/// The part of a question's steps that paths of a diagram may take which nothing meets, one in so many.  Beyond it a
/// search that learns from them takes over.
inline constexpr std::uint64_t vainShare = 8;

/// The part of a question's steps that one path may take at first, one in so many, and how many times more when it is
/// tried again, after the others.
inline constexpr std::uint64_t pathShare = 8;
inline constexpr std::uint64_t pathGrowth = 4;

/// Steps to find out which ranges of such a path suffice to exclude it: so many, and so many times what excluding it
/// took.  Beyond them the search learns from more ranges than it needs to.
inline constexpr std::uint64_t refutingSteps = 4096;
inline constexpr std::uint64_t refutingFactor = 8;

/// Steps for each node of a term that is evaluated to confirm a witness: it takes that many times the memory of an edge
/// of a diagram.
inline constexpr std::uint64_t plannedNodeSteps = 4;

/// Nodes of such terms that are kept from question to question, about 80 bytes each.  When there are more, everything
/// that was read is thrown away before the next question.
inline constexpr std::size_t keptPlannedNodes = std::size_t{1} << 18U;

/// Pairs of calls with equal arguments and different values that one look at a witness reports.  Further ones are found
/// with the next witness.
inline constexpr std::size_t callPairs = 4096;

/// Numbers and references in the circuits of conditions that are kept between questions, 4 to 8 bytes each.  When there
/// are more, all are thrown away before the next question, which reads anew what it needs.
inline constexpr std::size_t circuitSize = std::size_t{1} << 22U;

/// Cases of one arithmetic term that truth values take part in.  A term with more is an unknown of its own.
inline constexpr std::size_t termCases = 64;

/// Bits of a number in an arithmetic term, and places that a shift to the left moves one.  A term with larger numbers
/// is an unknown of its own.  Two real literals and their product fit.
inline constexpr unsigned formBits = 4096;

/// Steps that making a solution of linear constraints small may cost: so many, and so many times what finding it took.
/// Beyond them the witness is not the smallest.
inline constexpr std::uint64_t minimizingSteps = 20000;
inline constexpr std::uint64_t minimizingFactor = 8;

/// Assignments tried to confirm a witness where arithmetic is not understood.  Beyond the bound the question is
/// undecided.
inline constexpr std::size_t confirmations = 8192;

/// What one question may cost in another solver, for each of two translations: in the solver's own unit, checks (to
/// find an assignment that evaluation accepts, and to make it small), nodes and pairs of calls that are written for it,
/// which it reads in quadratic time, and megabytes that it may take in the process.  Beyond a bound the question is
/// undecided, or the witness is as small as it is by then.
inline constexpr unsigned solverResources = 500'000;
inline constexpr std::size_t solverChecks = 64;
inline constexpr std::uint64_t solverNodes = 1024;
inline constexpr unsigned solverMegabytes = 256;

/// Steps that a question for it takes from the budget of a command, which it may use for as long as so many decisions
/// of the library at most.  Beyond the budget nothing goes to it.
inline constexpr std::uint64_t solverSteps = std::uint64_t{1} << 16U;

/// Bits of a number in a question for it, where each unknown counts as so many: the degree of products.  A larger
/// number is one that nothing is known of.
inline constexpr unsigned solverNumberBits = 4096;
inline constexpr unsigned solverUnknownBits = 128;

/// Products and quotients in a question about bits, each counted with the square of its bits.  A question with more is
/// not asked that way.
inline constexpr std::size_t solverProductBits = std::size_t{1} << 15U;

/// Bits of a value in a question about bits; a question with larger ones is not asked that way.  Bits of an unknown
/// that the question does not bound: assignments with larger values are not found.
inline constexpr unsigned solverBits = 128;
inline constexpr unsigned solverGuessedBits = 8;

/// Questions that one search for a shorter condition, or for reasons, may ask the other solver.  Further ones are
/// undecided where the library's own procedures leave them open.
inline constexpr std::size_t searchSolverQuestions = 16;

/// Steps that all proofs for one shorter condition may cost together: about an eighth of a second.  Beyond the bound
/// the shortest form found so far is the result.
inline constexpr std::uint64_t shortenSteps = std::uint64_t{1} << 20U;

/// Comparisons of a condition, each occurrence counted, up to which a shorter form is looked for.  A longer one keeps
/// its form or takes its normal form.
inline constexpr std::size_t shortenComparisons = 4096;

/// Work of the algebra on one condition: operands looked at and products made.  Beyond the bound the forms found so far
/// are left to choose from.
inline constexpr std::size_t shortenWork = std::size_t{1} << 16U;

/// Products of the sums that a shorter form is taken from, and steps of the search for redundant ones among them.  A
/// larger sum is not looked at; what was not proven redundant stays.
inline constexpr std::size_t shortenProducts = 128;
inline constexpr std::size_t shortenCoverSteps = 4000;

/// Rounds of taking out common operands, and of that together with judging constraints by those around them.  Real
/// conditions take two or three; the latest form is the result.
inline constexpr std::size_t factorRounds = 32;
inline constexpr std::size_t shortenRounds = 4;

/// Different operands of a chain's operands up to which single comparisons of a range are taken out of them as well.
inline constexpr std::size_t factoredParts = 64;

/// Comparisons of a form up to which its operands are judged by a truth table.  A longer one is judged by proofs only.
inline constexpr std::size_t prunedComparisons = 64;

/// Points that a formula's comparisons tell apart, up to which the smallest formula is searched; a multiple of 64.  The
/// search may look at so many subproblems, of about a microsecond each, and remembers so many that failed; real and
/// random conditions take some tens.  Beyond a bound the smallest form that algebra found is the result.
inline constexpr std::size_t factorPoints = 256;
inline constexpr std::size_t factorSteps = 2000;
inline constexpr std::size_t factorFailures = 64;

/// Intervals of a set up to which the shortest way to write it is looked for.  Those beyond are written one by one.
inline constexpr std::size_t writtenIntervals = 64;

/// Comparisons of a form up to which operands are taken away one by one, each with a proof.  A longer one stays.
inline constexpr std::size_t shortenByProofs = 64;

/// Changes tried, each with a proof, and nodes interned on the way, to take operands from one condition.  Beyond either
/// bound the shortest form found so far is the result.
inline constexpr std::size_t impliedTries = 1000;
inline constexpr std::size_t impliedNodes = std::size_t{1} << 16U;

/// Operands and literals that a group of comparisons is tried to be replaced by one comparison of.  Further ones are
/// not tried.
inline constexpr std::size_t impliedOperands = 8;
inline constexpr std::size_t impliedLiterals = 12;

/// Steps that the search for the reasons of one answer may cost: about an eighth of a second.  Beyond the bound what is
/// left of the premises is reported, not known to be minimal.
inline constexpr std::uint64_t reasonSteps = std::uint64_t{1} << 20U;

/// Steps that a node interned during that search counts for, so that the steps bound memory too.
inline constexpr std::uint64_t reasonNodeSteps = 16;

/// Operands of a premise that reasons are looked for among.  A premise with more is one reason as a whole.
inline constexpr std::size_t reasonOperands = 4096;

/// Steps that the checks of all choice sets of a model may cost together: about half a minute.  Beyond the bound what
/// is left is undecided.
inline constexpr std::uint64_t choiceSteps = std::uint64_t{1} << 28U;

/// Overlapping pairs that are reported of one choice set; n choices have up to n^2/2.  Beyond the bound there are more.
inline constexpr std::size_t choiceOverlaps = 1000;

/// Products of a choice's condition, and comparisons of each, that the ranges of its names are read from.  A larger
/// condition has no ranges, so that it is compared with every other choice.
inline constexpr std::size_t rangeOperands = 64;

/// Names that the choices of a set compare with integers, up to which questions about them are answered by boxes.
/// Steps of all such questions about a set, a number for each set and one for each choice, and those that one of them
/// may take in any case.  A step is some looks at a side of a box.  Beyond these bounds a decision answers.
inline constexpr std::size_t boxAtoms = 64;
inline constexpr std::uint64_t boxSteps = std::uint64_t{1} << 23U;
inline constexpr std::uint64_t boxStepsPerChoice = std::uint64_t{1} << 12U;
inline constexpr std::uint64_t leastBoxSteps = std::uint64_t{1} << 11U;

/// Values found before that are tried first where boxes are to leave some out, how often a point moves out of a box,
/// and corners that are tried.  Beyond them the values are searched: with all boxes that meet them up to so many, or
/// else with those that turn out to matter.
inline constexpr std::size_t recentPoints = 4;
inline constexpr std::size_t boxMoves = 12;
inline constexpr std::size_t boxCorners = 32;
inline constexpr std::size_t boxesAtOnce = 64;

/// Steps that the checks of one choice set may cost: a number for each set and one for each choice, about a second for
/// five thousand.  A question takes an eighth of what is left at most, and so many in any case.  Beyond the bound what
/// is left is undecided.
inline constexpr std::uint64_t setSteps = std::uint64_t{1} << 23U;
inline constexpr std::uint64_t setStepsPerChoice = std::uint64_t{1} << 12U;
inline constexpr std::uint64_t leastSetSteps = std::uint64_t{1} << 10U;

/// Choices of two runs that are compared pair by pair where boxes answer, and steps of a decision about larger runs for
/// each choice in them.  Beyond the steps their halves are looked at.
inline constexpr std::size_t overlapRun = 32;
inline constexpr std::uint64_t overlapSteps = 64;

/// Operands of a choice's condition up to which a redundant one is looked for.
inline constexpr std::size_t choiceOperands = 64;

/// Steps of the search for the smallest set of choices whose removal ends all overlaps: cases distinguished, each
/// looked at with all pairs.  Beyond the bound the smallest set found so far is reported, not known to be the smallest.
inline constexpr std::size_t removalCases = std::size_t{1} << 12U;

/// Earlier choices that a choice is compared with one by one where the first one counts and boxes do not answer: those
/// near it, and those that turn out to hide parts of it.  With more near ones a redundant operand is found only if
/// boxes answer, and no comparison is rewritten with a literal of an earlier choice; with more that hide parts of it,
/// whether it is dead is undecided.
inline constexpr std::size_t hidingChoices = 256;

/// Unions of choices that are tried to be written as one product.  Further ones are not tried.
inline constexpr std::size_t choiceMerges = 4096;

/// Choices joined at once in the hope that they are one product, where fewer of them are none.
inline constexpr std::size_t mergeAhead = 4;

/// Assignments that are evaluated to count those of one condition; values that no comparison distinguishes count as
/// one. A condition with more is not counted.
inline constexpr std::size_t countedAssignments = std::size_t{1} << 14U;

/// Nodes that are evaluated to count the assignments of all choices of a set: about half a second.  What is left is not
/// counted.
inline constexpr std::uint64_t countedNodes = std::uint64_t{1} << 22U;

/// Bytes of a cache of findings: those of some hundred thousand files with findings, or of millions without.  A larger
/// file is not read; what the last scan did not find is left out first.
inline constexpr std::size_t scanCacheBytes = std::size_t{1} << 28U;

/// Steps that decisions about the conditions of one source file may cost: a number for each file, and one for each
/// condition as it is read.  Real conditions take some hundred, those of long chains over one macro some thousand.
/// While they are used up, a condition is not decided, which is counted.
inline constexpr std::uint64_t scanSteps = std::uint64_t{1} << 22U;
inline constexpr std::uint64_t scanStepsPerBranch = std::uint64_t{1} << 13U;

/// Steps of all decisions about one condition of a source file, and of each of them.  Beyond the first the shortest
/// form found so far is reported; a decision beyond the second is given up.
inline constexpr std::uint64_t branchSteps = std::uint64_t{1} << 20U;
inline constexpr std::uint64_t branchDecisionSteps = std::uint64_t{1} << 16U;

/// Nodes that a scanner keeps from file to file, with what was decided about them: some 20 MB for each thread.  When
/// there are more, the next file begins anew.
inline constexpr std::size_t scanNodes = std::size_t{1} << 17U;

/// Conditions that are assumed of every build and compared with one condition of a source file: those that share a
/// macro with it, then those that share one with these.  Further ones are not used for it.
inline constexpr std::size_t relatedAssumptions = 64;

/// Assumptions that share a name and are followed from it.  A name of more leads to those that begin with it alone:
/// others say little about it, and each leads to further names.
inline constexpr std::size_t assumptionsAboutName = 16;

/// Assumptions that are checked for a contradiction when a scan begins.  More are taken as they are: contradictions say
/// nothing about any condition.
inline constexpr std::size_t assumptionsTogether = 1024;

/// Branches around a condition, the innermost, whose assumptions are used for it too.
inline constexpr std::size_t branchesAssumedAbout = 8;

/// Nodes of conditions that are only checked to be readable, before the memory is used again.
inline constexpr std::size_t assumptionNodes = std::size_t{1} << 16U;

/// Configurations of a build that one source file is scanned for.  Further ones are left out, which is counted.
inline constexpr std::size_t scanConfigurations = 32;

/// Tokens that macros of a build may become where the value of a term is computed.  Beyond it the value is not known.
inline constexpr std::size_t expandedTokens = std::size_t{1} << 14U;

/// Pairs of tokens that are compared to keep what a shorter condition shares with the longer one as it is written: a
/// few milliseconds.  Beyond it the whole condition is written anew.
inline constexpr std::size_t comparedTokens = std::size_t{1} << 20U;

/// Results of one SARIF log, which services that take such logs reject beyond 25,000.  Those of the lower levels are
/// left out first, which a note counts.
inline constexpr std::size_t sarifResults = 25'000;

/// Operands of the facts around a branch and of its condition from which the fewest that force a finding are picked.
/// Of more, those of directives alone are named.
inline constexpr std::size_t whyOperands = 256;

/// Facts of branches around a condition that it is compared with: between one and two windows of those about one macro,
/// and of all together a total weight, a fact about several macros as much as several.  Further ones are left out.
inline constexpr std::size_t factWindow = 128;
inline constexpr std::size_t factWeight = 256;
inline constexpr std::size_t compoundFactWeight = 8;

/// Tokens of a directive's condition that is read, and how often each of them may be written into the texts of
/// unknowns (comparisons within comparisons repeat their operands).  Beyond either bound the condition is an unknown.
inline constexpr std::size_t conditionTokens = 4096;
inline constexpr std::size_t conditionTexts = 16;

/// Macros that a macro is followed through to those that define it, and names in their definitions.  Beyond either
/// bound nothing is known of the macro's value.
inline constexpr std::size_t macrosFollowed = 64;
inline constexpr std::size_t macroNamesFollowed = 1024;

/// Raw strings without an end in one file that are searched to the end of the file.  Further ones are ordinary strings.
inline constexpr unsigned endlessRawStrings = 8;

/// Characters of an identifier that the symbol registry makes for generated code: what C99 compilers tell apart. Longer
/// ones are cut and numbered.
inline constexpr std::size_t identifierLength = 63;

/// Levels of indentation in a dumped parse tree.  Deeper lines begin there, so that the text stays linear in the nodes.
inline constexpr std::size_t dumpIndent = 40;

/// Bytes of a directive that a finding quotes as a reason; what is longer is cut.
inline constexpr std::size_t quotedBytes = 4096;

} // namespace VT::limits
