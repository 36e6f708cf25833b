#ifndef WORDCATCHER_BENCH_LEASTTIMEREPORTER_H
#define WORDCATCHER_BENCH_LEASTTIMEREPORTER_H

#include <benchmark/benchmark.h>

#include <map>
#include <string>
#include <vector>

namespace wordcatcher::bench {

/// Prints the usual table and keeps the least processor time of each benchmark: what else runs on
/// the machine can only add to it.
class LeastTimeReporter : public benchmark::ConsoleReporter {
 public:
  /// What the table shows of a benchmark that is repeated.
  enum class Rows {
    aggregates,  // mean, median and deviation
    fastest,     // the repetition of the least processor time
  };

  explicit LeastTimeReporter(Rows rows) : ConsoleReporter(OO_None), _rows(rows) {}

  void ReportRuns(const std::vector<Run>& runs) override;

  /// Whether a benchmark has been run.
  bool has(const std::string& name) const { return _leastTimes.contains(name); }

  /// How many times as long the first takes as the second; both have been run.
  double ratio(const std::string& name, const std::string& to) const {
    return _leastTimes.at(name) / _leastTimes.at(to);
  }

 private:
  Rows _rows;
  std::map<std::string, double> _leastTimes;
};

}  // namespace wordcatcher::bench

#endif
