#include "SampleImages.h"

#include <utility>

#include "wordcatcher/storage/SearchImageWriter.h"

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

ImageBytes emptyImage() {
  SearchImageWriter writer(0);
  return finished(writer);
}

std::vector<SampleImage> sampleImages() {
  return {{"rivers", riverImage()},
          {"many-letters", manyLettersImage()},
          {"example", exampleImage()},
          {"deep", deepImage()},
          {"empty", emptyImage()}};
}

}  // namespace wordcatcher::testing
