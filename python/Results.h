#ifndef WORDCATCHER_PYTHON_RESULTS_H
#define WORDCATCHER_PYTHON_RESULTS_H

#include <cstdint>
#include <string>

#include "python/Names.h"
#include "wordcatcher/matcher/Index.h"

namespace wordcatcher::python {

/// Index::Info with the name of its mode.
struct IndexInfo {
  std::string mode;
  std::uint64_t phrases;
  std::uint64_t words;
  std::uint64_t values;
  std::uint64_t bytes;
  std::string generation;
  std::uint32_t version;
};

inline IndexInfo named(const Index::Info& info) {
  return {nameOf(info.mode), info.phrases,    info.words,  info.values,
          info.bytes,        info.generation, info.version};
}

}  // namespace wordcatcher::python

#endif
