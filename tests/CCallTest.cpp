#include <gtest/gtest.h>

#include <new>
#include <stdexcept>
#include <string>

#include "wordcatcher/Error.h"
#include "wordcatcher/c/Call.h"

namespace wordcatcher::c {
namespace {

/// What a C caller gets of an exception.
template <typename Exception>
wordcatcher_error errorOf(const Exception& exception) {
  wordcatcher_error error = {};
  EXPECT_EQ(call(&error, [&] { throw exception; }), error.code);
  EXPECT_EQ(call(nullptr, [&] { throw exception; }), error.code) << "nobody asks for the sentence";
  return error;
}

TEST(CCall, EveryErrorKeepsItsCodeAndSentence) {
  for (const ErrorCode code :
       {ErrorCode::notFound, ErrorCode::notReadable, ErrorCode::notWritable, ErrorCode::notAnIndex,
        ErrorCode::damaged, ErrorCode::badInput, ErrorCode::tooLarge}) {
    const auto error = errorOf(Error(code, "There is no index at the foot of the rainbow."));
    EXPECT_EQ(error.code, static_cast<wordcatcher_code>(code));
    EXPECT_STREQ(error.message, "There is no index at the foot of the rainbow.");
    EXPECT_STRNE(wordcatcher_code_name(error.code), "unknown");
  }
}

TEST(CCall, NothingElseThatIsThrownGetsOut) {
  EXPECT_EQ(errorOf(std::bad_alloc()).code, WORDCATCHER_NO_MEMORY);
  EXPECT_EQ(errorOf(std::bad_array_new_length()).code, WORDCATCHER_NO_MEMORY);
  EXPECT_EQ(errorOf(std::length_error("vector::reserve")).code, WORDCATCHER_TOO_LARGE);
  const auto internal = errorOf(std::logic_error("the tree has no root"));
  EXPECT_EQ(internal.code, WORDCATCHER_INTERNAL);
  EXPECT_STREQ(internal.message, "the tree has no root");
  EXPECT_EQ(errorOf(42).code, WORDCATCHER_INTERNAL);
}

TEST(CCall, AHandleThatCouldNotBeMadeIsNull) {
  int stale = 0;
  int* handle = &stale;
  EXPECT_EQ(
      make(&handle, "handle", nullptr, []() -> std::unique_ptr<int> { throw std::bad_alloc(); }),
      WORDCATCHER_NO_MEMORY);
  EXPECT_EQ(handle, nullptr);
}

TEST(CCall, ASentenceIsCutOnlyWhereItDoesNotFit) {
  const std::size_t room = sizeof(wordcatcher_error::message) - 1;
  const std::string fits(room, 'a');
  EXPECT_EQ(errorOf(std::runtime_error(fits)).message, fits);
  const std::string longer = std::string(room, 'a') + std::string(room, 'z');
  const std::string cut = errorOf(std::runtime_error(longer)).message;
  EXPECT_EQ(cut, std::string(508, 'a') + "..." + std::string(508, 'z'));
  const std::string noText(2 * room, '\x80');
  EXPECT_STREQ(errorOf(std::runtime_error(noText)).message, "...") << "not UTF-8 at all";
}

}  // namespace
}  // namespace wordcatcher::c
