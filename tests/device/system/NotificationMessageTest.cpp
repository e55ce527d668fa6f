#include "device/system/NotificationMessage.h"

#include <cmath>
#include <gtest/gtest.h>
#include <limits>
#include <string>
#include <utility>
#include <vector>

namespace nimbra::device {
namespace {

const UserInfoKey key{"key"};

/// What `value` is at the other end.
UserInfoValue sent(const UserInfoValue& value) {
    const auto received = parseNotificationMessage(
        notificationMessage({.name = NotificationName("name"), .userInfo = {{key, value}}}));
    EXPECT_TRUE(received) << received.error();
    return received->userInfo.at(key);
}

TEST(NotificationMessageTest, EveryTypeOfValueComesOutAsItWentIn) {
    using Doubles = std::numeric_limits<double>;
    using Integers = std::numeric_limits<std::int64_t>;
    const Date precise(std::chrono::microseconds(1'700'000'000'123'456));
    const std::vector<UserInfoValue> values{true,
                                            false,
                                            Integers::min(),
                                            Integers::max(),
                                            0.1,
                                            -0.0,
                                            5e-324,
                                            Doubles::max(),
                                            Doubles::infinity(),
                                            Text("é\n\"\\ دفتر 😀"),
                                            Text(""),
                                            Text(),
                                            precise,
                                            Date(),
                                            Date::min(),
                                            Date::max()};
    for (const UserInfoValue& value : values) {
        EXPECT_EQ(sent(value), value) << value.index();
    }
    EXPECT_TRUE(std::isnan(std::get<double>(sent(Doubles::quiet_NaN()))));
}

TEST(NotificationMessageTest, TheNameComesOutAsItWentIn) {
    const auto received =
        parseNotificationMessage(notificationMessage({.name = NotificationName("a \"name\"")}));

    ASSERT_TRUE(received) << received.error();
    EXPECT_EQ(received->name, NotificationName("a \"name\""));
    EXPECT_TRUE(received->userInfo.empty());
}

TEST(NotificationMessageTest, BytesThatAreNotTextAreReplaced) {
    EXPECT_EQ(sent(Text("a\xff")), UserInfoValue(Text("a\xef\xbf\xbd")));
}

TEST(NotificationMessageTest, WhatCannotTravelStaysBehind) {
    const int sender = 0;
    const Notification posted =
        distributable({.name = NotificationName("name"),
                       .object = &sender,
                       .userInfo = {{key, std::int64_t{1}},
                                    {UserInfoKey("nothing"), {}},
                                    {UserInfoKey("account"), std::shared_ptr<Account>()}}});

    EXPECT_EQ(posted.name, NotificationName("name"));
    EXPECT_EQ(posted.object, nullptr);
    EXPECT_EQ(posted.userInfo, (UserInfo{{key, std::int64_t{1}}}));
}

TEST(NotificationMessageTest, AnythingElseIsAnErrorThatNamesThePlace) {
    for (const auto& [message, problem] :
         {std::pair("", "notification: line 1, column 1"), std::pair("[]", "notification: "),
          std::pair("{}", "/name"), std::pair(R"({"name": 5})", "/name"),
          std::pair(R"({"name": "a", "more": 1})", "/more"),
          std::pair(R"({"name": "a", "userInfo": 1})", "/userInfo"),
          std::pair(R"({"name": "a", "userInfo": {"k": 1}})", "/userInfo/k"),
          std::pair(R"({"name": "a", "userInfo": {"k": {}}})", "/userInfo/k"),
          std::pair(R"({"name": "a", "userInfo": {"k": {"url": "x"}}})", "/userInfo/k"),
          std::pair(R"({"name": "a", "userInfo": {"k": {"boolean": 1}}})", "/userInfo/k/boolean"),
          std::pair(R"({"name": "a", "userInfo": {"k": {"integer": 1.5}}})", "/userInfo/k/integer"),
          std::pair(R"({"name": "a", "userInfo": {"k": {"number": "1x"}}})", "/userInfo/k/number"),
          std::pair(R"({"name": "a", "userInfo": {"k": {"text": 1}}})", "/userInfo/k/text"),
          std::pair(R"({"name": "a", "userInfo": {"k": {"date": "now"}}})", "/userInfo/k/date")}) {
        const auto received = parseNotificationMessage(message);
        ASSERT_FALSE(received) << message;
        EXPECT_NE(received.error().description.find(problem), std::string::npos)
            << received.error();
    }
}

} // namespace
} // namespace nimbra::device
