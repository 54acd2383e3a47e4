#include "tests/support/RandomExpression.hpp"

#include "base/transform/XForm.hpp"

#include <limits>

namespace VT::Testing {

namespace {

class Maker {
public:
    Maker(std::mt19937_64& random, SymbolicExprTable& table, const std::vector<SymbolicExprId>& operands)
        : random_(random),
          factory_(table),
          operands_(operands) {}

    SymbolicExprId make(SymbolicOp op) {
#define MAKE(...) return factory_.make<Node>(__VA_ARGS__)
#define MAKE_String() MAKE(anyOf(randomNames()))
#define MAKE_Int() MAKE(integer())
#define MAKE_Double() MAKE(real())
#define MAKE_Unary() MAKE(in[0])
#define MAKE_Member() MAKE(in[0], anyOf(randomNames()))
#define MAKE_Binary() MAKE(in[0], in[1])
#define MAKE_Ternary() MAKE(in[0], in[1], in[2])
#define MAKE_Multi() MAKE(some(in))
#define MAKE_Dims2() MAKE_Binary()
#define MAKE_Dims3() MAKE_Ternary()
#define MAKE_DimsN() MAKE_Multi()
#define MAKE_Call0() MAKE(anyOf(randomNames()))
#define MAKE_Call1() MAKE(anyOf(randomNames()), in[0])
#define MAKE_Call2() MAKE(anyOf(randomNames()), in[0], in[1])
#define MAKE_CallN() MAKE(anyOf(randomNames()), some(in))
#define MAKE_Cell() MAKE_Multi()
        std::vector<SymbolicExprId> in;
        while (in.size() < mostOperands && !operands_.empty())
            in.push_back(anyOf(operands_));
        switch (op) {
#define VTSYM_OPERATOR(Code, Name, Class, Shape, ...)                                                                  \
    case SymbolicOp::Name: {                                                                                           \
        using Node = Class;                                                                                            \
        MAKE_##Shape();                                                                                                \
    }
#include "base/core/operators.def"
#undef VTSYM_OPERATOR
        case SymbolicOp::None:
            break;
        }
        return invalidId;
    }

    SymbolicOp op() {
        if (!operands_.empty())
            return static_cast<SymbolicOp>(below(operatorCount));
        return below(2) == 0 ? SymbolicOp::String : static_cast<SymbolicOp>(below(3));
    }

private:
    static constexpr std::size_t mostOperands = 5;

    std::size_t below(std::size_t bound) {
        return std::uniform_int_distribution<std::size_t>(0, bound - 1)(random_);
    }

    template <class T>
    const T& anyOf(const std::vector<T>& all) {
        return all[below(all.size())];
    }

    std::vector<SymbolicExprId> some(std::vector<SymbolicExprId> all) {
        all.resize(1 + below(all.size()));
        return all;
    }

    int integer() {
        static const std::vector<int> bounds{std::numeric_limits<int>::min(), std::numeric_limits<int>::max()};
        return below(4) == 0 ? anyOf(bounds) : static_cast<int>(below(7)) - 3;
    }

    double real() {
        static const std::vector<double> values{0.0,
                                                0.5,
                                                1.0,
                                                1.0 + std::numeric_limits<double>::epsilon(),
                                                -2.75,
                                                1e300,
                                                std::numeric_limits<double>::infinity(),
                                                -std::numeric_limits<double>::infinity(),
                                                std::numeric_limits<double>::quiet_NaN()};
        return anyOf(values);
    }

    std::mt19937_64& random_;
    SymbolicExprFactory factory_;
    const std::vector<SymbolicExprId>& operands_;
};

} // namespace

const std::vector<std::string>& randomNames() {
    static const std::vector<std::string> names{"a", "b", "c", "N", "f", "g", "true", "(sim)"};
    return names;
}

SymbolicExprId randomNode(std::mt19937_64& random, SymbolicExprTable& table,
                          const std::vector<SymbolicExprId>& operands) {
    Maker maker(random, table, operands);
    return maker.make(maker.op());
}

std::vector<SymbolicExprId> randomGraph(std::mt19937_64& random, SymbolicExprTable& table, std::size_t nodes) {
    std::vector<SymbolicExprId> ids;
    while (ids.size() < nodes)
        ids.push_back(randomNode(random, table, ids.size() < nodes / 4 ? std::vector<SymbolicExprId>{} : ids));
    return ids;
}

} // namespace VT::Testing
