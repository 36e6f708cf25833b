#ifndef WORDCATCHER_CLI_INPUTLINES_H
#define WORDCATCHER_CLI_INPUTLINES_H

#include <cstddef>
#include <cstdint>
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
  /// Opens a file, or standard input for "-". The input ends early when the descriptor `stop`, if
  /// one is given, can be read from, even if a read is being waited for then.
  explicit InputLines(const std::string& path, std::optional<int> stop = std::nullopt);
  ~InputLines();
  InputLines(const InputLines&) = delete;
  InputLines& operator=(const InputLines&) = delete;

  /// The next line, or nothing at the end.
  std::optional<InputLine> next();

  /// The next line as it stands, UTF-8 or not.
  std::optional<std::string> nextBytes();

  /// Bytes of the lines handed out so far, their ends included.
  std::uint64_t bytesTaken() const noexcept { return _bytesRead - (_buffer.size() - _begin); }

  /// Bytes that are there to be read in a regular file, from where it was opened; nothing for a
  /// pipe or a terminal, of which nobody knows how much will come.
  std::optional<std::uint64_t> bytesInAll() const;

  /// Where the last line stands, for messages: names.txt, line 12
  std::string place() const;

 private:
  std::optional<std::string> nextRaw();
  bool readMore();
  bool waitForMore() const;

  std::string _name;
  int _descriptor;
  bool _owned;
  std::optional<int> _stop;
  std::string _buffer;
  std::size_t _begin = 0;
  std::size_t _lineNumber = 0;
  std::uint64_t _bytesRead = 0;
};

}  // namespace wordcatcher::cli

#endif
