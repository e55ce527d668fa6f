#include "bench/BareAccount.h"
#include "bench/BenchDevice.h"
#include "device/bundles/DeviceBundle.h"
#include "device/bundles/DeviceBundles.h"

#include <benchmark/benchmark.h>

namespace nimbra::bench {
namespace {

void buildingTheList(benchmark::State& state) {
    BenchDevice device;
    const auto bundle = device.platform().bundles().load(BenchDevice::builtBundle());
    if (!bundle) {
        state.SkipWithError(bundle.error().line().c_str());
        return;
    }
    const ControllerClass& paneClass = (*bundle)->principalClass();
    std::size_t rows = 0;
    for ([[maybe_unused]] auto _ : state) {
        rows = BenchDevice::rowsOfNewPane(paneClass, device.services());
    }
    state.SetLabel("a new pane reads its account and builds its rows (" + std::to_string(rows) +
                   ")");
}

void buildingTheListBare(benchmark::State& state) {
    const BenchDevice device;
    BareAccount account(device.root() / "var/lib/nimbra/accounts.db");
    for ([[maybe_unused]] auto _ : state) {
        benchmark::DoNotOptimize(account.countDataclasses());
    }
    state.SetLabel("SQLite gives the same account through a prepared statement");
}

BENCHMARK(buildingTheList)->Name("BuildingTheList");
BENCHMARK(buildingTheListBare)->Name("BuildingTheList/bare");

} // namespace
} // namespace nimbra::bench
