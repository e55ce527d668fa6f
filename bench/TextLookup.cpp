#include "bench/BenchDevice.h"
#include "device/bundles/DeviceBundle.h"
#include "device/bundles/DeviceBundles.h"
#include "support/RSPLocalizedString.h"

#include <benchmark/benchmark.h>
#include <fstream>
#include <nlohmann/json.hpp>
#include <unordered_map>

namespace nimbra::bench {
namespace {

void textLookup(benchmark::State& state) {
    BenchDevice device;
    const auto bundle = device.platform().bundles().load(BenchDevice::builtBundle());
    if (!bundle) {
        state.SkipWithError(bundle.error().line().c_str());
        return;
    }
    const Text key("CLOUD_DRIVE_EXPLANATION");
    const Text table("Localizable");
    for ([[maybe_unused]] auto _ : state) {
        benchmark::DoNotOptimize(RSPLocalizedString(key, table, *bundle));
    }
    state.SetLabel("RSPLocalizedString on the bundle, in the device's language");
}

void textLookupBare(benchmark::State& state) {
    std::ifstream file(BenchDevice::builtBundle() / "en" / "Localizable.json");
    const auto texts =
        nlohmann::json::parse(file).get<std::unordered_map<std::string, std::string>>();
    std::string key = "CLOUD_DRIVE_EXPLANATION";
    for ([[maybe_unused]] auto _ : state) {
        benchmark::DoNotOptimize(key);
        benchmark::DoNotOptimize(texts.find(key));
    }
    state.SetLabel("find in an unordered_map with the same table");
}

BENCHMARK(textLookup)->Name("TextLookup");
BENCHMARK(textLookupBare)->Name("TextLookup/bare");

} // namespace
} // namespace nimbra::bench
