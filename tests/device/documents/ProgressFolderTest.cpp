#include "device/documents/ProgressFolder.h"

#include "device/documents/DeviceProgressReports.h"
#include "device/documents/ProgressFile.h"
#include "device/documents/ProgressPublisher.h"
#include "platform/system/SystemLog.h"
#include "platform/system/WorkQueue.h"
#include "tests/device/ReadOnly.h"
#include "tests/device/TestFiles.h"
#include "tests/device/documents/ProgressObserver.h"
#include "tests/support/TemporaryDirectory.h"

#include <algorithm>
#include <condition_variable>
#include <deque>
#include <gtest/gtest.h>
#include <mutex>
#include <optional>
#include <sys/stat.h>

namespace nimbra::device {
namespace {

using Lines = std::vector<std::string>;

/// A queue for the test's thread, which waits there for work of other threads.
class AwaitedQueue final : public WorkQueue {
public:
    [[nodiscard]] const std::string& label() const override { return _label; }
    void async(Work work) override {
        const std::scoped_lock lock(_mutex);
        _work.push_back(std::move(work));
        _changed.notify_one();
    }
    void sync(Work work) override { work(); }

    /// Runs work until `condition` holds, and waits for more where there is none.
    template <class Condition>
    void runUntil(const Condition& condition) {
        while (!condition()) {
            Work work;
            {
                std::unique_lock lock(_mutex);
                _changed.wait(lock, [this] { return !_work.empty(); });
                work = std::move(_work.front());
                _work.pop_front();
            }
            work();
        }
    }

private:
    std::string _label = "main";
    std::mutex _mutex;
    std::condition_variable _changed;
    std::deque<Work> _work;
};

/// A log whose lines come to the queue of the test.
class QueuedLog final : public SystemLog {
public:
    explicit QueuedLog(WorkQueue& queue) : _queue(queue) {}
    [[nodiscard]] bool isEnabled(LogLevel /*level*/) const override { return true; }
    void write(LogLevel /*level*/, const std::string& message) override {
        _queue.async([this, message] { lines.push_back(message); });
    }

    Lines lines;

private:
    WorkQueue& _queue;
};

class ProgressFolderTest : public testing::Test {
protected:
    ProgressFolderTest() {
        _folder.emplace(DevicePaths(_directory.path()), _publisher, "file:///drive/", _log);
        _subscriber = _reports._addSubscriberForFileURLWithPublishingHandler(
            "file:///drive", [this](const std::shared_ptr<ProgressReport>& progress) {
                const std::string name = progress->localizedDescription().string();
                _lines.push_back("published " + name);
                for (const KeyPath& keyPath :
                     {localizedDescriptionKeyPath, fractionCompletedKeyPath}) {
                    progress->addObserver(_observer, {.forKeyPath = keyPath});
                }
                return [this, name] { _lines.push_back("unpublished " + name); };
            });
        _observer->then = [this](KeyValueObservable& /*observed*/) {
            _lines.push_back(_observer->calls.back());
        };
    }

    [[nodiscard]] std::filesystem::path place() const {
        return _directory.path() / "run/nimbra/progress";
    }
    [[nodiscard]] std::filesystem::path path(const std::string& name) const {
        return place() / name;
    }
    void write(const std::string& name, const std::string& text) const {
        test::writeTestFile(path(name), text);
    }
    [[nodiscard]] ProgressFolder& folder() { return *_folder; }

    /// Waits for as many lines as `expected` has, and expects them.
    void expectShown(const Lines& expected) { expectLines(_lines, expected); }
    void expectLogged(const Lines& expected) { expectLines(_log.lines, expected); }

private:
    void expectLines(Lines& lines, const Lines& expected) {
        _mainQueue.runUntil([&] { return lines.size() >= expected.size(); });
        EXPECT_EQ(std::exchange(lines, {}), expected);
    }

    test::TemporaryDirectory _directory;
    AwaitedQueue _mainQueue;
    QueuedLog _log{_mainQueue};
    DeviceProgressReports _reports{_mainQueue};
    ProgressPublisher _publisher{_mainQueue, _reports};
    Lines _lines;
    std::shared_ptr<test::ProgressObserver> _observer = std::make_shared<test::ProgressObserver>();
    std::shared_ptr<ProgressSubscriber> _subscriber;
    std::optional<ProgressFolder> _folder;
};

TEST_F(ProgressFolderTest, AFileIsAProgressFromItsBeginningToItsEnd) {
    folder().start();

    write("a.json", R"({"fraction": 0.25, "description": "one"})");
    expectShown({"published one"});

    write("a.json", R"({"fraction": 0.5, "description": "one"})");
    expectShown({"fractionCompleted 50%"});

    write("a.json", R"({"indeterminate": true, "description": "two", "fraction": 0.5})");
    expectShown({"localizedDescription two", "fractionCompleted indeterminate"});

    std::filesystem::remove(path("a.json"));
    expectShown({"unpublished one"});
}

TEST_F(ProgressFolderTest, FilesMayBeMovedInOverAndOut) {
    folder().start();

    write(".a", R"({"description": "one"})");
    std::filesystem::rename(path(".a"), path("a.json"));
    expectShown({"published one"});

    write(".a", R"({"description": "one", "fraction": 1})");
    std::filesystem::rename(path(".a"), path("a.json"));
    expectShown({"fractionCompleted 100%"});

    std::filesystem::rename(path("a.json"), path("a.old"));
    expectShown({"unpublished one"});
}

TEST_F(ProgressFolderTest, WhatStandsThereAlreadyIsPublished) {
    write("y.json", R"({"description": "one"})");
    write("z.json", R"({"description": "two"})");
    write("note.txt", "not looked at");
    write(".hidden.json", "not looked at");
    write("odd\nname.json", "not looked at");

    folder().start();

    expectShown({"published one", "published two"});
    expectLogged({});
}

TEST_F(ProgressFolderTest, AFileThatIsNoProgressIsToldOfAndChangesNothing) {
    folder().start();
    write("a.json", R"({"fraction": 2})");
    expectLogged(
        {"/run/nimbra/progress/a.json: /fraction: expected a number from 0 to 1, found 2"});

    write("a.json", R"({"description": "one"})");
    expectShown({"published one"});

    write("a.json", "{\"description\":\n1}");
    expectLogged({"/run/nimbra/progress/a.json: /description: expected a string or null, found 1"});
    write("a.json", R"({"description": "one", "fraction": 1})");
    expectShown({"fractionCompleted 100%"});
}

TEST_F(ProgressFolderTest, TheSameMistakeOfAFileIsToldOfOnce) {
    const std::string start = "/run/nimbra/progress/a.json: /: expected an object, found ";
    folder().start();
    write("a.json", "1");
    expectLogged({start + "1"});

    write("a.json", "1");
    write("b.json", R"({"description": "behind the second"})");
    expectShown({"published behind the second"});
    expectLogged({});
    write("a.json", "2");
    expectLogged({start + "2"});
}

TEST_F(ProgressFolderTest, WhatIsNotAPlainFileOrTooLargeIsToldOf) {
    folder().start();
    std::filesystem::create_directory(path("folder"));
    std::filesystem::rename(path("folder"), path("folder.json"));
    expectLogged({"/run/nimbra/progress/folder.json: is a directory"});

    write("large.json", std::string(kMostBytesOfProgressFile + 1, ' '));
    expectLogged({"/run/nimbra/progress/large.json: is larger than 65536 bytes"});
}

TEST_F(ProgressFolderTest, TheFolderIsMadeForItsOwnerAlone) {
    EXPECT_FALSE(std::filesystem::exists(place()));

    folder().start();

    EXPECT_EQ(std::filesystem::status(place()).permissions(), std::filesystem::perms::owner_all);
}

TEST_F(ProgressFolderTest, AFolderThatCannotBeMadeIsToldOf) {
    test::writeTestFile(place().parent_path(), "in the way");

    folder().start();

    expectLogged({"/run/nimbra/progress: cannot be made: Not a directory"});
}

TEST_F(ProgressFolderTest, AFileInTheFoldersPlaceIsToldOf) {
    test::writeTestFile(place(), "in the way");

    folder().start();

    expectLogged({"/run/nimbra/progress: cannot be made: Not a directory"});
}

TEST_F(ProgressFolderTest, AFolderThatCannotBeWatchedIsToldOf) {
    std::filesystem::create_directories(place());
    const auto root = place().parent_path().parent_path().parent_path();
    std::filesystem::permissions(root, std::filesystem::perms(0755));
    std::filesystem::create_directory(root / "other");
    std::filesystem::permissions(place(), std::filesystem::perms::none);
    {
        const test::ReadOnly asSomebodyElse(root / "other");
        folder().start();
    }
    std::filesystem::permissions(place(), std::filesystem::perms::owner_all);

    expectLogged({"/run/nimbra/progress: cannot be watched: Permission denied"});
}

TEST_F(ProgressFolderTest, WhenTheFolderGoesItsProgressEnds) {
    folder().start();
    write("a.json", R"({"description": "one"})");
    expectShown({"published one"});

    std::filesystem::rename(place(), place().parent_path() / "elsewhere");

    expectShown({"unpublished one"});
    expectLogged({"/run/nimbra/progress: has gone, and progress is not taken from it now"});
}

TEST_F(ProgressFolderTest, TheWatchingEndsAlsoWhereItNeverBegan) {
    folder().finish();
    folder().start();
    write("a.json", R"({"description": "one"})");
    expectShown({"published one"});

    folder().finish();
    folder().finish();
}

TEST(ProgressFileTest, WhatIsLeftOutIsAbsent) {
    EXPECT_EQ(parseProgressFile("{}", "f"), ProgressValues());
    EXPECT_EQ(parseProgressFile(R"({"fraction": 0.4, "indeterminate": true, "description": "d",
                                    "additional": "a", "fileOperationKind": "k"})",
                                "f"),
              (ProgressValues{.fileOperationKind = "k",
                              .fraction = 0.4,
                              .indeterminate = true,
                              .description = "d",
                              .additional = "a"}));
    EXPECT_EQ(parseProgressFile(R"({"description": null, "fileOperationKind": null})", "f"),
              ProgressValues());
}

TEST(ProgressFileTest, WhatIsNoProgressIsAnErrorWithItsPlace) {
    for (const auto& [text, message] : {
             std::pair{"[]", "f: /: expected an object, found []"},
             std::pair{R"({"fraction": -0.1})",
                       "f: /fraction: expected a number from 0 to 1, found -0.1"},
             std::pair{R"({"indeterminate": 1})",
                       "f: /indeterminate: expected true or false, found 1"},
         }) {
        const auto values = parseProgressFile(text, "f");
        ASSERT_FALSE(values) << text;
        EXPECT_EQ(values.error().description, message);
    }
    EXPECT_FALSE(parseProgressFile("", "f"));
    EXPECT_FALSE(parseProgressFile(R"({"fractoin": 1})", "f"));
}

} // namespace
} // namespace nimbra::device
