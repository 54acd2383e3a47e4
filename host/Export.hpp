// The one export macro of the library.
#pragma once

/// Exports a symbol from the shared library; everything else is compiled with hidden visibility.
#define VTSYM_API __attribute__((visibility("default")))
