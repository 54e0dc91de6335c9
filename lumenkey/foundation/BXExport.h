#pragma once

/// Marks what the shared library shows to its users; everything else is built with hidden visibility.
#if defined(__GNUC__) || defined(__clang__)
#define LUMENKEY_API __attribute__((visibility("default")))
#else
#define LUMENKEY_API
#endif
