#include "tests/tools/mrctl/Diagnosis.h"

#include <gtest/gtest.h>
#include <utility>

namespace nimbra::test {
namespace {

using device::DeviceDescription;

DeviceDescription synced() {
    DeviceDescription description;
    description.accounts = {{.identifier = "ann@example.com",
                             .primary = true,
                             .usesStratafile = true,
                             .enabled = {"kAccountDataclassTidewater"}},
                            {.identifier = "older"}};
    description.containers = {{.identifier = "com.example.notes", .isPublic = true},
                              {.identifier = "com.example.drafts"}};
    description.lastSyncDate = "2024-03-05T13:00:00Z";
    description.lastSyncText = "Last synced at one";
    return description;
}

TEST(MrctlStatusTest, TheTextTellsWhatTheServiceKnows) {
    const Diagnosis diagnosis;
    diagnosis.make(synced());
    diagnosis.write("/run/nimbra/progress/up.json",
                    R"({"fraction": 0.4, "description": "Uploading Tax.pdf"})");

    const ProgramResult result = diagnosis.run({"status"});

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.messages, "");
    EXPECT_EQ(result.output, "Accounts:\n"
                             "  ann@example.com (primary): documents on, new storage\n"
                             "  older: documents off, old storage\n"
                             "Containers:\n"
                             "  com.example.notes (public)\n"
                             "  com.example.drafts\n"
                             "Last sync: 2024-03-05T13:00:00Z (Last synced at one)\n"
                             "Under way:\n"
                             "  up: 40 %, Uploading Tax.pdf\n");
}

TEST(MrctlStatusTest, OnlyASyncThatIsCompleteShowsAsComplete) {
    const Diagnosis diagnosis;
    diagnosis.make(synced());
    for (const auto& [fraction, words] : {std::pair{"0", "0 %"},
                                          {"0.29", "29 %"},
                                          {"0.999", "99 %"},
                                          {"0.9999999", "99 %"},
                                          {"1", "100 %"}}) {
        diagnosis.write("/run/nimbra/progress/up.json",
                        std::string(R"({"fraction": )") + fraction + '}');

        const ProgramResult result = diagnosis.run({"status"});

        EXPECT_TRUE(result.output.ends_with(std::string("\n  up: ") + words + '\n'))
            << fraction << ": " << result.output;
    }
}

TEST(MrctlStatusTest, ADeviceThatKnowsNothingSaysSo) {
    const Diagnosis diagnosis;
    DeviceDescription description;
    description.accounts.clear();
    diagnosis.make(description);

    EXPECT_EQ(diagnosis.run({"status"}).output,
              "Accounts: none\nContainers: none\nLast sync: never\nUnder way: none\n");
}

TEST(MrctlStatusTest, TheJsonTellsTheSame) {
    const Diagnosis diagnosis;
    diagnosis.make(synced());
    diagnosis.write("/run/nimbra/progress/up.json", R"({"fraction": 0.5})");

    EXPECT_EQ(nlohmann::json::parse(diagnosis.run({"status", "--json"}).output),
              nlohmann::json::parse(R"({
        "accounts": [{"identifier": "ann@example.com", "primary": true, "documents": true,
                      "storage": "new"},
                     {"identifier": "older", "primary": false, "documents": false,
                      "storage": "old"}],
        "containers": [{"identifier": "com.example.notes", "public": true},
                       {"identifier": "com.example.drafts", "public": false}],
        "lastSyncDate": "2024-03-05T13:00:00Z", "lastSyncText": "Last synced at one",
        "progress": [{"name": "up", "fraction": 0.5, "indeterminate": false, "description": null,
                      "additional": null}]})"));
}

TEST(MrctlStatusTest, WhatCannotBeReadIsOneLineAndStatusOne) {
    const Diagnosis diagnosis;
    diagnosis.make({});
    diagnosis.write("/var/lib/nimbra/documents.json", "{");

    const ProgramResult result = diagnosis.run({"status"});

    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.output, "");
    EXPECT_TRUE(result.messages.contains("documents.json: ")) << result.messages;
    EXPECT_EQ(result.messages.find('\n'), result.messages.size() - 1);
}

TEST(MrctlStatusTest, OutputThatCannotBeWrittenIsAFailure) {
    const Diagnosis diagnosis;
    diagnosis.make({});

    const ProgramResult result =
        runProgram({"sh", "-c", "exec \"$0\" --root \"$1\" status >/dev/full", NIMBRA_MRCTL,
                    diagnosis.root().string()},
                   {"PATH=/usr/bin:/bin"});

    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.messages, "mrctl: the output cannot be written\n");
}

} // namespace
} // namespace nimbra::test
