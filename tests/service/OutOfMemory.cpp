// Every allocation of a call fails once: the error passes, nothing leaks or breaks, and the next call is right.
#include "base/service/SymbolRegistry.hpp"
#include "tests/service/Customizers.hpp"

#include <cstdlib>
#include <new>

namespace {

/// Allocations until one fails; below zero for none.
thread_local long remaining = -1;

void* allocate(std::size_t bytes) noexcept {
    if (remaining >= 0 && remaining-- == 0)
        return nullptr;
    return std::malloc(bytes == 0 ? 1 : bytes);
}

void* allocateOrThrow(std::size_t bytes) {
    void* const memory = allocate(bytes);
    if (memory == nullptr)
        throw std::bad_alloc();
    return memory;
}

} // namespace

void* operator new(std::size_t bytes) {
    return allocateOrThrow(bytes);
}

void* operator new[](std::size_t bytes) {
    return allocateOrThrow(bytes);
}

void* operator new(std::size_t bytes, const std::nothrow_t&) noexcept {
    return allocate(bytes);
}

void* operator new[](std::size_t bytes, const std::nothrow_t&) noexcept {
    return allocate(bytes);
}

void operator delete(void* memory) noexcept {
    std::free(memory);
}

void operator delete[](void* memory) noexcept {
    std::free(memory);
}

void operator delete(void* memory, std::size_t) noexcept {
    std::free(memory);
}

void operator delete[](void* memory, std::size_t) noexcept {
    std::free(memory);
}

namespace VT::Testing {
namespace {

constexpr const char* text = "(A == 1 || A == 2) && B == 3 && !(C < 4) && f(A, B) / 2 + 3 * x.y != 1";
constexpr const char* simplified =
    "A==1 && B==3 && C>=4 && f(A,B)/2+3*x.y!=1 || A==2 && B==3 && C>=4 && f(A,B)/2+3*x.y!=1";

/// Every kind of work at once.
std::string work() {
    VCService& service = VCService::getInstance();
    const VCSymbolicExprId condition = service.simplifyFromCCondition(text);
    const VCSymbolicExprId both = service.AND(condition, service.NOT(service.parseC("B == 4"), true), true);
    const VCSymbolicExprId quill = service.parseQ(service.printQExprWithConversion(condition));
    const SymbolicExprId dimension = service.parseQ("[N*2.5, max(M', 3)]");
    SymbolRegistry registry(service.table());
    const std::string name = registry.registerExpression(nullptr, dimension);
    if (service.printQExprWithConversion(both).empty() || registry.registeredBy(nullptr).front() != name)
        return "";
    return service.printCExpr(quill);
}

TEST(OutOfMemory, PassesAndLeavesTheServiceUsable) {
    for (const bool caching : {true, false}) {
        const std::string expected = [&] {
            const FreshService service(caching);
            return work();
        }();
        EXPECT_EQ(expected, simplified);
        bool failed = true;
        for (long allocation = 0; failed; ++allocation) {
            SCOPED_TRACE("allocation " + std::to_string(allocation));
            const FreshService service(caching);
            std::string answer = expected; // what fails unseen, because it was not needed, leaves the answer right
            remaining = allocation;
            try {
                answer = work();
            } catch (const std::bad_alloc&) {
            }
            failed = remaining < 0;
            remaining = -1;
            ASSERT_EQ(answer, expected);
            ASSERT_EQ(work(), expected);
        }
    }
}

} // namespace
} // namespace VT::Testing
