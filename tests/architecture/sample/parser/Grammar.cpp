#include "base/service/Caches.hpp"
#include <boost/spirit/include/qi.hpp>
