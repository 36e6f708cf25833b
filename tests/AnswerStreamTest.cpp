// Texts answered by many threads at once; to be run under ThreadSanitizer as well.

#include "cli/AnswerStream.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <pty.h>
#include <unistd.h>

#include <array>
#include <atomic>
#include <chrono>
#include <csignal>
#include <string>
#include <thread>
#include <vector>

#include "TestSupport.h"
#include "wordcatcher/matcher/Index.h"
#include "wordcatcher/matcher/IndexBuilder.h"

namespace wordcatcher::cli {
namespace {

using namespace std::chrono_literals;

constexpr unsigned kThreads = 8;

/// While it lives, a standard stream is another file.
class Redirected {
 public:
  Redirected(int stream, int file) : _stream(stream), _kept(dup(stream)) {
    static_cast<void>(fflush(nullptr));
    dup2(file, stream);
  }
  ~Redirected() {
    static_cast<void>(fflush(nullptr));
    dup2(_kept, _stream);
    close(_kept);
  }
  Redirected(const Redirected&) = delete;
  Redirected& operator=(const Redirected&) = delete;

 private:
  int _stream;
  int _kept;
};

/// Both ends of a pipe or of a terminal; each may be closed before.
class Channel {
 public:
  enum class Kind { pipe, terminal };

  explicit Channel(Kind kind) {
    if (kind == Kind::pipe) {
      EXPECT_EQ(pipe2(_ends.data(), O_CLOEXEC), 0);
    } else {
      EXPECT_EQ(openpty(_ends.data(), &_ends[1], nullptr, nullptr, nullptr), 0);
    }
  }
  ~Channel() {
    closeReader();
    closeWriter();
  }
  Channel(const Channel&) = delete;
  Channel& operator=(const Channel&) = delete;

  int reader() const { return _ends[0]; }
  int writer() const { return _ends[1]; }
  void closeReader() { closeEnd(_ends[0]); }
  void closeWriter() { closeEnd(_ends[1]); }

 private:
  static void closeEnd(int& end) {
    if (end >= 0) {
      close(end);
      end = -1;
    }
  }

  std::array<int, 2> _ends{-1, -1};
};

/// All that comes until the other end is closed. `isThere` becomes true once `awaited` has come.
std::string readAll(int descriptor, const std::string& awaited, std::atomic<bool>& isThere) {
  std::string all;
  std::array<char, 4096> block{};
  // The last one to close a terminal makes reading from it fail.
  for (ssize_t count = 0; (count = read(descriptor, block.data(), block.size())) > 0;) {
    all.append(block.data(), static_cast<std::size_t>(count));
    isThere = all.find(awaited) != std::string::npos;
  }
  return all;
}

/// What is written to standard output meanwhile.
template <typename Work>
std::string printedBy(const Work& work) {
  const testing::TemporaryDirectory directory;
  const std::string path = directory.file("printed");
  const int file = open(path.c_str(), O_WRONLY | O_CREAT | O_CLOEXEC, 0600);
  {
    const Redirected output(STDOUT_FILENO, file);
    work();
  }
  close(file);
  return testing::readFile(path);
}

std::vector<std::string> numbered(std::size_t count) {
  std::vector<std::string> texts;
  texts.reserve(count);
  for (std::size_t i = 0; i < count; ++i) {
    texts.push_back("text " + std::to_string(i));
  }
  return texts;
}

std::string joined(const std::vector<std::string>& texts, std::size_t count) {
  std::string all;
  for (std::size_t i = 0; i < count; ++i) {
    all += texts[i] + '\n';
  }
  return all;
}

/// Takes the longer the nearer the number's last digit is to 0, so that answers are ready out of
/// order.
TextAnswer repeated(const std::string& text) {
  std::this_thread::sleep_for(200us * ('9' - text.back()));
  return {text + '\n', "", true};
}

TEST(AnswerStreamTest, TextsAreAnsweredInTheirOrder) {
  const auto texts = numbered(400);
  const auto printed =
      printedBy([&] { EXPECT_EQ(answerInOrder(texts, repeated, kThreads), kMatched); });
  EXPECT_EQ(printed, joined(texts, texts.size()));
}

TEST(AnswerStreamTest, LinesAreAnsweredInTheirOrderWhileTheyCome) {
  const auto texts = numbered(400);
  Channel input(Channel::Kind::pipe);
  const Redirected standardInput(STDIN_FILENO, input.reader());
  std::thread sender([&] {
    for (const auto& text : texts) {
      const std::string line = text + '\n';
      EXPECT_EQ(write(input.writer(), line.data(), line.size()), static_cast<ssize_t>(line.size()));
    }
    input.closeWriter();
  });
  const auto printed =
      printedBy([&] { EXPECT_EQ(answerInOrder({}, repeated, kThreads), kMatched); });
  sender.join();
  EXPECT_EQ(printed, joined(texts, texts.size()));
}

TEST(AnswerStreamTest, AFailureComesAfterTheAnswersBeforeIt) {
  const auto texts = numbered(400);
  const auto printed = printedBy([&] {
    const auto answer = [&](const std::string& text) {
      if (text == texts[123] || text == texts[125]) {
        throw Failure(text);
      }
      return repeated(text);
    };
    try {
      answerInOrder(texts, answer, kThreads);
      ADD_FAILURE() << "nothing failed";
    } catch (const Failure& failure) {
      EXPECT_EQ(failure.what(), texts[123]);
    }
  });
  EXPECT_EQ(printed, joined(texts, 123));
}

TEST(AnswerStreamTest, ItEndsWhenTheReaderOfTheAnswersGoesThoughMoreInputMayCome) {
  struct sigaction ignore {};
  struct sigaction before {};
  ignore.sa_handler = SIG_IGN;
  sigaction(SIGPIPE, &ignore, &before);
  Channel input(Channel::Kind::pipe);
  Channel output(Channel::Kind::pipe);
  output.closeReader();
  EXPECT_EQ(write(input.writer(), "text 9\n", 7), 7);
  {
    const Redirected standardInput(STDIN_FILENO, input.reader());
    const Redirected standardOutput(STDOUT_FILENO, output.writer());
    EXPECT_EQ(answerInOrder({}, repeated, kThreads), kMatched);
  }
  sigaction(SIGPIPE, &before, nullptr);
}

TEST(AnswerStreamTest, ASlowTextIsTimedOnTheTerminal) {
  constexpr auto kPatience = 60s;
  const std::string note = "\r\x1b[KAnswering ... ";
  Channel terminal(Channel::Kind::terminal);
  std::string shown;
  std::atomic<bool> isTimed = false;
  std::thread screen([&] { shown = readAll(terminal.reader(), note, isTimed); });
  const auto printed = printedBy([&] {
    const Redirected standardError(STDERR_FILENO, terminal.writer());
    terminal.closeWriter();
    const auto answer = [&](const std::string& text) {
      // As slow as it takes for the note to come, which a busy machine may show late.
      const auto end = std::chrono::steady_clock::now() + kPatience;
      while (text == "slow" && !isTimed && std::chrono::steady_clock::now() < end) {
        std::this_thread::sleep_for(1ms);
      }
      return TextAnswer{text + '\n', text == "cut" ? "It was cut." : "", false};
    };
    EXPECT_EQ(answerInOrder({"slow", "quick", "cut", "slow"}, answer, kThreads), kNoMatch);
  });
  screen.join();
  EXPECT_EQ(printed, "slow\nquick\ncut\nslow\n");
  EXPECT_TRUE(shown.starts_with(note)) << shown;
  EXPECT_NE(shown.find("\r\x1b[KIt was cut.\r\n"), std::string::npos) << shown;
}

TEST(AnswerStreamTest, AllThreadsAskOneIndex) {
  const testing::TemporaryDirectory directory;
  const std::string path = directory.file("names.wci");
  IndexBuilder builder(path);
  for (const auto* name : {"Trinidad and Tobago", "Papua New Guinea", "New Zealand"}) {
    builder.add(name, name);
  }
  builder.commit();
  const Index index = Index::open(path);
  const auto answer = [&](const std::string& text) {
    const auto found = index.find(text).matches;
    return TextAnswer{found.front().value + '\n', "", true};
  };
  std::vector<std::string> texts;
  std::string expected;
  for (int i = 0; i < 100; ++i) {
    texts.emplace_back(i % 2 == 0 ? "fly to new zeeland" : "trinidat and tobbago");
    expected += i % 2 == 0 ? "New Zealand\n" : "Trinidad and Tobago\n";
  }
  EXPECT_EQ(printedBy([&] { answerInOrder(texts, answer, kThreads); }), expected);
}

}  // namespace
}  // namespace wordcatcher::cli
