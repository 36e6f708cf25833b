#include "RealWords.h"

#include <algorithm>
#include <fstream>
#include <set>
#include <stdexcept>

namespace wordcatcher::testing {

namespace {

std::vector<std::u16string> readLemmas() {
  std::set<std::u16string> lemmas;
  for (const char* part : {"noun", "verb", "adj", "adv"}) {
    const std::string path = std::string("/usr/share/wordnet/index.") + part;
    std::ifstream file(path);
    if (!file) {
      throw std::runtime_error("Install the package wordnet-base: " + path + " cannot be read.");
    }
    for (std::string line; std::getline(file, line);) {
      // Lines that begin with a space are headers; in a lemma an underscore stands for a space, and
      // all of them are ASCII.
      if (line.starts_with(' ')) {
        continue;
      }
      std::string lemma = line.substr(0, line.find(' '));
      std::replace(lemma.begin(), lemma.end(), '_', ' ');
      lemmas.emplace(lemma.begin(), lemma.end());
    }
  }
  return {lemmas.begin(), lemmas.end()};
}

char16_t anyLetter(std::mt19937& random) { return static_cast<char16_t>(u'a' + random() % 26); }

}  // namespace

const std::vector<std::u16string>& lemmas() {
  static const auto all = readLemmas();
  return all;
}

std::vector<std::u16string> sample(const std::vector<std::u16string>& all, std::size_t count,
                                   std::mt19937& random) {
  std::set<std::size_t> places;
  while (places.size() < std::min(count, all.size())) {
    places.insert(random() % all.size());
  }
  std::vector<std::u16string> chosen;
  chosen.reserve(places.size());
  for (const std::size_t place : places) {
    chosen.push_back(all[place]);
  }
  return chosen;
}

std::u16string edited(std::u16string text, std::mt19937& random) {
  const std::size_t place = random() % text.size();
  const char16_t letter = anyLetter(random);
  switch (random() % 3) {
    case 0:
      text.insert(place, 1, letter);
      break;
    case 1:
      text.erase(place, 1);
      break;
    default:
      text[place] = letter;
  }
  return text;
}

std::u16string misspelled(std::u16string_view phrase, const std::vector<std::u16string>& extraWords,
                          std::mt19937& random) {
  constexpr std::size_t kShortWord = 4;
  auto words = spacedWords(phrase);
  for (auto& word : words) {
    if (word.size() > kShortWord && random() % 2 == 0) {
      word = edited(word, random);
    }
  }
  if (random() % 10 < 3) {
    const auto place = static_cast<std::ptrdiff_t>(random() % (words.size() + 1));
    words.insert(words.begin() + place, extraWords[random() % extraWords.size()]);
  }
  std::u16string text;
  for (const auto& word : words) {
    text += (text.empty() ? u"" : u" ") + word;
  }
  return text;
}

std::vector<std::u16string> spacedWords(std::u16string_view text) {
  std::vector<std::u16string> words;
  while (!text.empty()) {
    const std::size_t end = std::min(text.find(u' '), text.size());
    if (end > 0) {
      words.emplace_back(text.substr(0, end));
    }
    text.remove_prefix(std::min(end + 1, text.size()));
  }
  return words;
}

}  // namespace wordcatcher::testing
