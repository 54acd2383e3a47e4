// Front door of the variant conditions: one service object through which a host reads, combines, simplifies, compares
// and prints them.
#pragma once

#include "base/core/Limits.hpp"
#include "base/decide/Budget.hpp"
#include "base/decide/Decision.hpp"
#include "base/decide/reasons/Reasons.hpp"
#include "base/decide/shorten/ShortForm.hpp"
#include "base/service/VCServiceHandle.hpp"
#include "base/service/VCSymbolicExprId.hpp"
#include "base/service/VCSymbols.hpp"
#include "base/simplify/VCCustomizer.hpp"
#include "host/Model.hpp"

#include <memory>
#include <optional>
#include <string>
#include <unordered_map>
#include <vector>

namespace VT {

class SymbolicExprSimplify;
class SymbolicExprTable;
class SymbolRegistry;
enum class PairQuestion : std::uint8_t;
struct ServiceParts;

/// The conditions of a process, or of a part of it.  Conditions are over integers: every symbol stands for an integer,
/// a truth value is an integer that is not zero.  One structure has one identifier, so that equal conditions have equal
/// identifiers.
///
/// TRUE is printed as the empty text: what holds always needs no condition.  The empty text and "true" are TRUE,
/// "false" is FALSE, exactly so and without a parser; every other text is read by the grammar of its language, whose
/// diagnostics pass to the caller.
///
/// An identifier that is not of the service's table is never followed: combining and simplifying it yield the invalid
/// identifier, it is equal to itself alone, and printing it throws std::out_of_range.
///
/// The service belongs to one thread at a time.  An operation that throws leaves it as it was, but for nodes that were
/// interned on the way.  A customizer that is being asked must neither clean() the service nor install another
/// customizer.
class VTSYM_API VCService {
public:
    /// The service of the process, made by the first call.
    static VCService& getInstance();
    /// Removes one user; the last one to go destroys the service with everything in it.  Does nothing without a
    /// service.  The next getInstance() makes a new one.
    static void clean();
    /// Installs a customizer, which the service owns from now on, and releases the previous one; nullptr for none.  The
    /// one that is installed already stays.  Results that were simplified under the previous one stay in the caches.
    void setVCCustomizer(VCCustomizer* customizer);

    /// A service of its own, with a table that no other service knows.  Services of different threads may work at once.
    VCService();
    ~VCService();
    VCService(const VCService&) = delete;
    VCService& operator=(const VCService&) = delete;

    // Reading.

    /// The condition of a text in C or in Quill; one condition is the same nodes in both, but for literals with a sign.
    /// Throws the host diagnostic "Vantor:Variants:ExpressionParseError" for text that is not a condition.
    SymbolicExprId parseC(const std::string& text);
    SymbolicExprId parseQ(const std::string& text);
    /// Whether a text is exactly "true" or "false".
    static bool isTRUEOrFALSEString(const std::string& text);

    // Combining.  With `simplify` the combination is simplified in Quill mode, unless a constant decides it outright.

    VCSymbolicExprId AND(const VCSymbolicExprId& a, const VCSymbolicExprId& b, bool simplify);
    VCSymbolicExprId OR(const VCSymbolicExprId& a, const VCSymbolicExprId& b, bool simplify);
    VCSymbolicExprId NOT(const VCSymbolicExprId& a, bool simplify);

    // Simplifying.

    /// The simplified condition.  In Quill mode an installed customizer confirms rewrites.  A customizer may also
    /// replace the condition by another one, which is used only where it simplifies to TRUE or FALSE.
    ///
    /// While the feature "CacheSymExprSimplifyResults" was above 0 when the service was made, results are kept by
    /// language.
    VCSymbolicExprId simplify(const VCSymbolicExprId& condition, bool isQuill);
    /// The simplified condition of a text.
    VCSymbolicExprId simplifyFromCCondition(const std::string& text);
    VCSymbolicExprId simplifyFromQCondition(const std::string& text);
    /// The same, printed.  Quill text of a C condition is that of the condition in Quill shape: the C text `a/b==1`
    /// becomes `idivide(a,b)==1`.
    std::string simplifyCExprFromCCondition(const std::string& text);
    std::string simplifyQExprFromCCondition(const std::string& text);
    std::string simplifyCExprFromQCondition(const std::string& text);
    std::string simplifyQExprFromQCondition(const std::string& text);
    /// Simplifies without caches and customizer.
    std::string simplifyExpressionWithoutEvalChecks(const std::string& text, bool inputIsQuill, bool outputIsQuill);

    // Printing.

    /// Quill text of the condition in its own shape.
    std::string printQExpr(const VCSymbolicExprId& condition);
    /// Quill text of the condition in Quill shape: C operators without a Quill spelling, and every division, as calls.
    std::string printQExprWithConversion(const VCSymbolicExprId& condition);
    /// C text of the condition in C shape: Quill calls that stand for C operators as operators.  Powers, transposes,
    /// element-wise operators and ranges, which C does not have, keep their Quill spelling.
    std::string printCExpr(const VCSymbolicExprId& condition);
    /// C text of the condition in its own shape.
    std::string printCExprNoConversion(const VCSymbolicExprId& condition);
    /// A text in the other language, or in the same one as the printer writes it; not simplified.
    std::string convertExprBetweenQandC(const std::string& text, bool inputIsQuill, bool outputIsQuill);

    // Asking.

    /// Whether a condition is TRUE.
    [[nodiscard]] bool getBoolean(SymbolicExprId condition) const;
    /// Whether two conditions are the same: the same structure or, under a customizer, the same simplified structure
    /// after its replacement of parameters.
    bool isEqual(const SymbolicExprId& a, const SymbolicExprId& b);
    /// The alias of a parameter, or the empty text.
    [[nodiscard]] std::string getParameterAlias(const std::string& parameter) const;
    /// Records an alias of a parameter, that of a negative literal in parentheses; the first alias stays.
    void addParameterAlias(const std::string& parameter, const std::string& alias);
    /// Records for each parameter of a block's condition what a customizer replaces it by there
    /// (VCCustomizer::parameterOfBlock), as above.  Records nothing for nullptr, for a parameter that stays, and for an
    /// identifier that is not of the table.
    void addParameterAlias(const VTBlock* block, SymbolicExprId condition, const VCCustomizer* customizer);

    /// Appends the symbols of the kinds asked for, as Quill text or as identifiers.  Throws std::out_of_range for
    /// an invalid kind.
    void getSymbolsFromExpression(const VCSymbolicExprId& condition, std::vector<std::string>& symbols,
                                  const VCSymbolTypes& kinds) const;
    void getSymbolsFromExpression(const VCSymbolicExprId& condition, std::vector<std::string>& symbols,
                                  const VCSymbolType& kind) const;
    void getSymbolsFromExpression(const VCSymbolicExprId& condition, std::vector<VCSymbolicExprId>& symbols,
                                  const VCSymbolTypes& kinds) const;
    void getSymbolsFromExpression(const VCSymbolicExprId& condition, std::vector<VCSymbolicExprId>& symbols,
                                  const VCSymbolType& kind) const;
    /// The condition with each named symbol replaced by the symbol that the map names for it.
    VCSymbolicExprId replaceSymbolsInExpression(const VCSymbolicExprId& condition,
                                                const std::unordered_map<std::string, std::string>& names);

    // Blocks and ports of the host's model.

    /// Where a block is active: the And of its own condition and those of its ancestors.  Where the signal of a port
    /// flows: where its source is active, and one of its destinations.  With `simplify` as when combining; the invalid
    /// identifier for nullptr.  Each call reads the conditions anew; BlockConditions reads many blocks' once.
    ///
    /// A customizer replaces the parameters of each block's own condition (VCCustomizer::parameterOfBlock).
    /// It need not be the installed one, which alone takes part in simplification.
    VCSymbolicExprId getQExprNetAAVCEIdx(const VTBlock* block, bool simplify, const VCCustomizer* customizer = nullptr);
    VCSymbolicExprId getQExprNetAAVCEIdx(const vtPort* port, bool simplify, const VCCustomizer* customizer = nullptr);
    /// The same as Quill text and as C text.
    std::string getQExprNetAAVCEString(const VTBlock* block, bool simplify, const VCCustomizer* customizer = nullptr);
    std::string getQExprNetAAVCEString(const vtPort* port, bool simplify, const VCCustomizer* customizer = nullptr);
    std::string getCExprNetAAVCEString(const VTBlock* block, bool simplify, const VCCustomizer* customizer = nullptr);
    std::string getCExprNetAAVCEString(const vtPort* port, bool simplify, const VCCustomizer* customizer = nullptr);

    // Deciding.  Answers are exact over the integers, without bounds unless asked for, or "undecided" with the bound
    // that was hit, and come with a witness where one assignment proves them; see Decision.hpp.  Operators that Quill
    // writes as calls are decided as operators, the variant keywords as opposites while they are in force.  A
    // customizer takes no part.  Decisions about pairs are kept like simplified conditions; an identifier that is not
    // of the table stays undecided.

    /// Whether decisions are over the signed 32-bit integers from now on; over all integers at first.
    void setDecisions32Bit(bool are32Bit);
    /// Whether the solver that is installed as a plugin is asked what the library leaves undecided; it is at first.
    void setSolver(bool isAsked);
    /// Takes the steps of all further decisions from a budget as well, which outlives the service or is replaced;
    /// nullptr ends that.  Decisions beyond it are undecided.
    void shareBudget(Budget* budget);
    /// Whether there is an assignment for which the condition holds; whether it holds for all.
    Decision canHold(const VCSymbolicExprId& condition);
    Decision mustHold(const VCSymbolicExprId& condition);
    /// Whether b holds wherever a does.
    Decision implies(const VCSymbolicExprId& a, const VCSymbolicExprId& b);
    /// Whether two conditions hold for the same assignments.
    Decision isEquivalent(const VCSymbolicExprId& a, const VCSymbolicExprId& b);
    /// Whether two conditions never hold together.
    Decision isDisjoint(const VCSymbolicExprId& a, const VCSymbolicExprId& b);
    /// Whether the outer condition holds wherever the inner one does.
    Decision contains(const VCSymbolicExprId& outer, const VCSymbolicExprId& inner);
    /// Whether a implies b and is not equivalent to it.  The witness of "yes" makes b hold alone, that of "no" makes a
    /// hold alone; equivalent conditions have no witness.
    Decision isTighterThan(const VCSymbolicExprId& a, const VCSymbolicExprId& b);
    /// How two conditions relate, in one word and with all witnesses.
    Relation compare(const VCSymbolicExprId& a, const VCSymbolicExprId& b);
    /// Whether some condition of a set holds for every assignment.
    SetDecision covers(const std::vector<VCSymbolicExprId>& conditions);
    /// Whether no two conditions of a set hold together.
    SetDecision isDisjoint(const std::vector<VCSymbolicExprId>& conditions);

    // Assuming.  While conditions are assumed, every decision is about the assignments for which they hold, and shorter
    // conditions are equal to the given ones there.  A question uses the assumptions that share names with it, directly
    // or through other assumptions.  Simplification knows no assumptions.

    /// Assumes a condition from now on; false, without effect, for an identifier that is not of the table.
    bool assume(const VCSymbolicExprId& condition);
    /// What is assumed, And operands one by one, in C shape.
    [[nodiscard]] std::vector<VCSymbolicExprId> assumptions() const;
    void clearAssumptions();

    // Explaining.  Reasons are And operands of the conditions asked about and of the assumptions, each as written
    // there; a search for them takes at most limits::reasonSteps.  See Reasons.hpp.

    /// The operands of a, and the assumptions, for which a implies b.
    Reasons explainImplies(const VCSymbolicExprId& a, const VCSymbolicExprId& b);
    /// Why two conditions are equivalent: explainImplies() both ways.
    EquivalenceReasons explainEquivalent(const VCSymbolicExprId& a, const VCSymbolicExprId& b);
    /// The operands and assumptions for which conditions never hold together; of one condition, for which it never
    /// holds.
    Reasons explainDisjoint(const std::vector<VCSymbolicExprId>& conditions);
    /// Why a condition is equal to what getImpliedCondition() or shortestCondition() made of it where the known one
    /// holds: the operands of the known condition that are needed, and the operands that went, with those for each.
    ShorteningReasons explainImpliedCondition(const VCSymbolicExprId& condition, const VCSymbolicExprId& implied,
                                              const VCSymbolicExprId& known);

    /// The simplified condition as a sum of products: the operands of its Or, each once, in the order of their texts.
    /// FALSE is the empty sum.  A part that simplification leaves unexpanded is one operand.
    std::vector<VCSymbolicExprId> computeUniqueOrOperandsId(const VCSymbolicExprId& condition);
    /// A product of such a sum as a set of factors: the operands of its And.  TRUE is the empty product.
    std::vector<VCSymbolicExprId> computeUniqueAndOperandsId(const VCSymbolicExprId& condition);

    // Shorter conditions.  Lengths are those of printQExpr in Quill and of printCExpr in C, where the result has C
    // shape.  The search takes at most limits::shortenWork and its proofs limits::shortenSteps together; beyond these
    // bounds the shortest form proven so far is returned.

    /// The shortest form found that is proven equal to a condition for all assignments: the fewest comparisons and
    /// other truth values, and of those forms the fewest bytes.  Never longer than the condition, which is returned
    /// where nothing better is proven; TRUE and FALSE are the shortest of all.  A root that is not a truth value, as in
    /// `2+3` or `N`, is a number: it is simplified where that makes it no longer, and keeps its value.
    ///
    /// `forms` receives the forms that were considered, the shortest first; it is empty for numbers.
    VCSymbolicExprId shortestCondition(const VCSymbolicExprId& condition, bool isQuill,
                                       std::vector<ShortForm>* forms = nullptr);
    /// The shortest form found that is proven equal to a condition wherever the known one holds.  TRUE where the known
    /// one implies it, FALSE where they are disjoint, and otherwise as shortestCondition().
    VCSymbolicExprId getImpliedCondition(const VCSymbolicExprId& condition, const VCSymbolicExprId& known,
                                         bool isQuill = false);

    /// A witness as text: "A=3, B=0".
    std::string printWitness(const Witness& witness);

    // The same for texts, which may be refused as when they are parsed.

    Decision impliesFromCConditions(const std::string& a, const std::string& b);
    Decision impliesFromQConditions(const std::string& a, const std::string& b);
    Decision isEquivalentFromCConditions(const std::string& a, const std::string& b);
    Decision isEquivalentFromQConditions(const std::string& a, const std::string& b);
    Decision isDisjointFromCConditions(const std::string& a, const std::string& b);
    Decision isDisjointFromQConditions(const std::string& a, const std::string& b);
    Decision containsFromCConditions(const std::string& a, const std::string& b);
    Decision containsFromQConditions(const std::string& a, const std::string& b);
    Decision isTighterThanFromCConditions(const std::string& a, const std::string& b);
    Decision isTighterThanFromQConditions(const std::string& a, const std::string& b);
    SetDecision coversFromCConditions(const std::vector<std::string>& conditions);
    SetDecision coversFromQConditions(const std::vector<std::string>& conditions);
    /// The operands as text; nothing where the answer is not proven.
    std::optional<std::vector<std::string>> explainImpliesFromCConditions(const std::string& a, const std::string& b);
    std::optional<std::vector<std::string>> explainImpliesFromQConditions(const std::string& a, const std::string& b);
    /// The operands of a that force b, and those of b that force a.
    std::optional<std::pair<std::vector<std::string>, std::vector<std::string>>>
    explainEquivalentFromCConditions(const std::string& a, const std::string& b);
    std::optional<std::pair<std::vector<std::string>, std::vector<std::string>>>
    explainEquivalentFromQConditions(const std::string& a, const std::string& b);
    std::optional<std::vector<std::string>> explainDisjointFromCConditions(const std::vector<std::string>& conditions);
    std::optional<std::vector<std::string>> explainDisjointFromQConditions(const std::vector<std::string>& conditions);
    bool assumeFromCCondition(const std::string& condition);
    bool assumeFromQCondition(const std::string& condition);
    std::string shortestCExprFromCCondition(const std::string& text);
    std::string shortestQExprFromCCondition(const std::string& text);
    std::string shortestCExprFromQCondition(const std::string& text);
    std::string shortestQExprFromQCondition(const std::string& text);
    std::string getImpliedCExprFromCConditions(const std::string& condition, const std::string& known);
    std::string getImpliedQExprFromQConditions(const std::string& condition, const std::string& known);
    std::vector<std::string> computeUniqueAndOperandsFromCCondition(const std::string& condition);
    std::vector<std::string> computeUniqueAndOperandsFromQCondition(const std::string& condition);
    std::vector<std::string> computeUniqueOrOperandsFromCCondition(const std::string& condition);
    std::vector<std::string> computeUniqueOrOperandsFromQCondition(const std::string& condition);

    // The parts that further operations on conditions are built on.

    [[nodiscard]] SymbolicExprTable& table() noexcept;
    [[nodiscard]] SymbolicExprSimplify& simplifier() noexcept;
    /// The names that dimension expressions of blocks have in the service's table.
    [[nodiscard]] SymbolRegistry& symbolRegistry() noexcept;
    /// Whether "(sim)" and "(codegen)" are keywords: the feature "VariantKeywordsSimCodegen" was on when the service
    /// was made, and is.
    [[nodiscard]] bool areVariantKeywordsInForce() const;

private:
    friend class VCServiceHandle;

    [[nodiscard]] bool has(const VCSymbolicExprId& condition) const noexcept;
    SymbolicExprId parse(const std::string& text, bool isQuill);
    VCSymbolicExprId simplifyFrom(const std::string& text, bool isQuill);
    std::string simplifiedText(const std::string& text, bool wasQuill, bool quill);
    std::string printSimplified(const std::string& text, bool wasQuill, bool quill);
    bool isAsSimplifiedAnew(const std::string& text, bool isQuill, SymbolicExprId kept);
    std::string printIn(bool quill, SymbolicExprId condition, bool wasQuill);
    VCSymbolicExprId combined(SymbolicExprId condition, bool simplify);
    SymbolicExprId rewritten(SymbolicExprId condition);
    Decision ask(PairQuestion question, const VCSymbolicExprId& a, const VCSymbolicExprId& b,
                 std::uint64_t steps = limits::decisionSteps);
    std::vector<VCSymbolicExprId> uniqueOperands(const VCSymbolicExprId& condition, bool ofAnd);
    std::vector<SymbolicExprId> withAssumptions(const std::vector<VCSymbolicExprId>& conditions);
    std::optional<std::vector<std::string>> printReasons(const Reasons& reasons, bool isQuill);
    std::optional<std::pair<std::vector<std::string>, std::vector<std::string>>>
    printReasons(const EquivalenceReasons& reasons, bool isQuill);
    std::vector<VCSymbolicExprId> parseAll(const std::vector<std::string>& texts, bool isQuill);
    std::vector<std::string> operandTexts(const std::string& condition, bool ofAnd, bool isQuill);
    SymbolicExprId simplifyNow(SymbolicExprId condition, bool isQuill);

    std::unique_ptr<ServiceParts> parts_;
};

} // namespace VT
