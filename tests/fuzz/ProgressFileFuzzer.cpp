#include "tests/fuzz/Fuzzer.h"
#include "tests/fuzz/ProgressChecks.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    nimbra::test::expectNoFault(
        nimbra::test::faultInProgressFile(nimbra::test::textOf(data, size)));
    return 0;
}
