#include "bench/BareAccount.h"
#include "bench/BenchDevice.h"
#include "device/bundles/DeviceBundle.h"
#include "device/bundles/DeviceBundles.h"
#include "device/system/DeviceSettings.h"
#include "platform/system/ClassRegistry.h"

#include <benchmark/benchmark.h>
#include <dlfcn.h>
#include <filesystem>
#include <fstream>
#include <nlohmann/json.hpp>
#include <string>

namespace nimbra::bench {
namespace {

namespace fs = std::filesystem;

// A process loads a shared object once and keeps it, so every turn opens a copy of its own.
constexpr int turns = 200;

fs::path freshCopy(const BenchDevice& device, const char* kind, int turn) {
    fs::path copy = device.scratch() / (kind + std::to_string(turn) + ".bundle");
    fs::copy(BenchDevice::builtBundle(), copy, fs::copy_options::recursive);
    return copy;
}

void openingTheBundle(benchmark::State& state) {
    BenchDevice device;
    int turn = 0;
    for ([[maybe_unused]] auto _ : state) {
        state.PauseTiming();
        const fs::path copy = freshCopy(device, "whole", turn++);
        state.ResumeTiming();

        ClassRegistry classes;
        device::DeviceBundles bundles(device::DevicePaths(device.root()),
                                      device.platform().settings(), classes,
                                      device.platform().systemLog());
        const auto bundle = bundles.load(copy);
        if (!bundle) {
            state.SkipWithError(bundle.error().line().c_str());
            return;
        }
        benchmark::DoNotOptimize(
            BenchDevice::rowsOfNewPane((*bundle)->principalClass(), device.servicesWith(bundles)));
    }
    state.SetLabel("load the bundle, create the pane, ask for its rows");
}

void openingTheBundleBare(benchmark::State& state) {
    const BenchDevice device;
    BareAccount account(device.root() / "var/lib/nimbra/accounts.db");
    int turn = 0;
    for ([[maybe_unused]] auto _ : state) {
        state.PauseTiming();
        const fs::path copy = freshCopy(device, "bare", turn++);
        state.ResumeTiming();

        if (::dlopen((copy / "NimbraDriveSettings.so").c_str(), RTLD_NOW | RTLD_LOCAL) == nullptr) {
            state.SkipWithError("the shared object cannot be loaded");
            return;
        }
        for (const auto& file : fs::recursive_directory_iterator(copy)) {
            if (file.path().extension() == ".json") {
                std::ifstream stream(file.path());
                benchmark::DoNotOptimize(nlohmann::json::parse(stream));
            }
        }
        benchmark::DoNotOptimize(account.countDataclasses());
    }
    state.SetLabel("dlopen the same object, parse the same files, read the same account");
}

BENCHMARK(openingTheBundle)->Name("OpeningTheBundle")->Iterations(turns);
BENCHMARK(openingTheBundleBare)->Name("OpeningTheBundle/bare")->Iterations(turns);

} // namespace
} // namespace nimbra::bench
