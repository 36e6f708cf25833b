#include "SampleImages.h"

#include <cstdint>
#include <string_view>
#include <utility>

#include "wordcatcher/phonetic/KXMetaphone.h"
#include "wordcatcher/storage/SearchImageWriter.h"
#include "wordcatcher/text/PhraseLength.h"
#include "wordcatcher/text/Unicode.h"
#include "wordcatcher/text/WordSegmenter.h"

namespace wordcatcher::testing {

namespace {

ImageBytes finished(SearchImageWriter& writer) {
  ImageBytes bytes = std::move(writer).finish();
  image::Header header = {};
  std::memcpy(&header, bytes.data(), sizeof header);
  header.generation = {};
  std::memcpy(bytes.data(), &header, sizeof header);
  forgeChecksums(bytes);
  return bytes;
}

/// A phrase, cut into words as a builder does.
void addPhrase(SearchImageWriter& writer, std::u16string_view phrase, std::string_view value) {
  WordSegmenter segmenter;
  segmenter.start(phrase);
  std::vector<std::uint32_t> words;
  while (const auto word = segmenter.next()) {
    words.push_back(writer.addWord(toLower(*word)));
  }
  const auto counted = static_cast<std::uint32_t>(countedWords(segmenter, phrase));
  writer.addPhrase(words, writer.addValue(value, counted));
  writer.countPhrase();
}

}  // namespace

ImageBytes deepImage() {
  SearchImageWriter writer(1);
  std::u16string word;
  for (int length = 1; length <= 24; ++length) {
    word += length % 2 == 1 ? u'a' : u'b';
    writer.addPosting(word, writer.addValue(std::to_string(length), 1));
    writer.countPhrase();
  }
  return finished(writer);
}

ImageBytes riverImage() {
  SearchImageWriter writer(0);
  const std::vector<std::pair<std::u16string, std::vector<std::string>>> entries = {
      {u"aare", {"Aare", "Aarau"}}, {u"alaknanda", {"Alaknanda"}},
      {u"angara", {"Angara"}},      {u"argun", {"Argun"}},
      {u"elbe", {"Elbe", "Labe"}},  {u"ems", {"Ems"}},
      {u"enns", {"Enns"}},          {u"ob", {}},
      {u"oder", {"Oder"}},          {u"odra", {"Oder"}},
      {u"oglio", {"Oglio"}},        {u"rhein", {"Rhein", "Rhin", "Rijn"}},
      {u"rhin", {"Rhin"}},          {u"rhine", {"Rhein"}},
      {u"rhône", {"Rhône"}},        {u"saar", {"Saar", "Sarre"}},
      {u"saône", {"Saône"}},        {u"weser", {"Weser"}},
  };
  for (const auto& [word, values] : entries) {
    writer.addWord(word);
    writer.countPhrase();
    for (const auto& value : values) {
      writer.addPosting(word, writer.addValue(value, 1));
    }
  }
  return finished(writer);
}

ImageBytes manyLettersImage() {
  SearchImageWriter writer(2);
  const std::u16string latin = u"etaoinshrdlu";
  for (std::size_t i = 0; i < 90; ++i) {
    // Rare letters stand alone, behind frequent ones and before them.
    const auto rare = static_cast<char16_t>(0x4E00 + 3 * i);
    writer.addPosting(std::u16string(1, rare),
                      writer.addValue("\U0001F600" + std::to_string(i), 2));
    writer.addWord(latin.substr(i % latin.size()) + rare);
    writer.addWord(rare + latin.substr(0, 1 + i % latin.size()));
  }
  // The rarest is the least.
  writer.addWord(u"!eta");
  writer.addPosting(u"\U0001F600", writer.addValue("\uFFFD", 0));
  writer.addWord(std::u16string(1, char16_t{0xDE00}) + char16_t{0xD83D});
  writer.addPosting(std::u16string(300, u'e') + u't', writer.addValue("", 0));
  writer.addWord(std::u16string(254, u'e'));
  writer.addWord(std::u16string(255, u'e'));
  writer.addWord(std::u16string(256, u'e'));
  return finished(writer);
}

ImageBytes exampleImage() {
  SearchImageWriter writer(0);
  const auto add = [&writer](std::u16string_view word, std::string_view value,
                             std::uint32_t countedWords) {
    writer.addPosting(word, writer.addValue(value, countedWords));
    writer.countPhrase();
  };
  add(u"ré", "Ré{ 85 km² }", 1);
  add(u"réole", "La Réole", 1);
  add(u"réunion", "La Réunion", 1);
  add(u"aisne", "Aisne", 1);
  return finished(writer);
}

ImageBytes phrasesImage() {
  SearchImageWriter writer(0);
  addPhrase(writer, u"new zealand", "New Zealand{ NZ }");
  addPhrase(writer, u"aotearoa", "New Zealand{ NZ }");
  addPhrase(writer, u"aotearoa new zealand", "New Zealand{ NZ }");
  addPhrase(writer, u"trinidad and tobago", "Trinidad and Tobago");
  addPhrase(writer, u"newfoundland and labrador", "Newfoundland and Labrador");
  addPhrase(writer, u"new foundland", "Newfoundland");
  addPhrase(writer, u"newfoundland", "Newfoundland");
  addPhrase(writer, u"duran duran", "Duran Duran");
  addPhrase(writer, u"duranduran", "Duran Duran");
  addPhrase(writer, u"new york", "New York");
  addPhrase(writer, u"york", "York");
  addPhrase(writer, u"route 66", "Route 66");
  addPhrase(writer, u"route66", "Route 66");
  addPhrase(writer, u"a 12", "A 12");
  addPhrase(writer, u"a12", "A12");
  // What is left of these does not fit into their leaves.
  addPhrase(writer, u"la trinidaddelosangeles", "La Trinidad");
  addPhrase(writer, u"llanfairpwllgwyngyll", "Llanfairpwllgwyngyll");
  writer.addWord(u"zembla");
  writer.addValue("Nowhere", 0);
  return finished(writer);
}

ImageBytes rareLettersImage() {
  SearchImageWriter writer(0);
  addPhrase(writer, u"danube", "Danube");
  addPhrase(writer, u"дунай", "Danube");
  addPhrase(writer, u"река дунай", "Danube");
  addPhrase(writer, u"δούναβης", "Danube");
  addPhrase(writer, u"ποταμός δούναβης", "Danube");
  addPhrase(writer, u"черное море", "Black Sea");
  addPhrase(writer, u"μαύρη θάλασσα", "Black Sea");
  addPhrase(writer, u"black sea", "Black Sea");
  addPhrase(writer, u"европейские шхеры", "Skerries");
  addPhrase(writer, u"жигулёвск тольятти", "Zhiguli");
  addPhrase(writer, u"щёлково цна эльба фи", "Rivers of the plain");
  addPhrase(writer, u"ξάνθη ψαρά χίος", "Xanthi, Psara, Chios");
  addPhrase(writer, u"φάληρο ζάκυνθος", "Phaleron, Zakynthos");
  addPhrase(writer, u"quito jamaica", "Quito, Jamaica");
  addPhrase(writer, u"oxford vizcaya", "Oxford, Vizcaya");
  addPhrase(writer, u"pagwell", "Pagwell");
  return finished(writer);
}

ImageBytes wideLabelsImage() {
  SearchImageWriter writer(0);
  constexpr std::size_t kWords = 40;
  constexpr std::size_t kLength = 7;
  constexpr char16_t kFirstSyllable = 0xAC00;
  std::u16string phrase;
  for (std::size_t i = 0; i < kWords; ++i) {
    for (std::size_t j = 0; j < kLength; ++j) {
      phrase += static_cast<char16_t>(kFirstSyllable + 28 * (kLength * i + j));
    }
    if (i % 4 == 3) {
      addPhrase(writer, phrase, std::to_string(i));
      phrase.clear();
    } else {
      phrase += u' ';
    }
  }
  return finished(writer);
}

ImageBytes codesImage() {
  SearchImageWriter writer(2);
  KXMetaphone encoder;
  for (const auto& [phrase, value] : std::vector<std::pair<std::u16string, std::string>>{
           {u"Trinidad and Tobago", "Trinidad and Tobago"},
           {u"Papua New Guinea", "Papua New Guinea"},
           {u"Guinea", "Guinea"},
           {u"New Caledonia", "New Caledonia"},
           {u"Nouvelle Calédonie", "New Caledonia"},
           {u"Schleswig Holstein", "Schleswig-Holstein"}}) {
    addPhrase(writer, encoder.translate(phrase), value);
  }
  return finished(writer);
}

ImageBytes textsImage() {
  SearchImageWriter writer(1);
  for (const auto& [text, value] : std::vector<std::pair<std::u16string_view, std::string_view>>{
           {u"route 66", "Route 66"},
           {u"trinidad and tobago", "Trinidad and Tobago"},
           {u"new zealand", "New Zealand{ NZ }"},
           {u"aotearoa", "New Zealand{ NZ }"},
           {u"new zealand", "NZ"},
           {u"new york", "New York"}}) {
    writer.addPosting(text, writer.addValue(value, 1));
    writer.countPhrase();
  }
  return finished(writer);
}

ImageBytes emptyImage() {
  SearchImageWriter writer(0);
  return finished(writer);
}

std::vector<SampleImage> sampleImages() {
  return {{"rivers", riverImage()},
          {"many-letters", manyLettersImage()},
          {"example", exampleImage()},
          {"deep", deepImage()},
          {"phrases", phrasesImage()},
          {"rare-letters", rareLettersImage()},
          {"wide-labels", wideLabelsImage()},
          {"codes", codesImage()},
          {"texts", textsImage()},
          {"empty", emptyImage()}};
}

}  // namespace wordcatcher::testing
