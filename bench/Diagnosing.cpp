#include "bench/BenchDevice.h"
#include "device/files/DevicePaths.h"
#include "tools/mrctl/ArchiveFile.h"
#include "tools/mrctl/DeviceContents.h"
#include "tools/mrctl/Report.h"

#include <benchmark/benchmark.h>
#include <stdexcept>

namespace nimbra::bench {
namespace {

constexpr std::size_t applicationCount = 1000;
constexpr const char* archiveName = "diagnosis.tar.gz";

mrctl::Report reportOf(const BenchDevice& device) {
    const auto contents = mrctl::DeviceContents::read(device::DevicePaths(device.root()), true);
    return mrctl::Report::of(contents, device.root(), archiveName);
}

void write(const BenchDevice& device, const mrctl::Report& report) {
    if (const auto written = mrctl::ArchiveFile::write(device.scratch() / archiveName, report);
        !written) {
        throw std::runtime_error(written.error().description);
    }
}

void writingADiagnosis(benchmark::State& state) {
    const BenchDevice device(applicationCount);
    for ([[maybe_unused]] auto _ : state) {
        write(device, reportOf(device));
    }
    state.SetLabel("a device with 1,000 applications is read, put under pseudonyms and archived");
}

void writingADiagnosisBare(benchmark::State& state) {
    const BenchDevice device(applicationCount);
    const mrctl::Report report = reportOf(device);
    for ([[maybe_unused]] auto _ : state) {
        write(device, report);
    }
    state.SetLabel("the same report is archived");
}

BENCHMARK(writingADiagnosis)->Name("WritingADiagnosis")->Unit(benchmark::kMillisecond);
BENCHMARK(writingADiagnosisBare)->Name("WritingADiagnosis/bare")->Unit(benchmark::kMillisecond);

} // namespace
} // namespace nimbra::bench
