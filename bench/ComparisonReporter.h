#pragma once

#include <benchmark/benchmark.h>
#include <map>
#include <string>
#include <vector>

namespace nimbra::bench {

/// Prints what Google Benchmark measures, and at the end what each figure stands beside: a
/// benchmark "NAME" is compared with "NAME/bare". Both say with their label what they do.
class ComparisonReporter final : public benchmark::ConsoleReporter {
public:
    /// In colours where standard output is a terminal.
    ComparisonReporter();

    void ReportRuns(const std::vector<Run>& runs) override;
    void Finalize() override;

    /// Whether a benchmark could not be run.
    [[nodiscard]] bool hasFailed() const { return _hasFailed; }

private:
    struct Figure {
        std::string label;
        double nanoseconds = 0;
    };

    std::map<std::string, Figure> _figures;
    bool _hasFailed = false;
};

} // namespace nimbra::bench
