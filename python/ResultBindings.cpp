#include "python/Results.h"

#include "python/Bindings.h"
#include "python/Record.h"
#include "python/Text.h"
#include "wordcatcher/Version.h"
#include "wordcatcher/matcher/Find.h"

namespace wordcatcher::python {

namespace {

constexpr const char* kBegin = "Where it begins in the text, in code points, as slices count.";
constexpr const char* kEnd = "Where it ends in the text: the code point behind its last one.";
constexpr const char* kTruncated = "Whether a budget cut something off.";
constexpr const char* kFindTruncated =
    "Whether a budget cut something off. Then there may be better phrases than these, and another\n"
    "limit may list others.";
constexpr const char* kText = "The text that was asked about.";
constexpr const char* kValue = "The value that was asked about.";
constexpr const char* kIsStored = "Whether the index holds the value.";
constexpr const char* kToJson = "One JSON object on one line; offsets in code points.";

constexpr const char* kLimitsDoc =
    R"(How many edits a word of the text may be away from a stored word, by the stored word's length.

short_length    A stored word of up to so many UTF-16 code units, lower-cased, is short;
medium_length   a longer one of up to so many is medium; all others are long.
short_edits     Edits of a short word,
medium_edits    of a medium one,
long_edits      of a long one,
whole_text_edits  of a whole text, in an index of whole texts,
number_edits    of a word when it or the stored word holds a digit: at most those that the stored
                word's length allows; each at most 3.

Words that hold a digit are only found exactly, which number_edits alone relaxes.)";

void bindLimits(py::module_& module) {
  const EditLimits limits;
  const std::string parameters = "*, short_length=" + std::to_string(limits.shortLength) +
                                 ", medium_length=" + std::to_string(limits.mediumLength) +
                                 ", short_edits=" + std::to_string(limits.shortEdits) +
                                 ", medium_edits=" + std::to_string(limits.mediumEdits) +
                                 ", long_edits=" + std::to_string(limits.longEdits) +
                                 ", whole_text_edits=" + std::to_string(limits.wholeTextEdits) +
                                 ", number_edits=" + std::to_string(limits.numberEdits) + ")";
  const auto makeLimits = [](const py::object& shortLength, const py::object& mediumLength,
                             const py::object& shortEdits, const py::object& mediumEdits,
                             const py::object& longEdits, const py::object& wholeTextEdits,
                             const py::object& numberEdits) {
    const auto edits = [](const py::object& value, const char* name) {
      const std::uint64_t number = count(value, name);
      if (number > EditLimits::kMaxEdits) {
        throw py::value_error(std::string(name) + " is at most " +
                              std::to_string(EditLimits::kMaxEdits));
      }
      return static_cast<std::uint32_t>(number);
    };
    return py::cast(
        EditLimits{count(shortLength, "short_length"), count(mediumLength, "medium_length"),
                   edits(shortEdits, "short_edits"), edits(mediumEdits, "medium_edits"),
                   edits(longEdits, "long_edits"), edits(wholeTextEdits, "whole_text_edits"),
                   edits(numberEdits, "number_edits")});
  };
  const py::cpp_function make(
      makeLimits, py::name("wordcatcher.EditLimits"), py::kw_only(),
      py::arg("short_length") = limits.shortLength, py::arg("medium_length") = limits.mediumLength,
      py::arg("short_edits") = limits.shortEdits, py::arg("medium_edits") = limits.mediumEdits,
      py::arg("long_edits") = limits.longEdits, py::arg("whole_text_edits") = limits.wholeTextEdits,
      py::arg("number_edits") = limits.numberEdits);
  bindRecord(
      module, "EditLimits", documented("EditLimits(" + parameters, kLimitsDoc).c_str(),
      Construction<EditLimits>::by(make),
      Field{"short_length", &EditLimits::shortLength, "A stored word of up to so many is short."},
      Field{"medium_length", &EditLimits::mediumLength, "A longer one of up to so many is medium."},
      Field{"short_edits", &EditLimits::shortEdits, "Edits of a short word."},
      Field{"medium_edits", &EditLimits::mediumEdits, "Edits of a medium word."},
      Field{"long_edits", &EditLimits::longEdits, "Edits of a long word."},
      Field{"whole_text_edits", &EditLimits::wholeTextEdits, "Edits of a whole text."},
      Field{
          "number_edits", &EditLimits::numberEdits,
          "Edits of a word when it or the stored word holds a digit: at most those that the stored "
          "word's length allows."});
}

void bindFind(py::module_& module) {
  bindRecord(module, "FoundWord",
             "A word of a phrase found in a text, or two in one piece.\n\n"
             "text[word.begin:word.end] is what stands there.",
             Field{"begin", &FoundWord::begin, kBegin}, Field{"end", &FoundWord::end, kEnd},
             Field{"word", &FoundWord::word,
                   "As stored; two words that the text joins stand with a space between."},
             Field{"edits", &FoundWord::edits, "Between the two."});
  bindRecord(module, "FoundPhrase",
             "A phrase found in a text.\n\n"
             "text[phrase.begin:phrase.end] spans its words.",
             Field{"value", &FoundPhrase::value, "Its data string."},
             Field{"cost", &FoundPhrase::cost,
                   "Edits, and 2 for each word missing from the text or left over in it."},
             Field{"begin", &FoundPhrase::begin, kBegin}, Field{"end", &FoundPhrase::end, kEnd},
             Field{"hits", &FoundPhrase::hits, "Its words found, in the order of the text."});
  auto result = bindRecord(
      module, "FindResult",
      "The phrases that a text holds, a sequence of FoundPhrase with the best one first.",
      Field{"matches", &FindResult::matches, "All of them, as a tuple."},
      Field{"truncated", &FindResult::truncated, kFindTruncated});
  bindSequence(result);
}

void bindQuery(py::module_& module) {
  bindRecord(module, "QueryMatch", "A phrase that a query found.",
             Field{"value", &Index::Match::value,
                   "Its data string; in an index of whole texts the stored text."},
             Field{"distance", &Index::Match::distance,
                   "Its score; in an index of whole texts the edits."},
             Field{"data", &Index::Match::data,
                   "In an index of whole texts the data strings; else empty."});
  auto query = bindRecord(
      module, "QueryResult", "What a query found, a sequence of QueryMatch, ascending by distance.",
      Field{"found", &Index::QueryResult::found,
            "Whether any word of the text was found with data; always true for whole texts."},
      Field{"matches", &Index::QueryResult::matches, "All of them, as a tuple."},
      Field{"truncated", &Index::QueryResult::truncated, kTruncated});
  bindSequence(query);
  bindRecord(module, "WordMatch", "A stored word (or whole text, or code) near another.",
             Field{"value", &Index::WordMatch::value, "As stored."},
             Field{"distance", &Index::WordMatch::distance, "Edits between the two."},
             Field{"data", &Index::WordMatch::data, "The data strings of its phrases."});
  auto search =
      bindRecord(module, "SearchResult", "Stored words near another, a sequence of WordMatch.",
                 Field{"matches", &Index::SearchResult::matches, "All of them, as a tuple."},
                 Field{"truncated", &Index::SearchResult::truncated,
                       "Whether the word is longer than max_word_units and was not looked up."});
  bindSequence(search);
}

/// The library's text form cuts words out of the text by bytes.
std::string shown(FindExplanation explanation) {
  const CodePoints codePoints(explanation.text);
  for (auto& pair : explanation.pairs) {
    pair.begin = codePoints.byteAfter(pair.begin);
    pair.end = codePoints.byteAfter(pair.end);
  }
  return explanation.toText();
}

void bindFindExplanation(py::module_& module) {
  using Comparison = FindExplanation::Comparison;
  using PhraseWord = FindExplanation::PhraseWord;
  using TextWord = FindExplanation::TextWord;
  bindRecord(module, "PhraseWord", "A word of a phrase.",
             Field{"word", &PhraseWord::word, "As stored."},
             Field{"length_limit", &PhraseWord::lengthLimit,
                   "Edits that a text's word may be away from it by its length."},
             Field{"limit", &PhraseWord::limit, "The same: less if it holds a digit."});
  bindRecord(module, "WordComparison", "A word of a phrase beside a word of the text.",
             Field{"word", &Comparison::word, "Of the phrase."},
             Field{"edits", &Comparison::edits, "Between the two."},
             Field{"limit", &Comparison::limit,
                   "Edits that the two may have: less if one of them holds a digit."},
             Field{"within", &Comparison::within, "Whether the two may be paired."});
  bindRecord(
      module, "TextWord", "A word of the text.", Field{"begin", &TextWord::begin, kBegin},
      Field{"end", &TextWord::end, kEnd}, Field{"word", &TextWord::word, "As it is looked up."},
      Field{"written", &TextWord::written, "If that is a code, as it is in the text; else empty."},
      Field{"is_looked_up", &TextWord::isLookedUp, "False for a word that is too long."},
      Field{"comparisons", &TextWord::comparisons,
            "With the words of the phrase, in its order; with some or none if truncated."});
  bindRecord(
      module, "FindExplanation",
      "Why a value has its cost for a text, or why find() does not list it.\n\n"
      "str() of it is for people.",
      Field{"text", &FindExplanation::text, kText}, Field{"value", &FindExplanation::value, kValue},
      Field{"is_stored", &FindExplanation::isStored, kIsStored},
      Field{"is_found", &FindExplanation::isFound, "Whether find() lists it."},
      Field{"truncated", &FindExplanation::truncated, kTruncated},
      Field{"words", &FindExplanation::words, "Those of the text, in its order."},
      Field{"phrase", &FindExplanation::phrase, "The words of the phrase that fits best."},
      Field{"pairs", &FindExplanation::pairs, "What was paired, in the order of the text."},
      Field{"missing", &FindExplanation::missing, "Words of the phrase that the text lacks."},
      Field{"surplus", &FindExplanation::surplus,
            "Words of the text that are left over; in an index of codes with their codes."},
      Field{"edits", &FindExplanation::edits, "Of the pairs."},
      Field{"cost", &FindExplanation::cost, "Edits, and 2 for each missing and surplus word."},
      Field{"objections", &FindExplanation::objections,
            "Sentences: which limit keeps it out; empty when found."})
      .def(
          "to_json", [](const FindExplanation& self) { return toPython(self.toJson()); },
          documented("to_json($self)", kToJson).c_str())
      .def("__str__", [](const FindExplanation& self) { return toPython(shown(self)); });
}

void bindQueryExplanation(py::module_& module) {
  bindRecord(
      module, "QueryStep", "A step on the way to a distance.",
      Field{"sentence", &QueryExplanation::Step::sentence,
            "What was looked at, and what came of it."},
      Field{"distance", &QueryExplanation::Step::distance, "The value's distance after it."});
  bindRecord(module, "QueryExplanation",
             "How the distance of a value comes about in query(), step by step.\n\n"
             "str() of it is for people.",
             Field{"text", &QueryExplanation::text, kText},
             Field{"value", &QueryExplanation::value, kValue},
             Field{"is_stored", &QueryExplanation::isStored, kIsStored},
             Field{"is_found", &QueryExplanation::isFound, "Whether query() lists it."},
             Field{"truncated", &QueryExplanation::truncated, kTruncated},
             Field{"distance", &QueryExplanation::distance,
                   "At the end; 0 for a value that was no candidate."},
             Field{"bound", &QueryExplanation::bound, "The greatest distance that is listed."},
             Field{"steps", &QueryExplanation::steps, "In the order in which they are taken."})
      .def(
          "to_json", [](const QueryExplanation& self) { return toPython(self.toJson()); },
          documented("to_json($self)", "One JSON object on one line.").c_str())
      .def("__str__", [](const QueryExplanation& self) { return toPython(self.toText()); });
}

void bindInfo(py::module_& module) {
  bindRecord(
      module, "IndexInfo", "What an index holds.",
      Field{"mode", &IndexInfo::mode, "How its phrases are found: see IndexBuilder."},
      Field{"phrases", &IndexInfo::phrases,
            "Phrases added; 0 for a classic index, which does not count them."},
      Field{"words", &IndexInfo::words, "Distinct stored words."},
      Field{"values", &IndexInfo::values, "Distinct data strings."},
      Field{"bytes", &IndexInfo::bytes, "Its size."},
      Field{"generation", &IndexInfo::generation, "32 hexadecimal digits, random for each build."},
      Field{"version", &IndexInfo::version, "Of the format."});
}

}  // namespace

void checkPickle(const py::tuple& parts, std::size_t count) {
  if (parts.size() != count) {
    refusePickle();
  }
}

void refusePickle() {
  throw py::value_error("The pickle was written by another version of wordcatcher than " +
                        std::string(versionString) +
                        ", which runs here; load it with that one, or make it anew with this.");
}

void bindResults(py::module_& module) {
  bindLimits(module);
  bindFind(module);
  bindQuery(module);
  bindFindExplanation(module);
  bindQueryExplanation(module);
  bindInfo(module);
}

}  // namespace wordcatcher::python
