#include "base/core/Table.hpp"
#include "base/print/Printer.hpp"
#include "elsewhere/Main.hpp"
#include "host/Log.hpp"
#include "host/embedded/Log.hpp"
#include <spdlog/spdlog.h>
#include <vector>
