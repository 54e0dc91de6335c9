// One fuzzer: the target is named when it is compiled.

#include "tests/fuzz/FuzzTargets.h"

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    LUMENKEY_FUZZ_TARGET({data, size});
    return 0;
}
