// A page has one thread: work is done one item after another.
#include "tools/vtsym/io/InOrder.hpp"

namespace vtsym {

std::size_t processors() {
    return 1;
}

void runInOrder(std::size_t, const OrderedWork& work) {
    runOneByOne(work);
}

} // namespace vtsym
