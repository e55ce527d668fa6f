#include "bench/ComparisonReporter.h"

#include <iomanip>
#include <ostream>
#include <unistd.h>

namespace nimbra::bench {

ComparisonReporter::ComparisonReporter()
    : ConsoleReporter(::isatty(STDOUT_FILENO) == 1 ? OO_ColorTabular : OO_Tabular) {}

void ComparisonReporter::ReportRuns(const std::vector<Run>& runs) {
    ConsoleReporter::ReportRuns(runs);
    for (const Run& run : runs) {
        _hasFailed = _hasFailed || run.error_occurred;
        if (run.error_occurred || run.run_type != Run::RT_Iteration) {
            continue;
        }
        const double nanoseconds =
            run.real_accumulated_time * 1e9 / static_cast<double>(run.iterations);
        // Of several repetitions the quickest was disturbed the least.
        const auto [figure, isNew] =
            _figures.try_emplace(run.run_name.function_name,
                                 Figure{.label = run.report_label, .nanoseconds = nanoseconds});
        if (!isNew && nanoseconds < figure->second.nanoseconds) {
            figure->second.nanoseconds = nanoseconds;
        }
    }
}

void ComparisonReporter::Finalize() {
    std::ostream& out = GetOutputStream();
    out << std::fixed;
    for (const auto& [name, figure] : _figures) {
        const auto bare = _figures.find(name + "/bare");
        if (bare == _figures.end()) {
            continue;
        }
        out << '\n'
            << name << ": ratio " << std::setprecision(2)
            << figure.nanoseconds / bare->second.nanoseconds << std::setprecision(0) << "\n  "
            << figure.nanoseconds << " ns: " << figure.label << "\n  " << bare->second.nanoseconds
            << " ns: " << bare->second.label << '\n';
    }
}

} // namespace nimbra::bench
