#include "tests/device/store/AccountStoreFixture.h"
#include "tests/device/store/SaverProcess.h"

#include <SQLiteCpp/SQLiteCpp.h>
#include <random>

namespace nimbra::test {
namespace {

struct AccountSaveProcessesTest : AccountStoreFixture {
    [[nodiscard]] std::string integrity() const {
        return SQLite::Database(path().string(), SQLite::OPEN_READWRITE)
            .execAndGet("PRAGMA integrity_check")
            .getString();
    }
};

TEST_F(AccountSaveProcessesTest, AProcessKilledWhileItSavesLeavesTheOldStateOrTheNewOne) {
    constexpr int kills = 300;
    constexpr int mostSaves = 12;
    std::mt19937 random(20240305); // NOLINT(*-msc51-cpp): the same points in every run
    std::uniform_int_distribution saves(0, mostSaves);
    for (int killed = 0; killed < kills; ++killed) {
        const SaverProcess saver(path(), "together", 1000000);
        saver.awaitSaves(saves(random));
        saver.kill();
        const int status = saver.await();

        ASSERT_TRUE(WIFSIGNALED(status) && WTERMSIG(status) == SIGKILL);
        ASSERT_EQ(integrity(), "ok");
        const auto found = stored();
        ASSERT_EQ(found->isEnabledForDataclass(kAccountDataclassTidewater),
                  found->isEnabledForDataclass(kAccountDataclassLarder));
    }
}

TEST_F(AccountSaveProcessesTest, TwoProcessesThatSaveAtOnceBothArriveInFull) {
    constexpr int saves = 101;
    const SaverProcess first(path(), "together", saves);
    const SaverProcess second(path(), "cellular", saves);

    EXPECT_EQ(first.await(), 0);
    EXPECT_EQ(second.await(), 0);

    EXPECT_EQ(integrity(), "ok");
    const auto found = stored();
    EXPECT_TRUE(found->isEnabledForDataclass(kAccountDataclassTidewater));
    EXPECT_TRUE(found->isEnabledForDataclass(kAccountDataclassLarder));
    EXPECT_TRUE(found->vt_useCellularForDataclass(kAccountDataclassKeyValue));
}

} // namespace
} // namespace nimbra::test
