// Saves an account again and again, for tests that end it at some point or run two of it.
//
// usage: account-saver DATABASE together|cellular TIMES
//   together  flips document storage and the photo stream with each save, both to the same state
//   cellular  flips whether key-value storage uses cellular data
// The last of an odd number of saves turns the flags on. A byte on standard output follows each
// save; the exit status is 1 when one failed.

#include "device/store/DeviceAccountStore.h"
#include "device/system/DeviceWorkQueues.h"
#include "tests/support/FakeSystemLog.h"
#include "tests/support/PumpedQueue.h"

#include <iostream>
#include <string>
#include <string_view>
#include <unistd.h>

using namespace nimbra;

namespace {

void flip(Account& account, std::string_view what, bool isOn) {
    if (what == "together") {
        account.setEnabledForDataclass(isOn, kAccountDataclassTidewater);
        account.setEnabledForDataclass(isOn, kAccountDataclassLarder);
    } else {
        account.vt_setUseCellularForDataclass(isOn, kAccountDataclassKeyValue);
    }
}

} // namespace

int main(int count, char** words) {
    constexpr int expectedCount = 4;
    if (count != expectedCount) {
        std::cerr << "usage: account-saver DATABASE together|cellular TIMES\n";
        return 2;
    }
    auto database = device::AccountDatabase::open(words[1]);
    if (!database) {
        std::cerr << database.error() << '\n';
        return 2;
    }
    test::PumpedQueue mainQueue("main");
    test::FakeSystemLog log;
    device::DeviceWorkQueues queues(mainQueue);
    device::DeviceAccountStore store(std::move(*database), queues, log);
    const auto account = store.accountWithIdentifier(AccountIdentifier("primary"));
    const int times = std::stoi(words[3]);
    for (int save = 1; save <= times; ++save) {
        flip(*account, words[2], save % 2 == 1);
        if (const auto saved = store.save(account); !saved) {
            std::cerr << saved.error() << '\n';
            return 1;
        }
        static_cast<void>(::write(STDOUT_FILENO, ".", 1));
    }
    return 0;
}
