#ifndef WORDCATCHER_CLI_PROGRESSBAR_H
#define WORDCATCHER_CLI_PROGRESSBAR_H

#include <chrono>
#include <cstdint>
#include <optional>
#include <string>

namespace wordcatcher::cli {

/// A line on standard error that shows how far a piece of work has come. It redraws itself a few
/// times a second at most, when show() is called, and wipes itself away when it is destroyed.
/// Nothing at all is shown when standard error is no terminal.
class ProgressBar {
 public:
  struct Options {
    std::optional<std::uint64_t> total;  ///< what show() will come to; none: only a count is shown
    const char* unit = "phrases";
  };

  ProgressBar() : ProgressBar(Options{}) {}
  explicit ProgressBar(const Options& options);
  ~ProgressBar();
  ProgressBar(const ProgressBar&) = delete;
  ProgressBar& operator=(const ProgressBar&) = delete;

  /// Cheap enough to be called at every step.
  void show(std::uint64_t done);

  /// Replaces the bar by a word on what is going on, at once.
  void say(const std::string& text);

  /// Takes away what is shown.
  void wipe();

  /// What show() draws: a bar, or the count of what was read when nobody knows the total.
  static std::string line(std::uint64_t done, std::optional<std::uint64_t> total, const char* unit);

  /// What begins a line on standard error that may meet a bar there: it wipes the bar away.
  static const char* lineStart();

 private:
  void draw(const std::string& line);

  Options _options;
  bool _terminal;
  bool _drawn = false;
  std::chrono::steady_clock::time_point _next;
};

}  // namespace wordcatcher::cli

#endif
