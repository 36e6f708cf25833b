// A register of names that finds people however their names are spelt.
//
//     names_register REGISTER DIRECTORY < NAMES
//
// REGISTER is a file of lines, each a name, a TAB and a number. The indexes are written to
// DIRECTORY. For each name on standard input come the entries that are spelt nearly so, then those
// that sound so.

#include <wordcatcher/Error.h>
#include <wordcatcher/matcher/Index.h>

#include <algorithm>
#include <cstdint>
#include <fstream>
#include <iostream>
#include <numeric>
#include <string>
#include <vector>

namespace {

using wordcatcher::FindOptions;
using wordcatcher::FoundPhrase;
using wordcatcher::FoundWord;
using wordcatcher::Index;
using wordcatcher::IndexBuilder;
using wordcatcher::MatchingMode;

class NamesRegister {
 public:
  /// Writes both indexes of the entries: by how the names are spelt, and by how they sound.
  static void build(std::istream& entries, const std::string& directory) {
    IndexBuilder spelling(directory + "/spelling.wci");
    IndexBuilder::Options bySound;
    bySound.mode = MatchingMode::phoneticWords;
    IndexBuilder sound(directory + "/sound.wci", bySound);
    for (std::string entry; std::getline(entries, entry);) {
      const std::string name = entry.substr(0, entry.find('\t'));
      spelling.add(name, entry);
      sound.add(name, entry);
    }
    spelling.commit();
    sound.commit();
  }

  explicit NamesRegister(const std::string& directory)
      : _spelling(Index::open(directory + "/spelling.wci")),
        _sound(Index::open(directory + "/sound.wci")) {}

  /// Entries whose name has at most two mistakes, and no word more or less.
  std::vector<std::string> speltLike(const std::string& name) const {
    return entries(_spelling, name, 2);
  }

  /// Entries of which each word sounds as one of the name does.
  std::vector<std::string> soundingLike(const std::string& name) const {
    return entries(_sound, name, 0);
  }

 private:
  static std::vector<std::string> entries(const Index& index, const std::string& name,
                                          std::uint64_t maxCost) {
    FindOptions options;
    options.maxCost = maxCost;
    std::vector<std::string> found;
    for (const auto& match : index.find(name, options).matches) {
      if (hasEveryWord(match)) {
        found.push_back(match.value);
      }
    }
    return found;
  }

  /// The cost is more than the edits when a word is missing or left over.
  static bool hasEveryWord(const FoundPhrase& match) {
    const auto add = [](std::uint64_t sum, const FoundWord& hit) { return sum + hit.edits; };
    return match.cost ==
           std::accumulate(match.hits.begin(), match.hits.end(), std::uint64_t{0}, add);
  }

  Index _spelling;
  Index _sound;
};

void answer(const NamesRegister& names, const std::string& name) {
  const auto spelt = names.speltLike(name);
  for (const auto& entry : spelt) {
    std::cout << name << "\tspelt\t" << entry << '\n';
  }
  for (const auto& entry : names.soundingLike(name)) {
    if (std::find(spelt.begin(), spelt.end(), entry) == spelt.end()) {
      std::cout << name << "\tsounds\t" << entry << '\n';
    }
  }
}

}  // namespace

int main(int count, char** arguments) {
  if (count != 3) {
    std::cerr << "usage: names_register REGISTER DIRECTORY < NAMES\n";
    return 2;
  }
  try {
    std::ifstream entries(arguments[1]);
    // A directory can be opened, but has no first byte.
    if (entries.peek(); !entries.is_open() || entries.bad()) {
      std::cerr << "Cannot read the register " << arguments[1] << ": check its name.\n";
      return 2;
    }
    NamesRegister::build(entries, arguments[2]);
    const NamesRegister names(arguments[2]);
    for (std::string name; std::getline(std::cin, name);) {
      answer(names, name);
    }
  } catch (const wordcatcher::Error& error) {
    std::cerr << error.what() << '\n';
    return 2;
  }
}
