// What docs/scoring.md shows is what the library answers. After a change run this test once with
// WORDCATCHER_UPDATE_DOCS=1 in its environment: it then writes the page and its drawings' sources
// instead of checking them. Draw these again with `dot -Tsvg`.

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <functional>
#include <memory>
#include <regex>
#include <sstream>
#include <stdexcept>
#include <string>
#include <vector>

#include "FindSupport.h"
#include "TestSupport.h"
#include "wordcatcher/matcher/Index.h"

namespace wordcatcher {
namespace {

const std::string kDocs = WORDCATCHER_SOURCE_DIR "/docs/";

bool isUpdate() { return std::getenv("WORDCATCHER_UPDATE_DOCS") != nullptr; }

std::string firstLine(const std::string& text) { return text.substr(0, text.find('\n')); }

/// What stands behind the name of a field, such as "Text:", in a block.
std::string field(const std::string& block, const std::string& name) {
  const std::size_t at = block.find(name);
  if (at == block.npos) {
    throw std::runtime_error("no " + name + " in\n" + block);
  }
  return firstLine(block.substr(block.find_first_not_of(' ', at + name.size())));
}

/// The page with the content of each fenced block of the kind replaced.
std::string replaceBlocks(std::string page, const std::string& kind,
                          const std::function<std::string(const std::string&)>& content) {
  const std::string fence = "```" + kind + "\n";
  std::size_t blocks = 0;
  for (std::size_t begin = page.find(fence); begin != page.npos; ++blocks) {
    begin += fence.size();
    const std::size_t end = page.find("```\n", begin);
    const std::string now = content(page.substr(begin, end - begin));
    page.replace(begin, end - begin, now);
    begin = page.find(fence, begin + now.size());
  }
  EXPECT_GT(blocks, 0) << "no " << kind << " on the page";
  return page;
}

std::string inQuotes(const std::string& text) {
  std::string result = "\"";
  for (const char c : text) {
    if (c == '"') {
      result += '\\';
    }
    result += c;
  }
  return result + '"';
}

/// Lines of up to some 60 bytes, for a box of a drawing.
std::string wrapped(const std::string& sentence) {
  constexpr std::size_t kWidth = 60;
  std::istringstream words(sentence);
  std::string lines;
  std::size_t length = 0;
  for (std::string word; words >> word; length += word.size() + 1) {
    if (length > 0) {
      lines += length + word.size() > kWidth ? "\n" : " ";
      length = length + word.size() > kWidth ? 0 : length;
    }
    lines += word;
  }
  return lines;
}

constexpr const char* kDrawingHead =
    "  graph [fontname=\"sans-serif\", fontsize=11, nodesep=0.25, ranksep=0.4];\n"
    "  node [shape=box, style=\"rounded,filled\", fillcolor=white, fontname=\"sans-serif\", "
    "fontsize=11];\n"
    "  edge [fontname=\"sans-serif\", fontsize=12, color=\"#555555\"];\n";

std::string textNode(const FindExplanation::TextWord& word) {
  return inQuotes(std::string("text ").append(std::to_string(word.begin)));
}

std::string phraseNode(const std::string& word) {
  return inQuotes(std::string("phrase ").append(word));
}

/// The words of the text above those of the phrase, with the pairs between them.
std::string drawingOfPairs(const FindExplanation& explanation) {
  std::ostringstream dot;
  dot << "graph scoring_cost {\n" << kDrawingHead;
  const auto row = [&dot](const char* name, const char* label, const char* colour) {
    dot << "  subgraph cluster_" << name << " { label=\"" << label << "\"; style=filled; color=\""
        << colour << "\";\n";
  };
  row("text", "the text", "#eef3fb");
  for (const auto& word : explanation.words) {
    dot << "    " << textNode(word) << " [label=" << inQuotes(word.word) << "];\n";
  }
  dot << "  }\n";
  row("phrase", "the phrase", "#fbf4e6");
  for (const auto& word : explanation.phrase) {
    dot << "    " << phraseNode(word.word) << " [label=" << inQuotes(word.word) << "];\n";
  }
  dot << "  }\n  \"none\" [label=\"left over: 2 each\", fillcolor=\"#f4f4f4\"];\n";
  for (const auto& word : explanation.words) {
    const auto pair = std::find_if(explanation.pairs.begin(), explanation.pairs.end(),
                                   [&word](const FoundWord& p) { return p.begin == word.begin; });
    const std::string from = textNode(word);
    if (pair == explanation.pairs.end()) {
      dot << "  " << from << " -- \"none\" [label=\"2\", style=dashed];\n";
    } else {
      dot << "  " << from << " -- " << phraseNode(pair->word)
          << " [label=" << inQuotes(std::to_string(pair->edits)) << "];\n";
    }
  }
  dot << "  label=" << inQuotes(std::string("cost ").append(std::to_string(explanation.cost)))
      << ";\n}\n";
  return dot.str();
}

/// The steps, with the distance after each.
std::string drawingOfSteps(const QueryExplanation& explanation) {
  std::ostringstream dot;
  dot << "digraph scoring_distance {\n  rankdir=TB;\n" << kDrawingHead;
  for (std::size_t i = 0; i < explanation.steps.size(); ++i) {
    dot << "  s" << i << " [label=" << inQuotes(wrapped(explanation.steps[i].sentence)) << "];\n";
  }
  for (std::size_t i = 1; i < explanation.steps.size(); ++i) {
    dot << "  s" << (i - 1) << " -> s" << i
        << " [label=" << inQuotes(std::to_string(explanation.steps[i - 1].distance)) << "];\n";
  }
  dot << "}\n";
  return dot.str();
}

/// What stands in boxes and at lines of a drawing's source, line by line, as in an SVG.
std::vector<std::string> labelsOf(const std::string& dot) {
  std::vector<std::string> labels;
  const std::regex label(R"re(label="((?:[^"\\]|\\.)*)")re");
  for (std::sregex_iterator at(dot.begin(), dot.end(), label), end; at != end; ++at) {
    std::istringstream lines(std::regex_replace((*at)[1].str(), std::regex(R"(\\")"), "&quot;"));
    for (std::string line; std::getline(lines, line);) {
      labels.push_back(line);
    }
  }
  return labels;
}

class ScoringPageTest : public ::testing::Test {
 protected:
  void SetUp() override {
    _page = testing::readFile(kDocs + "scoring.md");
    _index = build("words.wci", MatchingMode::words);
    _codes = build("codes.wci", MatchingMode::phoneticWords);
  }

  const Index& index() const { return *_index; }
  const Index& codes() const { return *_codes; }
  const std::string& page() const { return _page; }

  static void expectFile(const std::string& name, const std::string& content) {
    if (isUpdate()) {
      testing::writeFile(kDocs + name, content);
    } else {
      EXPECT_EQ(testing::readFile(kDocs + name), content)
          << "Run this test with WORDCATCHER_UPDATE_DOCS=1 to write " << name;
    }
  }

  static void expectDrawing(const std::string& name, const std::string& dot) {
    expectFile(name + ".dot", dot);
    const std::string svg = testing::readFile(kDocs + name + ".svg");
    const auto labels = labelsOf(dot);
    EXPECT_GT(labels.size(), 5);
    for (const auto& label : labels) {
      EXPECT_TRUE(isUpdate() || svg.find('>' + label + '<') != svg.npos)
          << "Draw " << name << ".svg again, which does not say: " << label;
    }
  }

 private:
  /// An index of the page's phrases.
  std::unique_ptr<Index> build(const std::string& name, MatchingMode mode) const {
    IndexBuilder builder(_directory.file(name), {.mode = mode, .tables = {}});
    replaceBlocks(_page, "phrases", [&builder](const std::string& block) {
      std::istringstream lines(block);
      for (std::string phrase; std::getline(lines, phrase);) {
        builder.add(phrase, phrase);
      }
      return block;
    });
    builder.commit();
    return std::make_unique<Index>(Index::open(_directory.file(name)));
  }

  testing::TemporaryDirectory _directory;
  std::string _page;
  std::unique_ptr<Index> _index;
  std::unique_ptr<Index> _codes;
};

TEST_F(ScoringPageTest, TheExamplesAreWhatTheLibraryAnswers) {
  const auto explain = [](const Index& asked) {
    return [&asked](const std::string& block) {
      return asked.explain(field(block, "Text:"), field(block, "Value:")).toText();
    };
  };
  const auto explainQuery = [](const Index& asked) {
    return [&asked](const std::string& block) {
      return asked.explainQuery(field(block, "Text:"), field(block, "Value:")).toText();
    };
  };
  std::string expected = replaceBlocks(page(), "explain", explain(index()));
  expected = replaceBlocks(expected, "explain-codes", explain(codes()));
  expected = replaceBlocks(expected, "explain-query", explainQuery(index()));
  expected = replaceBlocks(expected, "explain-query-codes", explainQuery(codes()));
  expected = replaceBlocks(expected, "find", [this](const std::string& block) {
    std::string lines = firstLine(block) + '\n';
    for (const auto& match : index().find(firstLine(block)).matches) {
      lines += "  " + std::to_string(match.cost) + "  " + match.value + '\n';
    }
    return lines;
  });
  expected = replaceBlocks(expected, "query", [this](const std::string& block) {
    std::string lines = firstLine(block) + '\n';
    for (const auto& match : index().query(firstLine(block)).matches) {
      lines += "  " + std::to_string(match.distance) + "  " + match.value + '\n';
    }
    return lines;
  });
  expectFile("scoring.md", expected);
}

TEST_F(ScoringPageTest, TheTableOfEditLimitsIsTheDefault) {
  const EditLimits limits;
  const auto row = [](const std::string& lengths, std::uint32_t edits) {
    return "| " + lengths + " | " + std::to_string(edits) + " |\n";
  };
  EXPECT_NE(
      page().find(
          row("1 or " + std::to_string(limits.shortLength), limits.shortEdits) +
          row(std::to_string(limits.shortLength + 1) + " to " + std::to_string(limits.mediumLength),
              limits.mediumEdits) +
          row(std::to_string(limits.mediumLength + 1) + " and more", limits.longEdits)),
      std::string::npos);
}

TEST_F(ScoringPageTest, WhatItSaysInPassingHolds) {
  FindOptions options;
  options.transpositions = false;
  EXPECT_TRUE(index().find("nwe", options).matches.empty());
  const Index ox = testing::indexOfPhrases({"oxygen", "ox"});
  EXPECT_EQ(testing::valuesOf(ox.find("oxgyene")), std::vector<std::string>{"oxygen"});
  EXPECT_EQ(testing::valuesOf(ox.find("oxyn")), std::vector<std::string>{"oxygen"});
  EXPECT_TRUE(ox.find("oxe").matches.empty());
  EXPECT_EQ(index().find("zealand new").matches.at(0).cost, 0);
  EXPECT_EQ(index().explain("trinidat and tobbago", "Trinidad and Tobago").cost, 2);
  EXPECT_EQ(index().explain("newyork yrok", "York").cost, 3);
  EXPECT_EQ(EditLimits().numberEdits, 0U);
  EXPECT_EQ(codes().query("trinitad").matches.at(0).distance, 0);
  EXPECT_TRUE(codes().query("trinitad hertsegowina").matches.empty());
  EXPECT_TRUE(codes().query("trinitad jorja").matches.empty()) << "they share no phrase";
}

TEST_F(ScoringPageTest, TheDrawingsAreOfTheExamples) {
  expectDrawing("scoring-cost",
                drawingOfPairs(index().explain("holidays in nwe zeelnd", "New Zealand")));
  expectDrawing("scoring-distance",
                drawingOfSteps(index().explainQuery("holidays in nwe zeelnd", "New Zealand")));
}

}  // namespace
}  // namespace wordcatcher
