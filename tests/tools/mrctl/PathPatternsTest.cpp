#include "tests/tools/mrctl/MarkedText.h"

#include <gtest/gtest.h>
#include <string>

namespace nimbra::mrctl {
namespace {

/// A path in a home directory.
std::string home(const std::string& rest) {
    return "/home" + ('/' + rest);
}

TEST(PathPatternsTest, PathsAreFoundToTheirEnds) {
    EXPECT_EQ(marked("can't read " + home("ann/My Tax 2023.pdf") + ": it has gone"),
              "can't read <path>");
    EXPECT_EQ(marked(home("ann/x: y") + ": cannot be read: Permission denied"),
              "<path>: cannot be read: Permission denied");
    EXPECT_EQ(marked(home("ann/x: y") + ": Permission denied"), "<path>: Permission denied");
    EXPECT_EQ(marked('\'' + home("ann/Ann's own") + "\' has gone"), "\'<path>\' has gone");
    EXPECT_EQ(marked('"' + home("ann/a: b") + "\" has gone"), "\"<path>\" has gone");
    EXPECT_EQ(marked("in " + home("ann/x") + "."), "in <path>.");
    EXPECT_EQ(marked("of /Users/ann/Music"), "of <path>");
    EXPECT_EQ(marked("at ~/Music"), "at <path>");
    EXPECT_EQ(marked("at /root"), "at <path>");
    EXPECT_EQ(marked("file://" + home("ann/x")), "file://<path>");
    EXPECT_EQ(marked("/run/nimbra/progress/Tax.json: expected a list"), "<path>: expected a list");
}

TEST(PathPatternsTest, TheReasonBehindAPathStays) {
    for (const std::string reason : {": line 1, column 14: not JSON: syntax error",
                                     ": Permission denied (PlatformErrorDomain 5)"}) {
        EXPECT_EQ(marked(home("ann/x: y") + reason), "<path>" + reason);
    }
    for (const std::string end : {": line 1", ": line 1, column 2", ": Bob (PlatformErrorDomain 5)",
                                  ": Permission denied (Bob)", ": Permission denied (BobMiller 5)",
                                  " (PlatformErrorDomain 5)"}) {
        EXPECT_EQ(marked(home("ann/x") + end), end.ends_with(')') ? "<path>)" : "<path>") << end;
    }
}

TEST(PathPatternsTest, HomesAreFoundHoweverTheyAreWritten) {
    for (const std::string& text :
         {std::string("~hans/Plan"), std::string("cd ~hans now"), std::string("$HOME/hans"),
          std::string("%2Fhome%2Fhans"), "cwd" + home("hans/x"), home("hans/x").substr(1),
          std::string(R"(C:\Users\hans\X)"), std::string(R"(C:\\Users\\hans)"),
          std::string(R"(\/home\/hans\/x)"), std::string(R"(\\server\hans\x)"),
          std::string("/hansone"), std::string("/etc/hans-vpn.conf"),
          std::string("/proc/1/cwd/hans"), std::string("/dev/mapper/hans-crypt"),
          std::string("/var/lib/nimbra/hans/x"), std::string("/System/Volumes/Data/hans"),
          "\"" + home("h/a\\\"hans.bin\""), home("h/Meine: Steuer/hans"),
          "file://" + home("x/My%20hans")}) {
        EXPECT_FALSE(marked("in " + text).contains("hans")) << text << ": " << marked("in " + text);
    }
}

TEST(PathPatternsTest, PathsThatAreTheSameOnEveryDeviceStay) {
    for (const std::string text :
         {"/var/lib/nimbra/documents.json: /containers/0/identifier: wrong", "and/or", "1 / 2",
          "/usr/share/applications/com.example.notes.desktop: line 1"}) {
        EXPECT_EQ(marked(text), text);
    }
    const std::string diagnostics = "/var/mobile/Library/Logs/CrashReporter/DiagnosticLogs";
    for (const std::string& text : {diagnostics + "/Stratafile: x (y 5)", '"' + diagnostics + '"',
                                    "at " + diagnostics + "."}) {
        EXPECT_EQ(marked("in " + text), "in " + text);
        EXPECT_EQ(marked(kMarkedRoot + text.substr(text.find('/'))),
                  "<path>" + text.substr(text.find('/')));
    }
    EXPECT_EQ(marked("/var/mobile/Library: Bob Lee/Tax end"), "<path>");
    for (const std::string rest :
         {"/a: b", " Bob", ": Bob", "/Stratafile/Bob", "2", ", Bob", ":Bob"}) {
        EXPECT_EQ(marked(diagnostics + rest), "<path>") << rest;
    }
    EXPECT_EQ(marked("/usr/../" + home("ann/x").substr(1)), "<path>");
}

TEST(PathPatternsTest, TheDevicesOwnPlaceAloneGoesFromItsPaths) {
    EXPECT_EQ(marked("/srv/phone/var/lib/nimbra/accounts.db: damaged"),
              "<path>/var/lib/nimbra/accounts.db: damaged");
    EXPECT_EQ(marked("/srv/phone" + home("ann/x")), "<path>");
    EXPECT_EQ(marked("/srv/phone2/var"), "<path>");
}

} // namespace
} // namespace nimbra::mrctl
