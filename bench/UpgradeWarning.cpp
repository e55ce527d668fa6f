#include "bench/BenchDevice.h"
#include "platform/views/AttributedString.h"
#include "platform/views/ViewMetrics.h"
#include "upgrade/RSPUpgradeViewController.h"

#include <benchmark/benchmark.h>
#include <memory>
#include <string>

namespace nimbra::bench {
namespace {

constexpr int deviceCount = 1000;
constexpr double width = 358;

std::vector<Text> deviceNames() {
    std::vector<Text> names;
    for (int index = 0; index < deviceCount; ++index) {
        names.emplace_back("Device number " + std::to_string(index));
    }
    return names;
}

/// The screen with what it knows of devices.
class Screen final : public RSPUpgradeViewController {
public:
    explicit Screen(const PlatformServices& services) : RSPUpgradeViewController(services) {
        _devicesThatNeedUpgrade = deviceNames();
        _devicesThatCannotUpgrade = deviceNames();
    }
    using RSPUpgradeViewController::_upgradeWarningText;
};

void composingTheWarning(benchmark::State& state) {
    BenchDevice device;
    device.loadBundle();
    const PlatformServices services = device.services();
    const auto screen = std::make_shared<Screen>(services);
    for ([[maybe_unused]] auto _ : state) {
        const AttributedString text = screen->_upgradeWarningText();
        benchmark::DoNotOptimize(services.viewMetrics->sizeOfText(text, width, 0));
    }
    state.SetLabel("the warning of two times 1,000 devices is composed and measured");
}

void composingTheWarningBare(benchmark::State& state) {
    BenchDevice device;
    const PlatformServices services = device.services();
    const std::vector<Text> names = deviceNames();
    for ([[maybe_unused]] auto _ : state) {
        std::string plain;
        for (int list = 0; list < 2; ++list) {
            for (const Text& name : names) {
                plain += name.string() + ", ";
            }
        }
        const AttributedString text(Text(std::move(plain)), {});
        benchmark::DoNotOptimize(services.viewMetrics->sizeOfText(text, width, 0));
    }
    state.SetLabel("the same names in one text of one style");
}

BENCHMARK(composingTheWarning)->Name("ComposingTheWarning")->Unit(benchmark::kMicrosecond);
BENCHMARK(composingTheWarningBare)->Name("ComposingTheWarning/bare")->Unit(benchmark::kMicrosecond);

} // namespace
} // namespace nimbra::bench
