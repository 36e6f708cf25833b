#include <algorithm>
#include <filesystem>
#include <system_error>
#include <thread>
#include <utility>

#include "python/Bindings.h"
#include "python/Call.h"
#include "python/Construction.h"
#include "python/FindMany.h"
#include "python/Lock.h"
#include "python/Names.h"
#include "python/Record.h"
#include "python/Results.h"
#include "python/Text.h"
#include "wordcatcher/Error.h"

namespace wordcatcher::python {

namespace {

constexpr const char* kIndexDoc =
    R"(An index opened for reading: a file of IndexBuilder, or a classic index directory.

    index = wordcatcher.Index.open("names.wci")
    for match in index.find("holidays in trinidat and tobbago"):
        print(match.value, match.cost)

An index is immutable; any number of threads use one at once, and any number of processes one file.
Pickled, it is its path and its options, and opens the file that stands there when it is unpickled.

A lone surrogate in a text separates words. Every call may raise Error (damaged) when the file turns
out to be damaged, and does nothing worse, whatever the file holds.)";

constexpr const char* kNoConstructor =
    "An index is opened with wordcatcher.Index.open(path), and built with "
    "wordcatcher.IndexBuilder(path).";

constexpr const char* kOpenDoc = R"(Opens an index.

path             The file, or a classic index's directory (or prefix of its files' names), of which
                 an index is built in memory: str, bytes or os.PathLike.
copy             Whether to copy the file into memory instead of mapping it: for files on storage
                 that may shrink while they are read.
mode             How a classic index is to be queried: "words", "text" or "phonetic". A file of
                 IndexBuilder remembers its own.
max_query_words  Words of a text that are looked at.
max_word_units   UTF-16 code units of a word, or whole text, that is looked up.

Raises Error: not_found, not_readable, not_an_index, damaged.)";

constexpr const char* kFindDoc =
    R"(The phrases that a text holds, wholly or in part, the best one first.

The cost of a phrase is the edits of its words, and 2 for each of its words that the text lacks, and
2 for each word of the text that it leaves over, over the best pairing of the words of both.

limit           Phrases at the most; None for all.
max_cost        The greatest cost of a phrase; None for any.
min_words       Words of a phrase that the text must hold; at least 1.
edits           EditLimits: how many edits a word may be away from a stored one, by the length of
                that; None for the usual ones.
transpositions  Whether two neighbouring letters that changed places are one edit, not two.
overlaps        What becomes of phrases whose ranges in the text overlap: "all" gives every one,
                "no_sub" none within the larger range of another, "longest" those with the longest
                ranges.
max_postings    Phrases under the words of the text that are looked at; when there are more, the
                result is truncated.

Other Python threads run meanwhile.)";

constexpr const char* kFindManyDoc = R"(What find() gives for each text, as a list in their order.

texts    Any iterable of str.
threads  Threads that work, this one included; None for one for each processor. Other Python
         threads run meanwhile as well.

All other parameters are those of find(). An exception ends the work and is raised here; so does
Ctrl-C.)";

constexpr const char* kQueryDoc =
    R"(The phrases near a text by the classic score, ascending by distance.

The distance adds up the edits of words, and 2 for each word too many or too few, with some
exceptions for short words; explain_query() tells them. In an index of whole texts it is the edits.)";

constexpr const char* kSearchDoc = R"(Stored words (or whole texts, or codes) near a word.

max_distance is the edits at the most, up to 16. Raises Error (bad_input) beyond, and for a word with
a lone surrogate.)";

constexpr const char* kExplainDoc =
    R"(Why a value has its cost for a text, or why find() does not list it.

The other parameters are those of find(). Takes time linear in the values of the index.)";

constexpr const char* kExplainQueryDoc =
    R"(How the distance of a value comes about in query(), step by step.)";

constexpr const char* kVerifyDoc =
    R"(Checks the whole file. Raises Error (damaged) that names what is wrong.)";

/// The edits that search() allows when it is not told; the command's search verb has the same.
constexpr std::uint64_t kMaxDistance = 2;

/// Texts of which find_many() holds UTF-8 copies at a time.
constexpr std::size_t kTextsAtOnce = 16384;

/// What an index is opened with, and opened again with from a pickle.
struct Source {
  std::string path;
  MatchingMode mode;
  Index::Options options;
};

class OpenIndex {
 public:
  explicit OpenIndex(Source source) : _source(std::move(source)), _index(open(_source)) {}

  const Source& source() const { return _source; }
  const Index& index() const { return _index; }

 private:
  static Index open(const Source& source) {
    const Unlocked unlocked;
    return Index::open(source.path, source.options, source.mode);
  }

  Source _source;
  Index _index;
};

/// Independent of the working directory, which is another one where a pickle is opened.
std::string absolute(const std::string& path) {
  std::error_code failure;
  auto absolutePath = std::filesystem::absolute(path, failure).string();
  return failure || path.empty() ? path : absolutePath;
}

OpenIndex open(const py::object& path, bool copy, const std::string& mode,
               const py::object& maxQueryWords, const py::object& maxWordUnits) {
  return OpenIndex(
      {absolute(pathBytes(path)),
       modeNamed(mode),
       {copy ? Index::Load::copy : Index::Load::map, count(maxQueryWords, "max_query_words"),
        count(maxWordUnits, "max_word_units")}});
}

py::tuple pickled(const OpenIndex& self) {
  const Source& source = self.source();
  return py::make_tuple(py::bytes(source.path), source.options.load == Index::Load::copy,
                        nameOf(source.mode), source.options.maxQueryWords,
                        source.options.maxWordUnits);
}

OpenIndex unpickled(const py::tuple& parts) {
  checkPickle(parts, 5);
  return open(parts[0], parts[1].cast<bool>(), parts[2].cast<std::string>(), parts[3], parts[4]);
}

std::string shownIndex(const OpenIndex& self) {
  const auto info = self.index().info();
  return "<wordcatcher.Index " + std::string(py::repr(pathText(self.source().path))) +
         ", mode=" + std::string(py::repr(py::str(nameOf(info.mode)))) +
         ", phrases=" + std::to_string(info.phrases) + ", words=" + std::to_string(info.words) +
         ", values=" + std::to_string(info.values) + '>';
}

/// A value that may be stored: without lone surrogates, as which it could not be told from others.
std::string valueUtf8(const py::str& value) {
  std::string utf8 = storedUtf8(value);
  if (utf8 != searchedUtf8(value)) {
    throw Error(ErrorCode::badInput,
                "The value holds a lone surrogate, which no stored value does; take it out.");
  }
  return utf8;
}

FindResult find(const OpenIndex& self, const Call& call) {
  const FindOptions options = findOptions(call.options(), "find");
  const std::string utf8 = searchedUtf8(call.text("text"));
  const Unlocked unlocked;
  FindResult result = self.index().find(utf8, options);
  CodePoints(utf8).convert(result);
  return result;
}

/// The next object of an iterator, null at its end.
py::object next(const py::object& iterator) {
  auto object =
      py::reinterpret_steal<py::object>(callPython([&] { return PyIter_Next(iterator.ptr()); }));
  if (!object && PyErr_Occurred() != nullptr) {
    throw py::error_already_set();
  }
  return object;
}

/// The UTF-8 copies of the next texts of an iterator; none at its end.
std::vector<std::string> nextTexts(const py::object& texts) {
  std::vector<std::string> utf8;
  while (utf8.size() < kTextsAtOnce) {
    const py::object text = next(texts);
    if (!text) {
      break;
    }
    if (!py::isinstance<py::str>(text)) {
      throw py::type_error("texts is an iterable of str, not of " + typeName(text));
    }
    utf8.push_back(searchedUtf8(py::reinterpret_borrow<py::str>(text)));
  }
  return utf8;
}

void checkSignals() {
  if (PyErr_CheckSignals() != 0) {
    throw py::error_already_set();
  }
}

std::vector<FindResult> findWithoutLock(const Index& index, const std::vector<std::string>& texts,
                                        const FindOptions& options, std::size_t threads) {
  Unlocked unlocked;
  return findMany(index, texts, options, threads, [&] { unlocked.withLock(&checkSignals); });
}

py::object iteratorOf(const py::object& texts) {
  if (py::isinstance<py::str>(texts)) {
    throw py::type_error("texts is one str; use find(), or give a list");
  }
  if (!py::isinstance<py::iterable>(texts)) {
    throw py::type_error("texts is an iterable of str, not " + typeName(texts));
  }
  return callPython([&] { return py::object(py::iter(texts)); });
}

py::list findAll(const OpenIndex& self, const Call& call) {
  const py::object rest = iteratorOf(call.get("texts", py::none()));
  const py::object threads = call.get("threads", py::none());
  const FindOptions options = findOptions(call.options(), "find_many");
  const std::size_t threadCount = threads.is_none()
                                      ? std::max(std::thread::hardware_concurrency(), 1U)
                                      : count(threads, "threads", 1);
  py::list results;
  for (auto some = nextTexts(rest); !some.empty(); some = nextTexts(rest)) {
    for (auto& result : findWithoutLock(self.index(), some, options, threadCount)) {
      results.append(py::cast(std::move(result)));
    }
  }
  return results;
}

Index::QueryResult query(const OpenIndex& self, const Call& call) {
  const std::string utf8 = searchedUtf8(call.text("text"));
  const Unlocked unlocked;
  return self.index().query(utf8);
}

Index::SearchResult search(const OpenIndex& self, const Call& call) {
  constexpr std::uint64_t kTooMuch = 1000;
  const py::object maxDistance = call.get("max_distance", py::int_(kMaxDistance));
  const auto distance = std::min(count(maxDistance, "max_distance"), kTooMuch);
  const std::string utf8 = storedUtf8(call.text("word"));
  const Unlocked unlocked;
  return self.index().search(utf8, static_cast<std::int64_t>(distance));
}

FindExplanation explain(const OpenIndex& self, const Call& call) {
  const FindOptions options = findOptions(call.options(), "explain");
  const std::string textBytes = searchedUtf8(call.text("text"));
  const std::string valueBytes = valueUtf8(call.text("value"));
  const Unlocked unlocked;
  FindExplanation explanation = self.index().explain(textBytes, valueBytes, options);
  CodePoints(textBytes).convert(explanation);
  return explanation;
}

QueryExplanation explainQuery(const OpenIndex& self, const Call& call) {
  const std::string textBytes = searchedUtf8(call.text("text"));
  const std::string valueBytes = valueUtf8(call.text("value"));
  const Unlocked unlocked;
  return self.index().explainQuery(textBytes, valueBytes);
}

void verify(const OpenIndex& self) {
  const Unlocked unlocked;
  self.index().verify();
}

void defineOpen(py::class_<OpenIndex>& type) {
  const Index::Options options;
  const std::string signature = "open(path, *, copy=False, mode='words', max_query_words=" +
                                std::to_string(options.maxQueryWords) +
                                ", max_word_units=" + std::to_string(options.maxWordUnits) + ")";
  type.def_static("open", &open, py::arg("path"), py::kw_only(), py::arg("copy") = false,
                  py::arg("mode") = "words", py::arg("max_query_words") = options.maxQueryWords,
                  py::arg("max_word_units") = options.maxWordUnits,
                  documented(signature, kOpenDoc).c_str());
}

void defineFind(py::class_<OpenIndex>& type) {
  const std::string options = findSignature();
  type.def("find", method({"find", {"text"}, 1, true}, &find),
           documented("find($self, text, *, " + options + ")", kFindDoc).c_str());
  type.def("find_many", method({"find_many", {"texts", "threads"}, 1, true}, &findAll),
           documented("find_many($self, texts, threads=None, *, " + options + ")", kFindManyDoc)
               .c_str());
  type.def("explain", method({"explain", {"text", "value"}, 2, true}, &explain),
           documented("explain($self, text, value, *, " + options + ")", kExplainDoc).c_str());
}

void defineQuery(py::class_<OpenIndex>& type) {
  type.def("query", method({"query", {"text"}, 1}, &query),
           documented("query($self, text)", kQueryDoc).c_str());
  const std::string searchSignature =
      "search($self, word, max_distance=" + std::to_string(kMaxDistance) + ")";
  type.def("search", method({"search", {"word", "max_distance"}, 1}, &search),
           documented(searchSignature, kSearchDoc).c_str());
  type.def("explain_query", method({"explain_query", {"text", "value"}, 2}, &explainQuery),
           documented("explain_query($self, text, value)", kExplainQueryDoc).c_str());
}

}  // namespace

void bindIndex(py::module_& module) {
  // Without a signature, which help() would show as if an index could be made so.
  py::class_<OpenIndex> type(module, "Index", py::is_final(),
                             Construction<OpenIndex>::refused(kNoConstructor), kIndexDoc);
  defineOpen(type);
  defineFind(type);
  defineQuery(type);
  type.def(
      "info", [](const OpenIndex& self) { return named(self.index().info()); },
      documented("info($self)", "What the index holds: IndexInfo.").c_str());
  type.def("verify", &verify, documented("verify($self)", kVerifyDoc).c_str());
  type.def_property_readonly(
      "path", [](const OpenIndex& self) { return pathText(self.source().path); },
      "The absolute path that was opened; os.fsencode() gives its bytes.");
  type.def("__repr__", &shownIndex);
  definePickle(type, &pickled, &unpickled);
}

}  // namespace wordcatcher::python
