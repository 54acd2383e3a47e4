// Loggers on spdlog, writing to standard error.
//
// A logger opens its sink with the first line that it writes: most never write.  Lines are escaped and cut.
#include "host/Log.hpp"

#include "host/Text.hpp"

#include <spdlog/sinks/stdout_sinks.h>
#include <spdlog/spdlog.h>

#include <array>
#include <cstdlib>

namespace foundation::core::log {

namespace {

constexpr std::size_t lineBytes = 4096; ///< shown of one line

Level levelFromEnvironment() {
    const char* const variable = std::getenv("VTSYM_LOG");
    const std::string_view name = variable == nullptr ? "" : variable;
    constexpr std::array<std::string_view, 5> names{"debug", "info", "warning", "error", "off"};
    for (std::size_t level = 0; level < names.size(); ++level)
        if (names[level] == name)
            return static_cast<Level>(level);
    return Level::Warning;
}

spdlog::level::level_enum spdlogLevel(Level level) {
    constexpr std::array levels{spdlog::level::debug, spdlog::level::info, spdlog::level::warn, spdlog::level::err,
                                spdlog::level::off};
    return levels[static_cast<std::size_t>(level)];
}

} // namespace

struct basic_diagnostic_logger<char>::Sink {
    explicit Sink(const std::string& name) : logger(name, std::make_shared<spdlog::sinks::stderr_sink_st>()) {
        logger.set_level(spdlog::level::trace); // the logger above has checked the level already
        logger.set_pattern("%n: %l: %v");
    }

    spdlog::logger logger;
};

basic_diagnostic_logger<char>::basic_diagnostic_logger(std::string_view name)
    : name_(name),
      level_(levelFromEnvironment()) {}

basic_diagnostic_logger<char>::~basic_diagnostic_logger() = default;

void basic_diagnostic_logger<char>::write(Level level, std::string_view line) {
    if (!sink_)
        sink_ = std::make_unique<Sink>(name_); // most loggers never write
    sink_->logger.log(spdlogLevel(level), VT::shownText(line, lineBytes));
}

} // namespace foundation::core::log
