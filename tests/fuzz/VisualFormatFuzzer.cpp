#include "tests/fuzz/Fuzzer.h"
#include "tests/fuzz/VisualFormatChecks.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    nimbra::test::expectNoFault(
        nimbra::test::faultInVisualFormat(nimbra::test::textOf(data, size)));
    return 0;
}
