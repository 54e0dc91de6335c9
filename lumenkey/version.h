#pragma once

#include "lumenkey/foundation/BXExport.h"

// The version of Lumenkey. These three numbers are the only place where it stands: the build, the package
// files and the constants below all read them here.
#define LUMENKEY_VERSION_MAJOR 0
#define LUMENKEY_VERSION_MINOR 1
#define LUMENKEY_VERSION_PATCH 0

// The number of the shared object (liblumenkey.so.N). It goes up by one in the first release that
// breaks hosts built against the one before: a virtual operation added, removed or moved, a field of an
// exported class or record added, removed or retyped, or an exported function removed or given another
// signature. New free functions, new non-virtual operations and new classes leave it alone.
#define LUMENKEY_ABI_VERSION 0

extern "C" {

// The version of the library that is loaded, as against the macros above, which a host keeps from the
// headers it was built with: major * 10000 + minor * 100 + patch, so 0.1.0 is 100 and 1.2.3 is 10203. A
// later version always compares greater.
LUMENKEY_API extern double const LumenkeyVersionNumber;

// The same as text, "0.1.0". A pointer and not an array, so that a longer text never changes what hosts
// link to.
LUMENKEY_API extern char const* const LumenkeyVersionString;

} // extern "C"
