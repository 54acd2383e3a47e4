#include "host/Log.hpp"
#include "base/core/Table.hpp"
#include <spdlog/spdlog.h>
