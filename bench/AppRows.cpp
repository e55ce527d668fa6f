#include "bench/BareAppRows.h"
#include "bench/BenchDevice.h"
#include "bench/HeapMeter.h"
#include "bench/MemoryServices.h"
#include "pane/RSPNimbraDriveViewController.h"

#include <benchmark/benchmark.h>
#include <cstddef>
#include <map>
#include <memory>
#include <string>

namespace nimbra::bench {
namespace {

/// The device with so many applications, made once: to write thousands of files takes longer than
/// all that is measured here.
BenchDevice& deviceWith(std::size_t applications) {
    static std::map<std::size_t, std::unique_ptr<BenchDevice>> devices;
    auto& device = devices[applications];
    if (!device) {
        device = std::make_unique<BenchDevice>(applications);
    }
    return *device;
}

/// The first list of a device: nothing has been read before.
void firstList(benchmark::State& state, std::size_t applications) {
    BenchDevice& device = deviceWith(applications);
    std::size_t peak = 0;
    for ([[maybe_unused]] auto _ : state) {
        state.PauseTiming();
        device.reopen();
        state.ResumeTiming();
        const HeapMeter heap;
        benchmark::DoNotOptimize(
            BenchDevice::rowsOfNewPane<RSPNimbraDriveViewController>(device.services()));
        peak = heap.peak();
    }
    state.SetLabel("the first list of a page: records, entries, rows, order; at most " +
                   std::to_string(peak / applications) + " bytes of heap a row");
}

/// A list that is built anew while the device has not changed.
void nextList(benchmark::State& state, std::size_t applications) {
    BenchDevice& device = deviceWith(applications);
    const auto build = [&device] {
        return BenchDevice::rowsOfNewPane<RSPNimbraDriveViewController>(device.services());
    };
    benchmark::DoNotOptimize(build());
    for ([[maybe_unused]] auto _ : state) {
        benchmark::DoNotOptimize(build());
    }
    state.SetLabel("the list built again");
}

void bareRows(benchmark::State& state, std::size_t applications) {
    const BenchDevice& device = deviceWith(applications);
    BareAppRows rows(device.root());
    for ([[maybe_unused]] auto _ : state) {
        benchmark::DoNotOptimize(rows.sortedNames());
    }
    state.SetLabel("the same records from SQLite, names from the entries, order of the collator");
}

/// The cache and the rows alone, over services that have every answer at hand.
void pageAlone(benchmark::State& state, std::size_t applications) {
    BenchDevice& device = deviceWith(applications);
    MemoryServices memory(applications, device.services());
    for ([[maybe_unused]] auto _ : state) {
        benchmark::DoNotOptimize(
            BenchDevice::rowsOfNewPane<RSPNimbraDriveViewController>(memory.services()));
    }
    state.SetLabel("the page's own share: cache and rows, every answer at hand, order by bytes");
}

using Measure = void (*)(benchmark::State& state, std::size_t applications);

/// Runs `measure` beside `bare` for each number of applications.
void compare(const std::string& name, Measure measure, Measure bare) {
    for (const std::size_t applications : {10UL, 100UL, 1000UL, 10000UL}) {
        const std::string sized = name + ' ' + std::to_string(applications);
        benchmark::RegisterBenchmark(sized.c_str(), measure, applications);
        benchmark::RegisterBenchmark((sized + "/bare").c_str(), bare, applications);
    }
}

[[maybe_unused]] const bool areRegistered = [] {
    compare("FirstListOfApps", firstList, bareRows);
    compare("NextListOfApps", nextList, bareRows);
    compare("PageAloneOfFirstList", pageAlone, firstList);
    return true;
}();

} // namespace
} // namespace nimbra::bench
