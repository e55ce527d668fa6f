#include "tests/device/accounts/DeviceListFixture.h"

#include <sys/stat.h>

namespace nimbra::test {
namespace {

using std::chrono::seconds;

using DeviceListServiceTest = DeviceListFixture;

TEST_F(DeviceListServiceTest, TheAnswerIsWhatTheFileSays) {
    write({"Old Pad"}, {"Phone", "Laptop"});

    ask();
    pump();

    ASSERT_EQ(answers.size(), 1U);
    EXPECT_EQ(incompatible(), Names{"Old Pad"});
    EXPECT_EQ(needUpgrade(), (Names{"Phone", "Laptop"}));
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(DeviceListServiceTest, NamesComeAsTheyStandInTheFile) {
    const Names odd{"b",
                    "a",
                    "b",
                    "",
                    "  spaces ",
                    "{0}\"'}{",
                    "a\nb\tc",
                    "😀 ك",
                    "\\n %s",
                    "null",
                    std::string("a\0b", 3),
                    std::string(10'000, 'x')};
    write(odd, {odd.rbegin(), odd.rend()});

    ask();
    pump();

    ASSERT_EQ(answers.size(), 1U);
    EXPECT_EQ(incompatible(), odd);
    EXPECT_EQ(needUpgrade(), Names(odd.rbegin(), odd.rend()));
}

TEST_F(DeviceListServiceTest, SeveralThousandNamesKeepTheirOrder) {
    Names many;
    for (int number = 0; number < 5000; ++number) {
        many.push_back("Device " + std::to_string(number));
    }
    write(many, many);

    ask();
    pump();

    ASSERT_EQ(answers.size(), 1U);
    EXPECT_EQ(incompatible(), many);
    EXPECT_EQ(needUpgrade(), many);
}

TEST_F(DeviceListServiceTest, WithoutTheFileThereAreNoDevicesAndNoLine) {
    ask();
    pump();

    ASSERT_EQ(answers.size(), 1U);
    EXPECT_EQ(incompatible(), Names{});
    EXPECT_EQ(needUpgrade(), Names{});
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(DeviceListServiceTest, WhatTheFileLeavesOutHasItsDefault) {
    for (const char* const text : {"{}", R"({"outcome": "answers"})", R"({"delay": 0})"}) {
        write(text);
        ask();
        pump();
        ASSERT_TRUE(answers.back()) << text;
        EXPECT_EQ(incompatible(), Names{}) << text;
        EXPECT_EQ(needUpgrade(), Names{}) << text;
    }
    EXPECT_EQ(answers.size(), 3U);
}

TEST_F(DeviceListServiceTest, ABrokenFileIsNoAnswerAndOneLine) {
    const std::string file = "/var/lib/nimbra/device-list.json: ";
    auto expectLine = [&, lines = std::size_t{0}](const std::string& text,
                                                  const std::string& message) mutable {
        write(text);
        ask();
        pump();
        EXPECT_EQ(answers.size(), ++lines) << text;
        EXPECT_EQ(answers.back(), std::nullopt) << text;
        ASSERT_EQ(log.lines().size(), lines) << text;
        EXPECT_EQ(log.lines().back(), file + message);
    };
    expectLine("", "line 1, column 1: not JSON: syntax error while parsing value - unexpected end "
                   "of input; expected '[', '{', or a literal");
    expectLine("[]", "/: expected an object, found []");
    expectLine(R"({"incompatible": "Phone"})", "/incompatible: expected an array, found \"Phone\"");
    expectLine(R"({"needUpgrade": null})", "/needUpgrade: expected an array, found null");
    expectLine(R"({"needUpgrade": ["a", 7]})", "/needUpgrade/1: expected a string, found 7");
    expectLine(R"({"outcome": "never"})", "/outcome: expected one of \"answers\", \"fails\", "
                                          "\"never answers\", found \"never\"");
    expectLine(R"({"outcome": null})", "/outcome: expected one of \"answers\", \"fails\", "
                                       "\"never answers\", found null");
    expectLine(R"({"delay": -0.5})",
               "/delay: expected a number of seconds, 0 or above, found -0.5");
    expectLine(R"({"delay": "1"})", "/delay: expected a number, found \"1\"");
    expectLine(R"({"devices": []})", "/devices: unknown key; expected one of incompatible, "
                                     "needUpgrade, outcome, delay");
}

TEST_F(DeviceListServiceTest, APipeIsNotWaitedFor) {
    std::filesystem::create_directories(path().parent_path());
    ASSERT_EQ(::mkfifo(path().c_str(), 0644), 0);

    ask();
    pump();

    ASSERT_EQ(answers.size(), 1U);
    EXPECT_EQ(answers.front(), std::nullopt);
    EXPECT_EQ(log.lines(), Names{"/var/lib/nimbra/device-list.json: is not a plain file"});
}

TEST_F(DeviceListServiceTest, AFileThatCannotBeReadIsNoAnswerAndOneLine) {
    std::filesystem::create_directories(path());
    ask();
    pump();
    std::filesystem::remove(path());
    std::filesystem::create_symlink("device-list.json", path());
    ask();
    pump();

    EXPECT_EQ(answers.size(), 2U);
    EXPECT_EQ(answers.front(), std::nullopt);
    EXPECT_EQ(answers.back(), std::nullopt);
    EXPECT_EQ(log.lines(),
              (Names{"/var/lib/nimbra/device-list.json: is a directory",
                     "/var/lib/nimbra/device-list.json: cannot be followed: Too many levels of "
                     "symbolic links"}));
}

TEST_F(DeviceListServiceTest, AServiceThatFailsGivesNoListAndNoLine) {
    write(R"({"incompatible": ["a"], "outcome": "fails"})");

    ask();
    pump();

    ASSERT_EQ(answers.size(), 1U);
    EXPECT_EQ(answers.front(), std::nullopt);
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(DeviceListServiceTest, WithoutAnAccountThereIsNoListWhateverTheFileSays) {
    for (const char* const text : {R"({"incompatible": ["a"]})", "{", R"({"delay": 5})",
                                   R"({"outcome": "never answers"})"}) {
        write(text);
        service->initWithAccount(nullptr)->performRequestWithHandler(noting());
        pump();
        EXPECT_EQ(answers.back(), std::nullopt) << text;
    }
    EXPECT_EQ(answers.size(), 4U);
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(DeviceListServiceTest, AskingReturnsAtOnceAndTheFileIsReadAtTheAnswer) {
    write({"earlier"}, {});
    ask();
    EXPECT_TRUE(answers.empty());
    write({"later"}, {});

    pump();

    ASSERT_EQ(answers.size(), 1U);
    EXPECT_EQ(incompatible(), Names{"later"});
}

TEST_F(DeviceListServiceTest, TheQueueIsMadeAtTheFirstQuestionForAll) {
    const auto request = service->initWithAccount(account);
    EXPECT_TRUE(queues.queues.empty());

    request->performRequestWithHandler(noting());
    ask();

    ASSERT_EQ(queues.queues.size(), 1U);
    EXPECT_EQ(queues.queues.front()->label(), "device-list");
}

TEST_F(DeviceListServiceTest, ManyQuestionsAreAnsweredOnceEachInTheirOrder) {
    write({"a"}, {});
    std::vector<int> order;
    for (int number = 0; number < 1000; ++number) {
        service->initWithAccount(account)->performRequestWithHandler(
            [&order, number](const DeviceListRequest&, const auto& response) {
                EXPECT_TRUE(response);
                order.push_back(number);
            });
    }

    pump();
    pump();

    ASSERT_EQ(order.size(), 1000U);
    for (int number = 0; number < 1000; ++number) {
        EXPECT_EQ(order[static_cast<std::size_t>(number)], number);
    }
}

TEST_F(DeviceListServiceTest, AHandlerIsLetGoRightAfterItsCall) {
    const auto held = std::make_shared<int>();
    ask(held);
    ask(held);
    EXPECT_EQ(held.use_count(), 3);

    queues.queues.front()->pumpOne();
    EXPECT_EQ(held.use_count(), 2);
    queues.queues.front()->pumpOne();
    EXPECT_EQ(held.use_count(), 1);
}

TEST_F(DeviceListServiceTest, ARequestThatWasLetGoIsHandedToItsHandlerAllTheSame) {
    const DeviceListRequest* handed = nullptr;
    auto request = service->initWithAccount(account);
    const std::weak_ptr<DeviceListRequest> watched = request;
    const DeviceListRequest* const made = request.get();
    request->performRequestWithHandler(
        [&handed](const DeviceListRequest& asked, const auto&) { handed = &asked; });
    request.reset();
    EXPECT_FALSE(watched.expired());

    pump();

    EXPECT_EQ(handed, made);
    EXPECT_TRUE(watched.expired());
    EXPECT_EQ(account.use_count(), 1);
}

TEST_F(DeviceListServiceTest, AHandlerMayAskAgain) {
    service->initWithAccount(account)->performRequestWithHandler(
        [this](const DeviceListRequest&, const auto&) { ask(); });

    pump();

    EXPECT_EQ(answers.size(), 1U);
}

TEST_F(DeviceListServiceTest, ADelayedAnswerComesWhenItsTimeHasComeAndLeavesNothing) {
    const auto held = std::make_shared<int>();
    write(R"({"incompatible": ["earlier"], "delay": 2.5})");
    ask(held);
    pump();
    advance(seconds(2));
    EXPECT_TRUE(answers.empty());
    write({"later"}, {});

    advance(std::chrono::milliseconds(500));

    ASSERT_EQ(answers.size(), 1U);
    EXPECT_EQ(incompatible(), Names{"later"});
    EXPECT_EQ(held.use_count(), 1);
    EXPECT_EQ(account.use_count(), 1);
    EXPECT_EQ(queues.time->nextDeadline(), std::nullopt);
    advance(seconds(10));
    EXPECT_EQ(answers.size(), 1U);
}

TEST_F(DeviceListServiceTest, WhatTheFileSaysWhenTheTimeHasComeCounts) {
    const std::string delayed = R"({"delay": 1})";
    const auto answerWith = [&](const std::string& text) {
        write(delayed);
        ask();
        pump();
        write(text);
        advance(seconds(1));
    };
    answerWith(delayed);
    ASSERT_EQ(answers.size(), 1U);
    EXPECT_TRUE(answers.back());
    answerWith(R"({"delay": 1, "outcome": "fails"})");
    ASSERT_EQ(answers.size(), 2U);
    EXPECT_EQ(answers.back(), std::nullopt);
    EXPECT_TRUE(log.lines().empty());
    answerWith("{");
    ASSERT_EQ(answers.size(), 3U);
    EXPECT_EQ(answers.back(), std::nullopt);
    EXPECT_EQ(log.lines().size(), 1U);
    answerWith(R"({"outcome": "never answers"})");
    advance(seconds(1000));
    EXPECT_EQ(answers.size(), 3U);
}

TEST_F(DeviceListServiceTest, AnswersComeInTheOrderOfTheirTimes) {
    write(R"({"incompatible": ["a"], "delay": 3})");
    ask();
    pump();
    write(R"({"incompatible": ["a"], "delay": 1})");
    service->initWithAccount(account)->performRequestWithHandler(
        [this](const DeviceListRequest&, const auto&) { answers.emplace_back(); });
    pump();

    advance(seconds(1));
    EXPECT_EQ(answers.size(), 1U);
    EXPECT_FALSE(answers.back());
    advance(seconds(2));

    EXPECT_EQ(answers.size(), 2U);
    EXPECT_TRUE(answers.back());
}

TEST_F(DeviceListServiceTest, ADelayBeyondAllTimesIsWaitedForAsLongAsTheServiceRuns) {
    const auto held = std::make_shared<int>();
    for (const char* const text : {R"({"delay": 1e300})", R"({"delay": 10000000000})"}) {
        write(text);
        ask(held);
        pump();
    }

    advance(std::chrono::hours(24 * 365));

    EXPECT_TRUE(answers.empty());
    EXPECT_EQ(held.use_count(), 3);
    service.reset();
    EXPECT_EQ(held.use_count(), 1);
}

} // namespace
} // namespace nimbra::test
