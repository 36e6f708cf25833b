// The classic library: tables, automata, search and span query over real names.

#include <benchmark/benchmark.h>

#include <filesystem>
#include <string>

#include "IsoNames.h"
#include "wordcatcher/fuzzy/LXFuzzyIndex.h"
#include "wordcatcher/log/LogSink.h"
#include "wordcatcher/matcher/KXWordcatcher.h"
#include "wordcatcher/storage/TinyCDB.h"

namespace wordcatcher::bench {
namespace {

/// A directory of the benchmark's own; the library's log lines are discarded while it lives.
class Workspace {
 public:
  Workspace() : _previous(setLogSink(silentLogSink())) {
    std::filesystem::create_directories(path());
  }
  ~Workspace() {
    std::filesystem::remove_all(path());
    setLogSink(_previous);
  }
  Workspace(const Workspace&) = delete;
  Workspace& operator=(const Workspace&) = delete;

  static std::string path() {
    return (std::filesystem::temp_directory_path() / "wordcatcher-bench").string() + "/";
  }

 private:
  LogSink* _previous;
};

/// Records a second, each name under a key of its own.
void writeTable(benchmark::State& state) {
  const Workspace workspace;
  const auto names = isoNames(static_cast<std::size_t>(state.range(0)));
  for ([[maybe_unused]] auto _ : state) {
    TinyCDB table(Workspace::path() + "table.tdb");
    table.setMode(2);
    for (const auto& name : names) {
      table.setValue_forKey(u"t", name);
    }
    table.setMode(0);
  }
  state.SetItemsProcessed(state.iterations() * static_cast<std::int64_t>(names.size()));
}
BENCHMARK(writeTable)->Arg(3000)->Arg(13286)->Unit(benchmark::kMillisecond);

/// Finishing a table whose records all have one key, as the root's edges do: quadratic.
void finishTableOfOneKey(benchmark::State& state) {
  const Workspace workspace;
  for ([[maybe_unused]] auto _ : state) {
    TinyCDB table(Workspace::path() + "table.tdb");
    table.setMode(2);
    for (std::int64_t i = 0; i < state.range(0); ++i) {
      table.setValue_forKey(u"a", u"");
    }
    table.setMode(0);
  }
  state.SetComplexityN(state.range(0));
}
BENCHMARK(finishTableOfOneKey)
    ->RangeMultiplier(2)
    ->Range(4000, 32000)
    ->Unit(benchmark::kMillisecond)
    ->Complexity();

void readTable(benchmark::State& state) {
  const Workspace workspace;
  const auto names = isoNames(static_cast<std::size_t>(state.range(0)));
  TinyCDB table(Workspace::path() + "table.tdb");
  table.setMode(2);
  for (const auto& name : names) {
    table.setValue_forKey(u"t", name);
  }
  table.setMode(1);
  for ([[maybe_unused]] auto _ : state) {
    for (const auto& name : names) {
      benchmark::DoNotOptimize(table.valuesFor(name));
    }
  }
  table.setMode(0);
  state.SetItemsProcessed(state.iterations() * static_cast<std::int64_t>(names.size()));
}
BENCHMARK(readTable)->Arg(3000)->Arg(13286)->Unit(benchmark::kMillisecond);

/// One automaton and its deterministic form; arguments: code units, distance.
void buildAutomaton(benchmark::State& state) {
  std::u16string text;
  for (const auto& name : isoNames(200)) {
    text += name + u' ';
  }
  text.resize(static_cast<std::size_t>(state.range(0)));
  std::size_t states = 0;
  for ([[maybe_unused]] auto _ : state) {
    const auto nfa = LXFuzzyIndex::_LXcreateNFAWithWord_withMaxDistance(text, state.range(1));
    const auto dfa = LXFuzzyIndex::_LXcreateDFAFromNFA(nfa);
    states = dfa.size();
    benchmark::DoNotOptimize(states);
  }
  state.counters["states"] = static_cast<double>(states);
}
BENCHMARK(buildAutomaton)
    ->ArgsProduct({{5, 10, 20, 111}, {1, 2, 3}})
    ->Args({1000, 3})
    ->Unit(benchmark::kMicrosecond);

void buildIndex(benchmark::State& state) {
  const Workspace workspace;
  const auto names = isoNames(static_cast<std::size_t>(state.range(0)));
  for ([[maybe_unused]] auto _ : state) {
    KXWordcatcher matcher(Workspace::path(), 0);
    matcher.setMode(2);
    for (const auto& name : names) {
      matcher.index_withData(name, name);
    }
    matcher.setMode(0);
  }
  state.SetItemsProcessed(state.iterations() * static_cast<std::int64_t>(names.size()));
}
BENCHMARK(buildIndex)->Arg(3000)->Arg(13286)->Unit(benchmark::kMillisecond);

/// One look-up of a misspelled name's first word; arguments: names, distance.
void search(benchmark::State& state) {
  const Workspace workspace;
  const auto names = isoNames(static_cast<std::size_t>(state.range(0)));
  LXFuzzyIndex index(Workspace::path());
  index.setMode(2);
  for (const auto& name : names) {
    index.addWordsFromString_data(name, name);
  }
  index.setMode(1);
  const auto queries = misspelled(isoNames(50));
  std::size_t next = 0;
  for ([[maybe_unused]] auto _ : state) {
    const auto& query = queries[next++ % queries.size()];
    benchmark::DoNotOptimize(
        index.search_withMaxDistance(query.substr(0, query.find(u' ')), state.range(1)));
  }
}
BENCHMARK(search)->ArgsProduct({{3000, 13286}, {0, 1, 2, 3}})->Unit(benchmark::kMicrosecond);

/// One span query of a misspelled name.
void query(benchmark::State& state) {
  const Workspace workspace;
  const auto names = isoNames(static_cast<std::size_t>(state.range(0)));
  KXWordcatcher matcher(Workspace::path(), 0);
  matcher.setMode(2);
  for (const auto& name : names) {
    matcher.index_withData(name, name);
  }
  matcher.setMode(1);
  const auto queries = misspelled(isoNames(50));
  std::size_t next = 0;
  for ([[maybe_unused]] auto _ : state) {
    matcher.setWordsMatched(0);
    benchmark::DoNotOptimize(matcher.query(queries[next++ % queries.size()]));
  }
}
BENCHMARK(query)->Arg(3000)->Arg(13286)->Unit(benchmark::kMicrosecond);

}  // namespace
}  // namespace wordcatcher::bench
