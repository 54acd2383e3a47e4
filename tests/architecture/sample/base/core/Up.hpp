#include "base/core/Table.hpp"
#include "base/print/Printer.hpp"
#include "host/Log.hpp"
#include "host/embedded/Log.hpp"
#include "tools/vtsym/Main.hpp"
#include <spdlog/spdlog.h>
#include <vector>
