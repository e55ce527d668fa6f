#pragma once

#include "device/store/DeviceAccountStore.h"
#include "device/system/DeviceWorkQueues.h"
#include "tests/device/RecordingLog.h"
#include "tests/support/PumpedQueue.h"
#include "tests/support/TemporaryDirectory.h"

#include <chrono>
#include <gtest/gtest.h>
#include <memory>

namespace nimbra::test {

/// A database file with the account "primary", which has document storage and the photo stream,
/// and stores over it.
struct AccountStoreFixture : testing::Test {
    TemporaryDirectory directory;
    RecordingLog log;
    PumpedQueue mainQueue{"main"};
    std::unique_ptr<device::DeviceWorkQueues> queues =
        std::make_unique<device::DeviceWorkQueues>(mainQueue);

    AccountStoreFixture() {
        auto database = device::AccountDatabase::create(path());
        EXPECT_TRUE(database);
        EXPECT_TRUE(database->replaceAccounts(
            {{.identifier = "primary",
              .usesStratafile = true,
              .enabled = {"kAccountDataclassTidewater", "kAccountDataclassLarder"}}}));
    }

    [[nodiscard]] std::filesystem::path path() const { return directory.path() / "accounts.db"; }

    /// A store on a connection of its own, as another process would have it.
    [[nodiscard]] std::unique_ptr<device::DeviceAccountStore>
    openStore(std::chrono::milliseconds patience = device::Database::patience) {
        auto database = device::AccountDatabase::open(path(), patience);
        EXPECT_TRUE(database) << database.error();
        return std::make_unique<device::DeviceAccountStore>(std::move(*database), *queues, log);
    }
    [[nodiscard]] static std::shared_ptr<Account> primaryOf(device::DeviceAccountStore& store) {
        return store.accountWithIdentifier(AccountIdentifier("primary"));
    }
    /// What a new connection finds in the file.
    [[nodiscard]] std::shared_ptr<Account> stored() {
        _reader = openStore();
        return primaryOf(*_reader);
    }

private:
    std::unique_ptr<device::DeviceAccountStore> _reader;
};

} // namespace nimbra::test
