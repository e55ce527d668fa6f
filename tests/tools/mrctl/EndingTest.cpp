#include "tools/mrctl/Ending.h"

#include "tests/tools/mrctl/Diagnosis.h"

#include <gtest/gtest.h>
#include <new>
#include <sstream>
#include <stdexcept>

namespace nimbra::mrctl {
namespace {

using test::Diagnosis;
using test::ProgramResult;

/// Runs the program by a shell with its standard output as `redirection` says.
ProgramResult runInto(const std::string& redirection, const std::string& arguments,
                      const Diagnosis& diagnosis) {
    return test::runProgram({"sh", "-c",
                             "exec \"$0\" --root \"$1\" " + arguments + ' ' + redirection,
                             NIMBRA_MRCTL, diagnosis.root().string()},
                            {"PATH=/usr/bin:/bin"});
}

TEST(MrctlEndingTest, AProgramThatEndsGivesItsStatus) {
    std::ostringstream messages;

    EXPECT_EQ(exitStatusOf([] { return 2; }, messages), 2);
    EXPECT_EQ(messages.str(), "");
}

TEST(MrctlEndingTest, WhatIsThrownIsOneLineAndStatusOne) {
    std::ostringstream memory;
    std::ostringstream other;

    EXPECT_EQ(exitStatusOf([]() -> int { throw std::bad_alloc(); }, memory), 1);
    EXPECT_EQ(exitStatusOf([]() -> int { throw std::runtime_error("two\nlines"); }, other), 1);

    EXPECT_EQ(memory.str(), "mrctl: there is not enough memory\n");
    EXPECT_EQ(other.str(), "mrctl: two lines\n");
}

TEST(MrctlEndingTest, OutputThatCannotBeWrittenIsOneLineAndStatusOne) {
    const Diagnosis diagnosis;
    diagnosis.make({});
    for (const char* const arguments :
         {"--help", "--version", "status --help", "status", "status --json"}) {
        for (const char* const redirection : {">/dev/full", ">&-", ">&- <&-"}) {
            const ProgramResult result = runInto(redirection, arguments, diagnosis);

            EXPECT_EQ(result.status, 1) << arguments << redirection;
            EXPECT_EQ(result.messages, "mrctl: the output cannot be written\n")
                << arguments << redirection;
        }
    }
}

// The sanitizers need far more memory than they are given here.
#ifndef NIMBRA_SANITIZED
TEST(MrctlEndingTest, TooLittleMemoryIsOneLineAndLeavesNothing) {
    const Diagnosis diagnosis;
    diagnosis.make({});
    std::string values = "{\"a\": [0";
    while (values.size() < 15'000'000) {
        values += ",0";
    }
    diagnosis.write("/var/lib/nimbra/preferences/com.example.large.json", values + "]}");

    const ProgramResult result =
        test::runProgram({"sh", "-c", "ulimit -v 150000; exec \"$0\" --root \"$1\" diagnose \"$2\"",
                          NIMBRA_MRCTL, diagnosis.root().string(), diagnosis.archive().string()},
                         {"PATH=/usr/bin:/bin"});

    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.messages, "mrctl: there is not enough memory\n");
    EXPECT_EQ(diagnosis.namesInPlace(), std::vector<std::string>());
}
#endif

} // namespace
} // namespace nimbra::mrctl
