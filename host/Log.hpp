// Named loggers.
#pragma once

#include "host/Export.hpp"

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

namespace foundation::core::log {

enum class Level : std::uint8_t { Debug, Info, Warning, Error, Off };

template <typename Char>
class basic_diagnostic_logger; // char is the only instance

/// A logger with a name.  Lines below its level cost one comparison.  The host decides where lines go; the
/// embedded host writes them to standard error and takes the first level from the environment variable VTSYM_LOG
/// (debug, info, warning, error or off; warning without it).  Used by one thread at a time.
template <>
class VTSYM_API basic_diagnostic_logger<char> {
public:
    explicit basic_diagnostic_logger(std::string_view name);
    ~basic_diagnostic_logger();
    basic_diagnostic_logger(const basic_diagnostic_logger&) = delete;
    basic_diagnostic_logger& operator=(const basic_diagnostic_logger&) = delete;

    const std::string& name() const noexcept { return name_; }

    Level level() const noexcept { return level_; }

    void setLevel(Level level) noexcept { level_ = level; }

    /// Whether a line of that level is written: check it before composing a costly line.
    bool enabled(Level level) const noexcept { return level >= level_ && level != Level::Off; }

    void debug(std::string_view line) { log(Level::Debug, line); }

    void info(std::string_view line) { log(Level::Info, line); }

    void warning(std::string_view line) { log(Level::Warning, line); }

    void error(std::string_view line) { log(Level::Error, line); }

    void log(Level level, std::string_view line) {
        if (enabled(level))
            write(level, line);
    }

private:
    struct Sink; ///< the host's own logger

    void write(Level level, std::string_view line);

    std::string name_;
    Level level_ = Level::Warning;
    std::unique_ptr<Sink> sink_;
};

} // namespace foundation::core::log
