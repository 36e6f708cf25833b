#ifndef WORDCATCHER_MATCHER_SPANQUERYTRACE_H
#define WORDCATCHER_MATCHER_SPANQUERYTRACE_H

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "wordcatcher/fuzzy/ImageSearch.h"
#include "wordcatcher/matcher/Find.h"
#include "wordcatcher/storage/SearchImage.h"

namespace wordcatcher {

/// What becomes of one value in a span query, told in words while the query runs.
class SpanQueryTrace {
 public:
  /// `hasCodes`: whether the words are codes, which are compared exactly.
  SpanQueryTrace(const SearchImage& image, std::uint32_t value, bool hasCodes)
      : _image(image), _value(value), _hasCodes(hasCodes), _noun(hasCodes ? "code" : "word") {}

  std::uint32_t value() const noexcept { return _value; }
  const std::vector<QueryExplanation::Step>& steps() const noexcept { return _steps; }
  std::int64_t distance() const noexcept { return _distance; }
  std::int64_t bound() const noexcept { return _bound; }

  /// A word is too short to be looked up, or too long.
  void leaveOut(std::u16string_view word, const char* reason);

  /// No word is long enough, so every one is looked up.
  void lookUpAll();

  /// A word's hits; `distance` of the value among its candidates, if it is one.
  void lookUp(std::u16string_view word, const std::vector<WordHit>& hits,
              std::optional<std::int64_t> distance);

  /// The text's counted words, and whether any word brought a candidate.
  void count(std::int64_t countedWords, std::int64_t uncountedLength, bool found);

  /// The candidates are those of the first word that brings any; the others that bring some follow,
  /// each as `compare`d with what is left.
  void begin();
  void penaliseMissing(std::int64_t missing, std::int64_t penalty);
  enum class Compared { same, disjoint, common };
  void compare(std::size_t candidateSet, Compared outcome, std::int64_t penalty);
  void penaliseLength(std::int64_t phraseWords, std::int64_t countedWords, std::int64_t penalty);
  void compareWithBound(std::int64_t bound);

 private:
  struct CandidateSet {
    std::string word;
    std::optional<std::int64_t> distance;
  };
  void tell(std::string sentence) { _steps.push_back({std::move(sentence), _distance}); }
  void add(std::int64_t penalty);

  const SearchImage& _image;
  std::uint32_t _value;
  bool _hasCodes;
  std::string _noun;  // what a word of the index is
  std::vector<CandidateSet> _sets;
  std::vector<QueryExplanation::Step> _steps;
  std::int64_t _distance = 0;
  std::int64_t _bound = 0;
  bool _isIn = false;
};

}  // namespace wordcatcher

#endif
