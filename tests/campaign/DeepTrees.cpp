// Every operation on trees of a million operators on top of each other, with 256 KiB of stack; texts nested as deep as
// they may be, with `stackOfTexts`.
#include "base/VCService.hpp"
#include "base/VTSymbolicExpr.hpp"
#include "base/eval/Eval.hpp"
#include "base/eval/EvalVisitor.hpp"
#include "base/print/CTextObstacles.hpp"
#include "base/print/PreprocessorVCExpr.hpp"
#include "base/transform/Copy.hpp"
#include "base/transform/QuillConversion.hpp"
#include "base/transform/Symbols.hpp"
#include "host/Diagnostics.hpp"
#include "tests/campaign/Campaign.hpp"
#include "tests/support/generators/AnyNode.hpp"

#include <array>
#include <exception>
#include <functional>
#include <pthread.h>
#include <vector>

namespace VT::Campaign {

namespace {

using Op = SymbolicOp;

constexpr int depth = 1'000'000;
constexpr std::size_t kibibyte = 1024;
constexpr std::size_t stackOfTrees = 256 * kibibyte;
#ifdef __SANITIZE_ADDRESS__
constexpr std::size_t stackOfTexts = 4096 * kibibyte; // frames are many times as large
#else
constexpr std::size_t stackOfTexts = 384 * kibibyte;
#endif

/// Calls in a thread with a small stack; what is thrown there is thrown here.
void withStack(std::size_t bytes, const std::function<void()>& call) {
    struct Task {
        const std::function<void()>& call;
        std::exception_ptr thrown;
    } task{call, nullptr};

    const auto start = [](void* raw) -> void* {
        auto& own = *static_cast<Task*>(raw);
        try {
            own.call();
        } catch (...) {
            own.thrown = std::current_exception();
        }
        return nullptr;
    };
    pthread_attr_t attributes;
    pthread_t thread{};
    pthread_attr_init(&attributes);
    pthread_attr_setstacksize(&attributes, bytes);
    const int error = pthread_create(&thread, &attributes, start, &task);
    pthread_attr_destroy(&attributes);
    Fuzz::demand(error == 0, "a thread with a small stack begins");
    pthread_join(thread, nullptr);
    if (task.thrown)
        std::rethrow_exception(task.thrown);
}

struct Shape {
    Op left;
    Op right;
};

constexpr std::array<Shape, 8> shapes{{{Op::And, Op::And},
                                       {Op::Or, Op::And},
                                       {Op::Plus, Op::Minus},
                                       {Op::Multiply, Op::Divide},
                                       {Op::Equal, Op::LessThan},
                                       {Op::BitAnd, Op::ShiftLeft},
                                       {Op::Not, Op::UnaryMinus},
                                       {Op::FcnCall1U, Op::DimsND}}};

struct Operation {
    const char* name;
    void (*run)(VCService& service, SymbolicExprId id);
};

/// Calls what may refuse, with a report, what has no value or would be too long.
template <class Call>
void allowRefusal(Call call) {
    try {
        call();
    } catch (const HostDiagnostic&) {
    } catch (const std::length_error&) {
    } catch (const std::out_of_range&) {
    }
}

constexpr auto operations = std::to_array<Operation>({
    {"print C", [](VCService& service, SymbolicExprId id) { service.printCExpr(id); }},
    {"print Quill", [](VCService& service, SymbolicExprId id) { service.printQExprWithConversion(id); }},
    {"print a directive",
     [](VCService& service, SymbolicExprId id) {
         static_cast<void>(PreprocessorVCExpr(service.table(), false).print(id));
     }},
    {"obstacles",
     [](VCService& service, SymbolicExprId id) {
         static_cast<void>(findCTextObstacles(service.table(), id, CTextUse::Directive));
     }},
    {"copy",
     [](VCService& service, SymbolicExprId id) {
         SymbolicExprTable other;
         Fuzz::demand(other.has(SymbolicExprCopy(service.table(), other)(id)), "a copy is a node");
     }},
    {"convert", [](VCService& service,
                   SymbolicExprId id) { SymbolicExprQ2C(service.table())(SymbolicExprC2Q(service.table())(id)); }},
    {"symbols",
     [](VCService& service, SymbolicExprId id) {
         std::vector<std::string> names;
         service.table().getSymbolsFromExpression(id, names);
         Fuzz::demand(names.size() == 1, "one name is found");
     }},
    {"replace",
     [](VCService& service, SymbolicExprId id) {
         service.replaceSymbolsInExpression(id, {{"A", "B"}});
     }},
    {"evaluate",
     [](VCService& service, SymbolicExprId id) {
         service.table().registerValue("A", 1);
         allowRefusal([&] { static_cast<void>(SymbolicExprEval(service.table()).eval(id)); });
         allowRefusal([&] { static_cast<void>(SymbolicExprEval(service.table()).prepare(id).run()); });
     }},
    {"simplify", [](VCService& service, SymbolicExprId id) { service.simplify(id, false); }},
    {"shortest", [](VCService& service, SymbolicExprId id) { service.shortestCondition(id, false); }},
    {"decide",
     [](VCService& service, SymbolicExprId id) {
         static_cast<void>(service.canHold(id));
         static_cast<void>(service.compare(id, service.parseC("A > 1")));
     }},
    {"given", [](VCService& service, SymbolicExprId id) { service.getImpliedCondition(id, service.parseC("A > 1")); }},
    {"explain", [](VCService& service,
                   SymbolicExprId id) { static_cast<void>(service.explainImplies(id, service.parseC("A > 1"))); }},
    {"operands", [](VCService& service, SymbolicExprId id) { service.computeUniqueOrOperandsId(id); }},
});

class DeepTrees final : public Job {
public:
    void run(std::uint64_t /*seed*/, std::uint64_t item) override {
        if (item == 0)
            return withStack(stackOfTexts, readNested);
        // Each operation on some shape comes first.
        const Operation& operation = operations.at((item - 1) % operations.size());
        const Shape& shape = shapes.at(((item - 1) / operations.size() + item) % shapes.size());
        VCService service;
        service.setSolver(false);
        const Testing::Trees tree{service.table()};
        const SymbolicExprId leaf = tree.name("A");
        SymbolicExprId id = leaf;
        for (int i = 0; i < depth; ++i) {
            const Op op = i % 2 == 0 ? shape.left : shape.right;
            const std::size_t operands = Testing::operandCount(op).value_or(1);
            id = op == Op::FcnCall1U ? tree(op, leaf, id)
                 : operands == 1     ? tree(op, {id})
                 : i % 2 == 0        ? tree(op, id, leaf)
                                     : tree(op, leaf, id);
        }
        withStack(stackOfTrees, [&] { operation.run(service, id); });
        ++done_;
    }

    [[nodiscard]] std::string figure() const override {
        return std::to_string(done_) + " of " + std::to_string(items() - 1) + " operations on trees of " +
               std::to_string(depth) + " levels with " + std::to_string(stackOfTrees / kibibyte) +
               " KiB of stack, texts nested to the bound with " + std::to_string(stackOfTexts / kibibyte) + " KiB";
    }

    [[nodiscard]] std::uint64_t items() const override { return shapes.size() * operations.size() + 1; }

private:
    static void readNested() {
        const std::size_t deep = limits::nesting;
        VCService service;
        const std::string open(deep, '(');
        const std::string close(deep, ')');
        Fuzz::demand(service.parseC(open + "A" + close) == service.parseC("A"), "C text may be nested to the bound");
        Fuzz::demand(service.parseQ(open + "A" + close) == service.parseQ("A"),
                     "Quill text may be nested to the bound");
        for (const std::string& beyond :
             std::vector<std::string>{open + "(A)" + close, std::string(deep * 100, '['), std::string(deep * 100, '!')})
            for (const bool isQuill : {false, true})
                try {
                    static_cast<void>(isQuill ? service.parseQ(beyond) : service.parseC(beyond));
                    Fuzz::demand(false, "text that is nested deeper is refused");
                } catch (const HostDiagnostic&) { // as documented
                }
    }

    std::uint64_t done_ = 0;
};

} // namespace

std::unique_ptr<Job> makeDeepTrees(const std::string& /*name*/) {
    return std::make_unique<DeepTrees>();
}

} // namespace VT::Campaign
