#ifndef WORDCATCHER_BENCH_ISONAMES_H
#define WORDCATCHER_BENCH_ISONAMES_H

#include <string>
#include <vector>

namespace wordcatcher::bench {

/// `count` real names, or all 13,286 of them if that is fewer: countries, their subdivisions and
/// languages from Debian's iso-codes, spread evenly over the lists. Throws std::runtime_error when
/// the package is not installed.
std::vector<std::u16string> isoNames(std::size_t count);

/// The names with one letter of every longer word replaced, by a fixed seed.
std::vector<std::u16string> misspelled(const std::vector<std::u16string>& names);

}  // namespace wordcatcher::bench

#endif
