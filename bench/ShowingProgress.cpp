#include "bench/BenchDevice.h"
#include "device/documents/DeviceProgress.h"
#include "device/documents/ProgressPublisher.h"
#include "footer/RSPNimbraDriveProgressFooterView.h"
#include "platform/documents/DaemonConnection.h"
#include "platform/views/Label.h"
#include "platform/views/ProgressView.h"
#include "platform/views/ViewMetrics.h"
#include "platform/views/Window.h"

#include <benchmark/benchmark.h>
#include <memory>
#include <stdexcept>

namespace nimbra::bench {
namespace {

constexpr int changes = 10'000;

device::ProgressChanges fraction(int change) {
    return {.values = {.fraction = static_cast<double>(change) / changes},
            .keys = {device::ProgressKey::fraction}};
}

/// A footer in its window, on a device.
struct ShownFooter {
    BenchDevice device;
    Window window;
    std::shared_ptr<RSPNimbraDriveProgressFooterView> view =
        RSPNimbraDriveProgressFooterView::initWithFrame({}, device.services());

    ShownFooter() {
        view->setFrame({.origin = {}, .size = {390, view->intrinsicContentSize().height}});
        view->moveToWindow(&window);
        device.runMainQueue();
    }

    /// Shows the last of many changes.
    void checkShown() const {
        const double last = fraction(changes - 1).values.fraction;
        if (view->progressBar()->progress() != static_cast<float>(last)) {
            throw std::runtime_error("the bar does not show the last change");
        }
    }
};

void showingProgress(benchmark::State& state) {
    ShownFooter footer;
    auto& publisher = footer.device.platform().progressPublisher();
    const auto url = footer.device.platform().daemonConnection().mobileDocumentsURL();
    if (!publisher.publish("sync", url, {.description = "Uploading"})) {
        state.SkipWithError("the progress cannot be published");
        return;
    }
    footer.device.runMainQueue();
    for ([[maybe_unused]] auto _ : state) {
        for (int change = 0; change < changes; ++change) {
            benchmark::DoNotOptimize(publisher.update("sync", fraction(change)));
        }
        footer.device.runMainQueue();
    }
    footer.checkShown();
    state.SetLabel("10,000 changes are published, and what the main queue makes of them is shown");
}

void showingProgressBare(benchmark::State& state) {
    const ShownFooter footer;
    device::DeviceProgress progress({.description = "Uploading"});
    progress.addObserver(footer.view, {.forKeyPath = fractionCompletedKeyPath});
    for ([[maybe_unused]] auto _ : state) {
        for (int change = 0; change < changes; ++change) {
            progress.apply(fraction(change));
        }
    }
    footer.checkShown();
    state.SetLabel("the same changes, each shown by the footer at once");
}

void layingOutTheFooter(benchmark::State& state) {
    const ShownFooter footer;
    footer.view->statusLabel()->setText("Last synced on March 5, 2024");
    for ([[maybe_unused]] auto _ : state) {
        footer.view->setNeedsLayout();
        footer.view->layoutIfNeeded();
    }
    state.SetLabel("the constraints of the status footer are solved");
}

void layingOutTheFooterBare(benchmark::State& state) {
    const ShownFooter footer;
    footer.view->statusLabel()->setText("Last synced on March 5, 2024");
    for ([[maybe_unused]] auto _ : state) {
        const double bar = footer.view->progressBar()->intrinsicContentSize().height;
        footer.view->progressBar()->setFrame({{50, 0}, {290, bar}});
        const double height = footer.view->statusLabel()->heightForWidth(350);
        footer.view->statusLabel()->setFrame({{20, bar + 5}, {350, height}});
    }
    state.SetLabel("the same frames are worked out by hand");
}

BENCHMARK(showingProgress)->Name("ShowingProgress")->Unit(benchmark::kMicrosecond);
BENCHMARK(showingProgressBare)->Name("ShowingProgress/bare")->Unit(benchmark::kMicrosecond);
BENCHMARK(layingOutTheFooter)->Name("LayingOutTheFooter");
BENCHMARK(layingOutTheFooterBare)->Name("LayingOutTheFooter/bare");

} // namespace
} // namespace nimbra::bench
