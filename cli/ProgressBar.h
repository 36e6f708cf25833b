#ifndef WORDCATCHER_CLI_PROGRESSBAR_H
#define WORDCATCHER_CLI_PROGRESSBAR_H

#include <chrono>
#include <cstddef>
#include <optional>
#include <string>

namespace wordcatcher::cli {

/// A line on standard error that shows how far a piece of work has come. It redraws itself a few
/// times a second and wipes itself away when it is destroyed. Nothing at all is shown when standard
/// error is no terminal.
class ProgressBar {
 public:
  /// `total` is what show() will come to; without it only a count is shown.
  explicit ProgressBar(std::optional<std::size_t> total = std::nullopt);
  ~ProgressBar();
  ProgressBar(const ProgressBar&) = delete;
  ProgressBar& operator=(const ProgressBar&) = delete;

  /// Cheap enough to be called at every step.
  void show(std::size_t done);

  /// Replaces the bar by a word on what is going on, at once.
  void say(const std::string& text);

 private:
  void draw(const std::string& line);

  std::optional<std::size_t> _total;
  bool _terminal;
  bool _drawn = false;
  std::chrono::steady_clock::time_point _next;
};

}  // namespace wordcatcher::cli

#endif
