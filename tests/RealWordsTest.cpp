// Real words and phrases, misspelled, against the literal walk and the literal steps.

#include "RealWords.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <map>
#include <optional>
#include <set>
#include <sstream>
#include <utility>

#include "LiteralSearch.h"
#include "LiteralSpanQuery.h"
#include "TestSupport.h"
#include "wordcatcher/fuzzy/LXFuzzyIndex.h"
#include "wordcatcher/matcher/Index.h"
#include "wordcatcher/matcher/IndexBuilder.h"
#include "wordcatcher/matcher/KXWordcatcher.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher {
namespace {

using testing::edited;
using testing::lemmas;
using testing::literalSearch;
using testing::LiteralSpanQuery;
using testing::misspelled;
using testing::sample;
using testing::TemporaryDirectory;

constexpr std::int32_t kReading = 1;
constexpr std::int32_t kWriting = 2;

/// Value, distance and data of each match.
using Rows = std::vector<std::tuple<std::u16string, std::int64_t, std::vector<std::u16string>>>;

Rows rowsOf(const std::vector<LXFuzzyMatch>& matches) {
  Rows rows;
  for (const auto& match : matches) {
    rows.emplace_back(match.value(), match.distance(), match.data());
  }
  return rows;
}

std::vector<std::u16string> singleWords() {
  std::vector<std::u16string> words;
  std::copy_if(lemmas().begin(), lemmas().end(), std::back_inserter(words),
               [](const auto& lemma) { return lemma.find(u' ') == std::u16string::npos; });
  return words;
}

TEST(RealWordsTest, MisspelledWordsFindWhatTheLiteralWalkFinds) {
  std::mt19937 random(5);  // NOLINT(cert-msc32-c,cert-msc51-cpp): the same every time
  const auto words = sample(singleWords(), 4000, random);
  const TemporaryDirectory directory;
  {
    LXFuzzyIndex index(directory.path());
    index.setMode(kWriting);
    for (const auto& word : words) {
      index.addString_withData(word, word);
      if (word.size() % 2 == 0) {
        index.addString_withData(word, u"even");  // more data puts a word in front
      }
    }
    index.setMode(0);
  }
  std::vector<std::u16string> queries;
  for (const auto& word : sample(words, 200, random)) {
    auto query = word;
    for (std::size_t edits = 1 + random() % 3; edits > 0 && query.size() > 1; --edits) {
      query = edited(query, random);
    }
    queries.push_back(query);
  }
  constexpr std::int64_t kMostDistance = 3;
  std::vector<Rows> literal;
  {
    PLXDFA tree(directory.path());
    tree.setMode(kReading);
    for (const auto& query : queries) {
      for (std::int64_t k = 1; k <= kMostDistance; ++k) {
        literal.push_back(rowsOf(literalSearch(tree, query, k)));
      }
    }
  }
  LXFuzzyIndex index(directory.path());
  index.setMode(kReading);
  std::size_t matches = 0;
  auto expected = literal.begin();
  for (const auto& query : queries) {
    for (std::int64_t k = 1; k <= kMostDistance; ++k, ++expected) {
      const auto found = rowsOf(index.search_withMaxDistance(query, k));
      matches += found.size();
      ASSERT_EQ(found, *expected) << displayUtf8(query) << " at " << k;
    }
  }
  EXPECT_GT(matches, 1000U);
}

/// What a span query answers: nothing or records, and the counter behind it.
struct Answer {
  std::optional<std::vector<std::pair<std::u16string, std::int64_t>>> records;
  std::int64_t wordsMatched = 0;
};

void add(Answer& answer, const std::vector<KXWordcatch>& records) {
  answer.records.emplace();
  for (const auto& record : records) {
    answer.records->emplace_back(record.value(), record.distance());
  }
}

/// Lemmas as phrases, in tables and in an image, and questions made of them.
class LemmaQueryTest : public ::testing::Test {
 protected:
  LemmaQueryTest() {
    std::mt19937 random(6);  // NOLINT(cert-msc32-c,cert-msc51-cpp): the same every time
    const auto phrases = sample(lemmas(), 5000, random);
    IndexBuilder builder(image(), {.mode = MatchingMode::words, .tables = tables.path()});
    for (const auto& phrase : phrases) {
      builder.add(displayUtf8(phrase), displayUtf8(phrase));
    }
    builder.commit();
    const auto extraWords = singleWords();
    std::vector<std::u16string> several;
    std::copy_if(phrases.begin(), phrases.end(), std::back_inserter(several),
                 [](const auto& phrase) { return phrase.find(u' ') != std::u16string::npos; });
    for (int i = 0; i < 400; ++i) {
      texts.push_back(misspelled(several[random() % several.size()], extraWords, random));
    }
  }

  std::string image() const { return tables.file("lemmas.wci"); }

  /// The steps on strings, each word searched by the literal walk. `counter` runs on from query to
  /// query, or is set to 0 before each.
  std::vector<Answer> literalAnswers(bool runsOn) {
    PLXDFA tree(tables.path());
    tree.setMode(kReading);
    const auto search = [&](std::u16string_view word, std::int64_t distance) {
      const auto [found, isNew] = _searched.try_emplace({toLower(word), distance});
      if (isNew) {
        found->second = literalSearch(tree, found->first.first, distance);
      }
      return found->second;
    };
    WordSegmenter segmenter;
    std::vector<Answer> answers;
    std::int64_t counter = 0;
    for (const auto& text : texts) {
      counter = runsOn ? counter : 0;
      Answer& answer = answers.emplace_back();
      if (const auto found = LiteralSpanQuery(search, segmenter, {2, 2, 3}, counter).run(text)) {
        add(answer, *found);
      }
      answer.wordsMatched = counter;
    }
    return answers;
  }

  std::vector<Answer> matcherAnswers(bool runsOn) {
    KXWordcatcher matcher(tables.path(), 0);
    matcher.setMode(kReading);
    std::vector<Answer> answers;
    for (const auto& text : texts) {
      if (!runsOn) {
        matcher.setWordsMatched(0);
      }
      Answer& answer = answers.emplace_back();
      if (const auto found = matcher.query(text)) {
        add(answer, std::get<std::vector<KXWordcatch>>(*found));
      }
      answer.wordsMatched = matcher.wordsMatched();
    }
    return answers;
  }

  TemporaryDirectory tables;
  std::vector<std::u16string> texts;

 private:
  std::map<std::pair<std::u16string, std::int64_t>, std::vector<LXFuzzyMatch>> _searched;
};

TEST_F(LemmaQueryTest, AnswersAsTheLiteralStepsDo) {
  std::size_t records = 0;
  for (const bool runsOn : {false, true}) {
    const auto literal = literalAnswers(runsOn);
    const auto found = matcherAnswers(runsOn);
    ASSERT_EQ(found.size(), literal.size());
    for (std::size_t i = 0; i < literal.size(); ++i) {
      EXPECT_EQ(found[i].records, literal[i].records) << displayUtf8(texts[i]);
      EXPECT_EQ(found[i].wordsMatched, literal[i].wordsMatched) << displayUtf8(texts[i]);
      records += literal[i].records ? literal[i].records->size() : 0;
    }
    // An image has no counter that runs on; its answers are those of a fresh matcher.
    const Index index = Index::open(image());
    for (std::size_t i = 0; i < literal.size() && !runsOn; ++i) {
      const auto result = index.query(displayUtf8(texts[i]));
      Answer answer;
      if (result.found) {
        answer.records.emplace();
        for (const auto& match : result.matches) {
          answer.records->emplace_back(*fromUtf8(match.value), match.distance);
        }
      }
      EXPECT_EQ(answer.records, literal[i].records) << displayUtf8(texts[i]);
    }
  }
  EXPECT_GT(records, 600U);
}

}  // namespace
}  // namespace wordcatcher
