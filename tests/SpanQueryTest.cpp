// The span query on ids against the same steps on sets of strings, counters included.

#include "wordcatcher/matcher/SpanQuery.h"

#include <gtest/gtest.h>
#include <rapidcheck/gtest.h>

#include "LiteralSearch.h"
#include "LiteralSpanQuery.h"
#include "TestSupport.h"
#include "wordcatcher/fuzzy/TableImage.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {
namespace {

using testing::literalSearch;
using testing::LiteralSpanQuery;
using testing::TemporaryDirectory;

struct Answer {
  std::optional<std::vector<std::pair<std::u16string, std::int64_t>>> records;
  std::int64_t wordsMatched;

  friend bool operator==(const Answer&, const Answer&) = default;
};

/// An index of phrases in tables, and the image of them.
class Phrases {
 public:
  explicit Phrases(const std::vector<std::u16string>& phrases) : _tree(_directory.path()) {
    _tree.setMode(2);
    for (const auto& phrase : phrases) {
      add(phrase);
    }
    _tree.setMode(1);
    _image = makeTableImage(_tree);
  }

  Answer literal(std::u16string_view text, std::int64_t editDistance, std::int64_t hits) {
    const auto search = [this](std::u16string_view word, std::int64_t distance) {
      return literalSearch(_tree, toLower(word), distance);
    };
    LiteralSpanQuery query(search, _segmenter, {editDistance, 2, 3}, hits);
    Answer answer;
    if (const auto found = query.run(text)) {
      answer.records.emplace();
      for (const auto& record : *found) {
        answer.records->emplace_back(record.value(), record.distance());
      }
    }
    answer.wordsMatched = hits;
    return answer;
  }

  Answer onIds(std::u16string_view text, std::int64_t editDistance, std::int64_t hits,
               std::size_t maxWords = SIZE_MAX, std::size_t maxWordUnits = SIZE_MAX) {
    SpanQuery query(*_image, _segmenter, {editDistance, 2, 3, maxWords, maxWordUnits}, hits);
    Answer answer;
    if (const auto found = query.run(text)) {
      answer.records.emplace();
      for (const auto& [value, distance] : *found) {
        answer.records->emplace_back(*fromUtf8(_image->valueText(value)), distance);
      }
    }
    answer.wordsMatched = hits;
    _truncated = query.truncated();
    return answer;
  }

  bool truncated() const { return _truncated; }

 private:
  void add(const std::u16string& phrase) {
    WordSegmenter segmenter;
    segmenter.start(phrase);
    while (const auto token = segmenter.next()) {
      const std::u16string word = toLower(*token);
      const std::u16string_view view = word;
      for (std::size_t i = 0; i < view.size(); ++i) {
        _tree.addEdge_fromState_toState(view.substr(i, 1), view.substr(0, i),
                                        view.substr(0, i + 1));
      }
      _tree.addFinalState(view);
      _tree.setDataFor_to(view, phrase);
    }
  }

  TemporaryDirectory _directory;
  PLXDFA _tree;
  WordSegmenter _segmenter;
  std::shared_ptr<const SearchImage> _image;
  bool _truncated = false;
};

const std::vector<std::u16string> kPhrases = {u"golden retriever puppy{ 7 }",
                                              u"golden gate bridge{ 8 }",
                                              u"golden hour",
                                              u"garden gate",
                                              u"gold rush",
                                              u"the old bridge over the river",
                                              u"red fox",
                                              u"red fog",
                                              u"an ox",
                                              u"ox",
                                              u"banner manner",
                                              u"banner",
                                              u"bridge",
                                              u"puppy love{ song 1960 }"};

TEST(SpanQueryTest, AnswersAsTheStepsOnStringsDo) {
  Phrases phrases(kPhrases);
  std::size_t found = 0;
  for (const auto* text :
       {u"", u"...", u"golden", u"a goldan retriver", u"retriver bridge golden", u"goldan xyzzy",
        u"xyzzy golden gate", u"an ox", u"ox", u"red fox", u"fox red", u"manner manner banner",
        u"the old brigde over the rivr", u"golden goldan", u"puppy bridge gate golden hour",
        u"old gold", u"gate garden gate", u"retriever bridge golden hour xyzzy plugh"}) {
    for (const std::int64_t editDistance : {0, 2}) {
      for (const std::int64_t hits :
           {std::int64_t{0}, std::int64_t{3}, std::int64_t{-5}, INT64_MAX, INT64_MIN}) {
        const auto literal = phrases.literal(text, editDistance, hits);
        EXPECT_EQ(phrases.onIds(text, editDistance, hits), literal)
            << displayUtf8(text) << ' ' << editDistance << ' ' << hits;
        found += literal.records ? literal.records->size() : 0;
      }
    }
  }
  EXPECT_GT(found, 50U);
}

TEST(SpanQueryTest, LongPostingListsAnswerTheSame) {
  // More postings than are sorted, and lists of very different lengths.
  std::vector<std::u16string> many;
  for (int i = 0; i < 6000; ++i) {
    const auto number = std::to_string(1000 + i);
    many.push_back(u"lake " + std::u16string(number.begin(), number.end()) +
                   (i % 7 == 0 ? u" shore" : u"") + (i % 500 == 0 ? u" pier" : u""));
  }
  Phrases phrases(many);
  for (const auto* text : {u"lake shore", u"shore lake pier", u"pier lake", u"lake 1500 pier",
                           u"lakes", u"shore 1500 1501", u"take pier 6500"}) {
    const auto literal = phrases.literal(text, 2, 0);
    EXPECT_EQ(phrases.onIds(text, 2, 0), literal) << displayUtf8(text);
    EXPECT_TRUE(literal.records.has_value());
  }
}

RC_GTEST_PROP(SpanQueryTest, RandomPhrasesAndTexts, ()) {
  const auto text =
      rc::gen::map(rc::gen::container<std::vector<std::u16string>>(rc::gen::element<std::u16string>(
                       u"gold", u"golden", u"goldan", u"gate", u"date", u"gates", u"ox", u"an",
                       u"red", u"rod", u"bridge", u"brigde", u"xyzzy", u"plugh")),
                   [](const std::vector<std::u16string>& words) {
                     std::u16string joined;
                     for (const auto& word : words) {
                       joined += word + u' ';
                     }
                     return joined;
                   });
  Phrases phrases(*rc::gen::container<std::vector<std::u16string>>(rc::gen::resize(4, text)));
  for (int i = 0; i < 4; ++i) {
    const auto query = *rc::gen::resize(6, text);
    const auto hits = *rc::gen::inRange<std::int64_t>(-3, 4);
    for (const std::int64_t editDistance : {0, 2}) {
      RC_ASSERT(phrases.onIds(query, editDistance, hits) ==
                phrases.literal(query, editDistance, hits));
    }
  }
}

TEST(SpanQueryTest, BudgetsCutAndSaySo) {
  Phrases phrases(kPhrases);
  phrases.onIds(u"golden gate bridge", 2, 0, 3);
  EXPECT_FALSE(phrases.truncated());
  const auto cut = phrases.onIds(u"golden gate bridge", 2, 0, 2);
  EXPECT_TRUE(phrases.truncated());
  EXPECT_EQ(cut, phrases.onIds(u"golden gate", 2, 0));
  EXPECT_FALSE(phrases.truncated());
  // A word beyond the limit is counted, and finds nothing, as one that is in no phrase does.
  const auto shortened = phrases.onIds(u"golden retrieverretriever gate", 2, 0, SIZE_MAX, 10);
  EXPECT_TRUE(phrases.truncated());
  EXPECT_EQ(shortened, phrases.onIds(u"golden xyzzyxyzzyxyzzy gate", 2, 0));
}

}  // namespace
}  // namespace wordcatcher
