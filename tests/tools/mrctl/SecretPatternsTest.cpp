#include "tools/mrctl/SecretPatterns.h"

#include <algorithm>
#include <gtest/gtest.h>
#include <string>

namespace nimbra::mrctl {
namespace {

constexpr auto root = "/srv/phone";

/// A path in a home directory.
std::string home(const std::string& rest) {
    return "/home" + ('/' + rest);
}

/// `text` with "<kind>" in the place of every piece that is found alone.
std::string marked(const std::string& text) {
    auto found = findSecrets(text, root);
    std::ranges::stable_sort(found, [](const FoundSecret& left, const FoundSecret& right) {
        return left.begin != right.begin ? left.begin < right.begin : left.size > right.size;
    });
    std::string result;
    std::size_t done = 0;
    for (const auto& [begin, size, kind] : found) {
        if (begin < done) {
            EXPECT_LE(begin + size, done) << "overlaps in " << text;
            continue;
        }
        result += text.substr(done, begin - done) + '<' + std::string(nameOf(kind)) + '>';
        done = begin + size;
    }
    return result + text.substr(done);
}

TEST(SecretPatternsTest, AddressesAreFound) {
    EXPECT_EQ(marked("mail to ann.lee+x@example.co.uk."), "mail to <email>.");
    EXPECT_EQ(marked("(björn@exämple.se)"), "(<email>)");
    EXPECT_EQ(marked("id ann%40example.com"), "id <email>");
    EXPECT_EQ(marked("a @ b"), "a @ b");
}

TEST(SecretPatternsTest, NamedSecretsAreFound) {
    EXPECT_EQ(marked("password=hunter2 x"), "password=<secret> x");
    EXPECT_EQ(marked("access_token: abc, count: 5"), "access_token: <secret>, count: 5");
    EXPECT_EQ(marked(R"({"apiKey": "a\"b c", "n": 1})"), R"({"apiKey": "<secret>", "n": 1})");
    EXPECT_EQ(marked(R"({\"Password\":\"a b\"})"), R"({\"Password\":\"<secret>\"})");
    EXPECT_EQ(marked("Passwd = 'a b' y"), "Passwd = '<secret>' y");
    EXPECT_EQ(marked("password: null"), "password: null");
    EXPECT_EQ(marked("x?token=abc&n=5"), "x?token=<secret>&n=5");
    EXPECT_EQ(marked("the password is kept"), "the password is kept");
}

TEST(SecretPatternsTest, BearersAreFound) {
    EXPECT_EQ(marked("Bearer abc.def-1"), "Bearer <secret>");
    EXPECT_EQ(marked("Authorization: Bearer abcdefg"), "Authorization: Bearer <secret>");
    EXPECT_EQ(marked("basic settings"), "basic settings");
}

TEST(SecretPatternsTest, LongEncodedTextsAreFound) {
    EXPECT_EQ(marked("key 0123456789abcdef."), "key <secret>.");
    EXPECT_EQ(marked("6f9619ff-8b86-d011-b42d-00c04fc964ff"), "<secret>");
    EXPECT_EQ(marked("got dGhpcyBpcyBhIHNlY3JldA== back"), "got <secret> back");
}

TEST(SecretPatternsTest, NamesAndTimesAreNotTakenForTokens) {
    for (const std::string text :
         {"VTUIDocumentsDataViewController: Setting source view",
          "com.vantrel.private.vantrelaccount.app-hidden-from-nimbra-settings",
          "kAccountDataclassTidewater", "2024-03-05T13:00:00.123+0000 error: it failed",
          "PreferenceBundles/AccountSettings", "NimbraDriveSettings.bundle/manifest.json"}) {
        EXPECT_EQ(marked(text), text);
    }
}

TEST(SecretPatternsTest, UrlsKeepTheirHostOnly) {
    EXPECT_EQ(marked("see https://host.example/a/b.html now"),
              "see https://host.example<path> now");
    EXPECT_EQ(marked("https://ann:p@w@host:8/"), "https://<secret>/");
    EXPECT_EQ(marked("https://host.example/"), "https://host.example/");
}

TEST(SecretPatternsTest, PathsAreFoundToTheirEnds) {
    EXPECT_EQ(marked("can't read " + home("ann/My Tax 2023.pdf") + ": it has gone"),
              "can't read <path>: it has gone");
    EXPECT_EQ(marked('"' + home("ann/a: b") + "\" has gone"), "\"<path>\" has gone");
    EXPECT_EQ(marked("in " + home("ann/x") + "."), "in <path>.");
    EXPECT_EQ(marked("of /Users/ann/Music"), "of <path>");
    EXPECT_EQ(marked("at ~/Music"), "at <path>");
    EXPECT_EQ(marked("at /root"), "at <path>");
    EXPECT_EQ(marked("file://" + home("ann/x")), "file://<path>");
    EXPECT_EQ(marked("/run/nimbra/progress/Tax.json: expected"), "<path>: expected");
}

TEST(SecretPatternsTest, PathsThatAreTheSameOnEveryDeviceStay) {
    for (const std::string text :
         {"/var/lib/nimbra/documents.json: /containers/0/identifier: wrong", "and/or", "1 / 2",
          "/usr/share/applications/com.example.notes.desktop: line 1"}) {
        EXPECT_EQ(marked(text), text);
    }
    EXPECT_EQ(marked("/usr/../" + home("ann/x").substr(1)), "<path>");
}

TEST(SecretPatternsTest, TheDevicesOwnPlaceAloneGoesFromItsPaths) {
    EXPECT_EQ(marked("/srv/phone/var/lib/nimbra/accounts.db: damaged"),
              "<path>/var/lib/nimbra/accounts.db: damaged");
    EXPECT_EQ(marked("/srv/phone" + home("ann/x")), "<path>");
    EXPECT_EQ(marked("/srv/phone2/var"), "<path>");
}

TEST(SecretPatternsTest, DocumentNamesAreFound) {
    EXPECT_EQ(marked("uploading Tax2023.pdf now"), "uploading <file> now");
    EXPECT_EQ(marked("uploading \"My Tax.PDF\" now"), "uploading \"<file>\" now");
    EXPECT_EQ(marked("documents.json and settings.log"), "documents.json and settings.log");
}

TEST(SecretPatternsTest, WhatAMessageQuotesOfAFileIsFound) {
    EXPECT_EQ(marked("x.json: /name: expected a string, found {\"a\": \"Ann\"}"),
              "x.json: /name: expected a string, found <text>");
    EXPECT_EQ(marked("x.json: /name: expected a string, found nothing"),
              "x.json: /name: expected a string, found nothing");
}

TEST(SecretPatternsTest, NamesTellOfTheirValues) {
    EXPECT_EQ(kindOfValueNamed("com.example.refreshToken"), SecretKind::secret);
    EXPECT_EQ(kindOfValueNamed("API-Key"), SecretKind::secret);
    EXPECT_EQ(kindOfValueNamed("user_name"), SecretKind::user);
    EXPECT_EQ(kindOfValueNamed("accountIdentifier"), SecretKind::account);
    EXPECT_EQ(kindOfValueNamed("deviceName"), SecretKind::device);
    EXPECT_EQ(kindOfValueNamed("log.level"), std::nullopt);
}

} // namespace
} // namespace nimbra::mrctl
