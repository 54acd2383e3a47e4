// The log of a page, which nobody would read: loggers are off.
// The library behind the native one would be a tenth of what is downloaded.
#include "host/Log.hpp"

namespace foundation::core::log {

struct basic_diagnostic_logger<char>::Sink {};

basic_diagnostic_logger<char>::basic_diagnostic_logger(std::string_view name) : name_(name), level_(Level::Off) {}

basic_diagnostic_logger<char>::~basic_diagnostic_logger() = default;

void basic_diagnostic_logger<char>::write(Level, std::string_view) {}

} // namespace foundation::core::log
