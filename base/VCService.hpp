// Front door of the facade over variant conditions.
#pragma once

#include "base/service/VCService.hpp"
