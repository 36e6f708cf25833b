#include "IsoNames.h"

#include <unicode/unistr.h>

#include <fstream>
#include <nlohmann/json.hpp>
#include <random>
#include <stdexcept>

namespace wordcatcher::bench {

namespace {

void append(std::vector<std::u16string>& names, const std::string& standard) {
  const std::string path = "/usr/share/iso-codes/json/iso_" + standard + ".json";
  std::ifstream stream(path);
  if (!stream) {
    throw std::runtime_error("Install the package iso-codes: " + path + " cannot be read.");
  }
  const auto document = nlohmann::json::parse(stream);
  for (const auto& entry : document.at(standard)) {
    const auto text = icu::UnicodeString::fromUTF8(entry.at("name").get<std::string>());
    names.emplace_back(text.getBuffer(), static_cast<std::size_t>(text.length()));
  }
}

}  // namespace

std::vector<std::u16string> isoNames(std::size_t count) {
  std::vector<std::u16string> all;
  append(all, "3166-1");
  append(all, "3166-2");
  append(all, "639-3");
  if (count >= all.size()) {
    return all;
  }
  std::vector<std::u16string> names;
  for (std::size_t i = 0; i < count; ++i) {
    names.push_back(all[i * all.size() / count]);
  }
  return names;
}

std::vector<std::u16string> misspelled(const std::vector<std::u16string>& names) {
  constexpr std::size_t kShortWord = 4;
  std::mt19937 random(20261120);  // NOLINT(cert-msc32-c,cert-msc51-cpp): the same work every time
  std::vector<std::u16string> texts = names;
  for (auto& text : texts) {
    for (std::size_t begin = 0; begin < text.size();) {
      const std::size_t end = std::min(text.find(u' ', begin), text.size());
      if (end - begin > kShortWord) {
        text[begin + 1 + random() % (end - begin - 1)] =
            static_cast<char16_t>(u'a' + random() % 26);
      }
      begin = end + 1;
    }
  }
  return texts;
}

}  // namespace wordcatcher::bench
