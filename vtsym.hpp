// Everything that the library offers.
#pragma once

#include "base/VCService.hpp"
#include "base/VTSymbolicExpr.hpp"
#include "base/variants/Features.hpp"
#include "base/variants/Loggers.hpp"
#include "base/variants/VariantKeywords.hpp"
#include "host/Diagnostics.hpp"
#include "host/Feature.hpp"
#include "host/Log.hpp"
#include "host/Messages.hpp"
#include "host/Numbers.hpp"
#include "host/Text.hpp"
