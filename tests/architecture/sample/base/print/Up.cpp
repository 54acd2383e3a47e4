#include "base/core/Up.hpp"
