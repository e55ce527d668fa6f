#include "bench/BenchDevice.h"
#include "pane/RSPNimbraDriveViewController.h"
#include "platform/accounts/Account.h"

#include <benchmark/benchmark.h>
#include <cstddef>
#include <memory>
#include <string>

namespace nimbra::bench {
namespace {

/// The pane with as many rows of applications as a benchmark wants, and without the saves: what is
/// left of a flip is the work of the main queue.
class PaneWithApps final : public RSPNimbraDriveViewController {
public:
    PaneWithApps(const PlatformServices& services, std::size_t count)
        : RSPNimbraDriveViewController(services), _count(count) {}

    /// Off and on again.
    void flipTwice() {
        turn(false);
        turn(true);
    }

protected:
    SpecifierArray _appSpecifiersForPRVServices() override {
        SpecifierArray rows;
        for (std::size_t index = 0; index < _count; ++index) {
            rows.push_back(Specifier::preferenceSpecifierNamed("App " + std::to_string(index),
                                                               {.cell = SwitchCell}));
        }
        return rows;
    }

private:
    void turn(bool on) {
        _vantrelAccount()->setEnabledForDataclass(on, kAccountDataclassTidewater);
        _reloadSpecifiersThatDependOnDocumentsAndDataSwitchState();
    }

    std::size_t _count;
};

/// Flips a pane with `rows` applications `flips` times in one iteration.
void flip(benchmark::State& state, std::size_t rows, int flips, const char* label) {
    BenchDevice device;
    const auto entry = Specifier::preferenceSpecifierNamed("Nimbra Drive", {.cell = LinkListCell});
    entry->setUserInfo({{AccountIdentifierKey, Text("primary")}});
    const auto pane = std::make_shared<PaneWithApps>(device.services(), rows);
    pane->setSpecifier(entry);
    static_cast<void>(pane->specifiers());
    for ([[maybe_unused]] auto _ : state) {
        for (int flipped = 0; flipped < flips; ++flipped) {
            pane->flipTwice();
        }
    }
    state.SetLabel(label);
}

constexpr std::size_t kFew = 100;
constexpr std::size_t kMany = 10000;
constexpr int kTimes = 100;

BENCHMARK_CAPTURE(flip, none, 0, 1, "the switch off and on, with no application")
    ->Name("FlippingTheSwitch 0");
BENCHMARK_CAPTURE(flip, few, kFew, 1, "the switch off and on, with 100 applications")
    ->Name("FlippingTheSwitch 100");
BENCHMARK_CAPTURE(flip, fewBare, 0, 1, "the same with none, what a flip costs before any row")
    ->Name("FlippingTheSwitch 100/bare");
BENCHMARK_CAPTURE(flip, many, kMany, 1, "the switch off and on, with 10,000 applications")
    ->Name("FlippingTheSwitch 10000");
// As many rows in a hundred small flips: the ratio is 1 where a row costs the same in both.
BENCHMARK_CAPTURE(flip, manyBare, kFew, kTimes, "as many rows, as 100 flips with 100 applications")
    ->Name("FlippingTheSwitch 10000/bare");

} // namespace
} // namespace nimbra::bench
