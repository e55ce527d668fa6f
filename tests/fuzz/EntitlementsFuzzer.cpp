#include "tests/fuzz/EntryChecks.h"
#include "tests/fuzz/Fuzzer.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    nimbra::test::expectNoFault(
        nimbra::test::faultInEntitlements(nimbra::test::textOf(data, size)));
    return 0;
}
