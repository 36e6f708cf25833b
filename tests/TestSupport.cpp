#include "TestSupport.h"

#include <gtest/gtest.h>

#include <array>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <iterator>
#include <stdexcept>

namespace wordcatcher::testing {

namespace {

class SilentEnvironment final : public ::testing::Environment {
 public:
  void SetUp() override { setLogSink(silentLogSink()); }
};

const ::testing::Environment* const kSilence =
    ::testing::AddGlobalTestEnvironment(new SilentEnvironment);

}  // namespace

TemporaryDirectory::TemporaryDirectory() {
  std::string pattern = ::testing::TempDir() + "/wordcatcher-XXXXXX";
  if (mkdtemp(pattern.data()) == nullptr) {
    throw std::runtime_error("cannot make a temporary directory at " + pattern);
  }
  _path = pattern + "/";
}

TemporaryDirectory::~TemporaryDirectory() {
  std::error_code ignored;
  std::filesystem::remove_all(_path, ignored);
}

std::string readFile(const std::string& path) {
  std::ifstream stream(path, std::ios::binary);
  return {std::istreambuf_iterator<char>(stream), std::istreambuf_iterator<char>()};
}

void writeFile(const std::string& path, std::string_view bytes) {
  std::ofstream stream(path, std::ios::binary | std::ios::trunc);
  stream.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
}

std::string outputOf(const std::string& command) {
  FILE* pipe = popen(command.c_str(), "r");
  std::string output;
  std::array<char, 4096> chunk{};
  for (std::size_t got = 0; (got = fread(chunk.data(), 1, chunk.size(), pipe)) > 0;) {
    output.append(chunk.data(), got);
  }
  EXPECT_EQ(pclose(pipe), 0) << command;
  return output;
}

}  // namespace wordcatcher::testing
