#include "base/core/Table.hpp"
#include "host/Log.hpp"
#include <spdlog/spdlog.h>
