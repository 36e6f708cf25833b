#include <filesystem>
#include <optional>
#include <system_error>
#include <utility>

#include "python/Bindings.h"
#include "python/Call.h"
#include "python/Construction.h"
#include "python/Lock.h"
#include "python/Names.h"
#include "python/Text.h"
#include "wordcatcher/matcher/IndexBuilder.h"

namespace wordcatcher::python {

namespace {

constexpr const char* kBuilderDoc = R"(Builds an index of phrases: one file.

    with wordcatcher.IndexBuilder("names.wci") as builder:
        builder.add("Trinidad and Tobago", "Trinidad and Tobago{ TT }")

path    The file: str, bytes or os.PathLike. Nothing is touched before commit().
mode    How phrases are stored and found: "words" (by their words, each within an edit distance),
        "text" (as one string, within an edit distance), "phonetic" (by how their words sound).
tables  Where to write the three table files of a classic index as well: a directory, or else a
        prefix of their names.

The end of a with block commits what was added; an exception that leaves the block writes nothing,
and the file stays as it was. After either, and after commit(), the builder is closed.

Memory: the distinct words, 8 bytes for each phrase under a word, the distinct data strings. One
thread at a time: a call beside a commit() that still runs finds the builder closed.)";

constexpr const char* kAddDoc = R"(Adds one phrase with its data string.

data is what find() and query() give back: the phrase itself when nothing is given. With None the
phrase's words are found by search(), and the phrase is not. Begin a data string with the phrase,
and put further fields after "{ ": so queries can judge the phrase's length.

The same phrase and data added again change nothing but phrase_count. Raises Error: bad_input for
strings with lone surrogates or U+0000, too_large.)";

constexpr const char* kCommitDoc = R"(Writes the index and closes the builder; returns its bytes.

The file is replaced in one step: whoever opens it sees the old index or the new one, whole. Raises
Error (not_writable, too_large) when that fails: the file is then as it was, and the builder as
before the call, so that it may be tried again. Other Python threads run meanwhile.)";

class Builder {
 public:
  Builder(std::string path, const IndexBuilder::Options& options)
      : _path(std::move(path)), _builder(std::in_place, _path, options) {}

  void add(std::string_view phrase, std::optional<std::string_view> data) {
    open().add(phrase, data);
    _phrases = _builder->phraseCount();
    _words = _builder->wordCount();
  }

  /// The builder is out of reach while it commits without Python's lock: other threads find it
  /// closed.
  std::uint64_t commit() {
    IndexBuilder builder = std::move(open());
    _builder.reset();
    try {
      const Unlocked unlocked;
      return builder.commit();
    } catch (const std::exception&) {
      _builder = std::move(builder);
      throw;
    }
  }

  void drop() { _builder.reset(); }

  bool isOpen() const { return _builder.has_value(); }
  const std::string& path() const { return _path; }
  std::uint64_t phraseCount() const { return _phrases; }
  std::uint64_t wordCount() const { return _words; }

 private:
  IndexBuilder& open() {
    if (!_builder) {
      throw py::value_error("The builder is closed; make another one.");
    }
    return *_builder;
  }

  std::string _path;
  std::optional<IndexBuilder> _builder;
  std::uint64_t _phrases = 0;
  std::uint64_t _words = 0;
};

/// Table files go into a directory, also when its path ends without a slash, as os.PathLike's do.
std::string tablesPrefix(const py::object& tables) {
  std::string prefix = pathBytes(tables);
  std::error_code noDirectory;
  const bool isDirectory = std::filesystem::is_directory(prefix, noDirectory);
  return isDirectory && !prefix.ends_with('/') ? prefix + '/' : prefix;
}

py::object makeBuilder(const py::object& path, const std::string& mode, const py::object& tables) {
  IndexBuilder::Options options;
  options.mode = modeNamed(mode);
  if (!tables.is_none()) {
    options.tables = tablesPrefix(tables);
  }
  return py::cast(Builder(pathBytes(path), options));
}

void add(Builder& builder, const Call& call) {
  const std::string bytes = storedUtf8(call.text("phrase"));
  const py::object data = call.get("data", py::ellipsis());
  if (data.is(py::ellipsis())) {
    builder.add(bytes, bytes);
  } else if (data.is_none()) {
    builder.add(bytes, std::nullopt);
  } else if (py::isinstance<py::str>(data)) {
    builder.add(bytes, storedUtf8(data));
  } else {
    throw py::type_error("data is a str or None, not " + typeName(data));
  }
}

void leave(Builder& builder, const py::object& type, const py::object&, const py::object&) {
  if (!type.is_none()) {
    builder.drop();
  } else if (builder.isOpen()) {
    builder.commit();
  }
}

std::string shown(const Builder& builder) {
  return "<wordcatcher.IndexBuilder " + std::string(py::repr(pathText(builder.path()))) + ", " +
         std::to_string(builder.phraseCount()) +
         (builder.phraseCount() == 1 ? " phrase" : " phrases") +
         (builder.isOpen() ? ">" : ", closed>");
}

}  // namespace

void bindBuilder(py::module_& module) {
  const py::cpp_function make(&makeBuilder, py::name("wordcatcher.IndexBuilder"), py::arg("path"),
                              py::arg("mode") = "words", py::arg("tables") = py::none());
  py::class_<Builder>(
      module, "IndexBuilder", py::is_final(), Construction<Builder>::by(make),
      documented("IndexBuilder(path, mode='words', tables=None)", kBuilderDoc).c_str())
      .def("add", method({"add", {"phrase", "data"}, 1}, &add),
           documented("add($self, phrase, data=...)", kAddDoc).c_str())
      .def("commit", &Builder::commit, documented("commit($self)", kCommitDoc).c_str())
      .def_property_readonly("phrase_count", &Builder::phraseCount,
                             "Phrases added, each time that one was added.")
      .def_property_readonly("word_count", &Builder::wordCount,
                             "Distinct stored words (whole texts, codes).")
      .def(
          "__enter__", [](const py::object& self) { return self; },
          documented("__enter__($self)", "The builder itself.").c_str())
      .def("__exit__", &leave, py::arg("exc_type"), py::arg("exc_value"), py::arg("traceback"),
           documented("__exit__($self, exc_type, exc_value, traceback)",
                      "Commits, or drops what was added when an exception leaves the block.")
               .c_str())
      .def("__repr__", &shown);
}

}  // namespace wordcatcher::python
