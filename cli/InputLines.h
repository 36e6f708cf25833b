#ifndef WORDCATCHER_CLI_INPUTLINES_H
#define WORDCATCHER_CLI_INPUTLINES_H

#include <cstddef>
#include <optional>
#include <string>

namespace wordcatcher::cli {

/// One line of input, in both forms.
struct InputLine {
  std::string utf8;
  std::u16string text;
};

/// Reads a file or standard input line by line and hands a line out as soon as it is there, so that
/// it serves a pipeline. Lines end with LF or CR LF; the last one may lack its end; a byte-order
/// mark at the start of the file is skipped.
///
/// A file that cannot be opened or read, and a line that is not UTF-8, is a Failure that names the
/// file and the line.
class InputLines {
 public:
  /// Opens a file, or standard input for "-".
  explicit InputLines(const std::string& path);
  ~InputLines();
  InputLines(const InputLines&) = delete;
  InputLines& operator=(const InputLines&) = delete;

  /// The next line, or nothing at the end.
  std::optional<InputLine> next();

  /// Where the last line stands, for messages: names.txt, line 12
  std::string place() const;

 private:
  std::optional<std::string> nextRaw();
  bool readMore();

  std::string _name;
  int _descriptor;
  bool _owned;
  std::string _buffer;
  std::size_t _begin = 0;
  std::size_t _lineNumber = 0;
};

}  // namespace wordcatcher::cli

#endif
