#include "LeastTimeReporter.h"

#include <algorithm>

namespace wordcatcher::bench {

void LeastTimeReporter::ReportRuns(const std::vector<Run>& runs) {
  std::vector<Run> aggregates;
  std::vector<Run> repetitions;
  for (const Run& run : runs) {
    (run.run_type == Run::RT_Aggregate ? aggregates : repetitions).push_back(run);
  }
  const auto fastest = std::min_element(
      repetitions.begin(), repetitions.end(),
      [](const Run& a, const Run& b) { return a.GetAdjustedCPUTime() < b.GetAdjustedCPUTime(); });
  if (fastest != repetitions.end()) {
    _leastTimes[fastest->run_name.function_name] = fastest->GetAdjustedCPUTime();
    if (_rows == Rows::fastest) {
      ConsoleReporter::ReportRuns({*fastest});
    }
  }
  if (_rows == Rows::aggregates) {
    ConsoleReporter::ReportRuns(aggregates);
  }
}

}  // namespace wordcatcher::bench
