#pragma once

#include "device/DevicePlatform.h"
#include "platform/views/ViewAnimations.h"
#include "tests/support/FakeViewMetrics.h"
#include "tests/support/PumpedQueue.h"
#include "tests/support/RecordingPresenter.h"
#include "tests/support/TemporaryDirectory.h"

#include <filesystem>
#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace nimbra::test {

/// A place for a device, and what its platform needs of a host.
class DevicePlatformFixture : public testing::Test {
protected:
    [[nodiscard]] std::filesystem::path root() const { return _directory.path() / "device"; }

    /// The platform of the device that stands at `root`.
    [[nodiscard]] std::unique_ptr<device::DevicePlatform> openPlatform() {
        auto platform = device::DevicePlatform::open(root(), _mainQueue, {});
        EXPECT_TRUE(platform) << platform.error();
        return std::move(*platform);
    }

    [[nodiscard]] PumpedQueue& mainQueue() { return _mainQueue; }
    [[nodiscard]] RecordingPresenter& presenter() { return _presenter; }
    [[nodiscard]] FakeViewMetrics& viewMetrics() { return _viewMetrics; }
    [[nodiscard]] device::DevicePlatform::HostServices host() {
        return {.presenter = _presenter,
                .viewMetrics = _viewMetrics,
                .viewAnimations = _viewAnimations};
    }

private:
    TemporaryDirectory _directory;
    PumpedQueue _mainQueue{"main"};
    std::vector<std::string> _calls;
    RecordingPresenter _presenter{_calls};
    FakeViewMetrics _viewMetrics;
    ViewAnimations _viewAnimations;
};

} // namespace nimbra::test
