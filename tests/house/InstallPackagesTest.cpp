#include "tests/house/Command.h"
#include "tests/house/ScratchTree.h"

#include <filesystem>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <string>

namespace nimbra::test {
namespace {

using testing::HasSubstr;

/// A system of its own, with the programs that the script calls and no others: stand-ins for those
/// that look up and install, which write down how they were called. "there" is the only package
/// that is installed.
class InstallPackages : public testing::Test {
protected:
    void SetUp() override {
        std::filesystem::create_directory(bin());
        for (const std::string tool :
             {"bash", "cat", "env", "grep", "mktemp", "rm", "tail", "wc"}) {
            std::string place = run({"sh", "-c", "command -v " + tool}).output;
            place.pop_back();
            std::filesystem::create_symlink(place, bin() / tool);
        }
        program("dpkg-query", "[ \"$4\" = there ] && echo installed");
        program("id", "echo 0");
        program("apt-get", succeeding);
    }

    void program(const std::string& name, const std::string& body) const {
        tree.writeProgram("bin/" + name, "#!/usr/bin/env bash\n" + body + "\n");
    }

    /// Runs the script over a list of these lines.
    [[nodiscard]] CommandResult install(const std::string& lines) const {
        tree.write("packages.txt", lines);
        return run({"env", "PATH=" + bin().string(), "CALLS=" + calls(), script,
                    tree.root() / "packages.txt"});
    }

    [[nodiscard]] std::filesystem::path bin() const { return tree.root() / "bin"; }
    [[nodiscard]] std::string calls() const { return tree.root() / "calls"; }
    [[nodiscard]] std::string called() const { return run({"cat", calls()}).output; }

    static constexpr const char* script = NIMBRA_SOURCE_DIR "/tools/dev/install-packages";
    static constexpr const char* succeeding = R"(echo "$@" >>"$CALLS")";
    ScratchTree tree;
};

TEST_F(InstallPackages, NothingIsRunWhenAllPackagesAreThere) {
    const CommandResult result = install("# what it is for\n\nthere\n");

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.output, "");
    EXPECT_THAT(called(), HasSubstr("No such file"));
}

TEST_F(InstallPackages, OnlyWhatIsMissingIsInstalled) {
    const CommandResult result = install("there\nabsent\n");

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.output, "Installing absent\n");
    EXPECT_EQ(called(), "-q -y install --no-install-recommends absent\n");
}

TEST_F(InstallPackages, AnOldPackageListIsRenewedOnce) {
    // The first installation fails; what comes after it succeeds.
    program("apt-get", R"sh(echo "$@" >>"$CALLS"; [ "$(wc -l <"$CALLS")" -gt 1 ])sh");

    const CommandResult result = install("absent\n");

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(called(), "-q -y install --no-install-recommends absent\n-q -y update\n"
                        "-q -y install --no-install-recommends absent\n");
}

TEST_F(InstallPackages, AFailureShowsWhatTheInstallerSaid) {
    program("apt-get", "echo 'no space left'; exit 100");

    const CommandResult result = install("absent\n");

    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.output, "Installing absent\n"
                             "install-packages: could not install them: no space left\n");
}

TEST_F(InstallPackages, WithoutANetworkOneLineSaysSo) {
    program("apt-get", R"sh(case $* in
        *update) echo 'Err:1 somewhere'; echo 'W: Failed to fetch a: failure resolving b'
                 echo 'W: Failed to fetch c: failure resolving b' ;;
        *) echo 'Reading package lists...'; echo 'E: Unable to locate package absent'; exit 100 ;;
        esac)sh");

    const CommandResult result = install("absent\n");

    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.output, "Installing absent\ninstall-packages: could not install them: "
                             "W: Failed to fetch a: failure resolving b\n");
}

TEST_F(InstallPackages, WithoutRootItAsksSudo) {
    program("id", "echo 1000");
    program("sudo", R"(echo "sudo $1" >>"$CALLS"; shift; exec "$@")");

    const CommandResult result = install("absent\n");

    EXPECT_EQ(result.status, 0);
    EXPECT_THAT(called(), HasSubstr("sudo -n\n"));
    EXPECT_THAT(called(), HasSubstr("install --no-install-recommends absent\n"));
}

TEST_F(InstallPackages, NothingIsBegunWhereSudoRefuses) {
    program("id", "echo 1000");
    program("sudo", "echo 'sudo: a password is required' >&2; exit 1");

    const CommandResult result = install("absent\n");

    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.output, "install-packages: sudo: a password is required; to be installed as "
                             "root: absent\n");
    EXPECT_THAT(called(), HasSubstr("No such file"));
}

TEST_F(InstallPackages, WithNeitherRootNorSudoItSaysWhatIsMissing) {
    program("id", "echo 1000");

    const CommandResult result = install("there\nabsent\nlacking\n");

    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.output, "install-packages: neither root nor sudo to install what is missing: "
                             "absent lacking\n");
}

} // namespace
} // namespace nimbra::test
