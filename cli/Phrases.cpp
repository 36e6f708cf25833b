#include "cli/Phrases.h"

#include <unicode/uchar.h>

#include <algorithm>
#include <utility>

#include "cli/Failure.h"
#include "cli/InputLines.h"
#include "wordcatcher/Error.h"

namespace wordcatcher::cli {

namespace {

/// Whether nothing but white space is in it; every white-space character is one code unit.
bool isBlank(std::u16string_view text) {
  return std::all_of(text.begin(), text.end(), [](char16_t unit) { return u_isUWhiteSpace(unit); });
}

template <typename Unit>
PhraseOf<Unit> splitAtTab(const std::basic_string<Unit>& line) {
  constexpr Unit kBefore[] = {'{', ' ', 0};
  constexpr Unit kAfter[] = {' ', '}', 0};
  const std::size_t tab = line.find(Unit{'\t'});
  const auto phrase = line.substr(0, tab);
  if (tab == line.npos || tab + 1 == line.size()) {
    return {phrase, phrase.size()};
  }
  return {phrase + kBefore + line.substr(tab + 1) + kAfter, phrase.size()};
}

Phrase parsePhrase(const InputLine& line, const InputLines& lines) {
  if (line.text.find(u'\0') != std::u16string::npos) {
    throw Failure(lines.place() +
                  " holds a zero byte, which cannot be stored: give plain UTF-8 text.");
  }
  Phrase phrase{splitAtTab(line.utf8), splitAtTab(line.text)};
  if (isBlank(phrase.utf16.text())) {
    throw Failure(lines.place() + " has fields but no phrase: put the phrase before the TAB.");
  }
  return phrase;
}

}  // namespace

void forEachPhrase(std::vector<std::string> files, const std::function<void(Phrase&&)>& take) {
  if (files.empty()) {
    files.emplace_back("-");
  }
  for (const auto& file : files) {
    InputLines lines(file);
    while (const auto line = lines.next()) {
      if (isBlank(line->text)) {
        continue;
      }
      try {
        take(parsePhrase(*line, lines));
      } catch (const Error& error) {
        throw Failure(lines.place() + ": " + error.what());
      }
    }
  }
}

}  // namespace wordcatcher::cli
