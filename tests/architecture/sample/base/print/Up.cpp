#include "base/core/Up.hpp"
constexpr std::size_t mostSamples = 8;
constexpr std::size_t pageSize = 64;
namespace {
struct Column {
    int width;
};
std::string padded(const Column& column) {
    return padding(column);
}
} // namespace
std::string joined(const Column& column);
