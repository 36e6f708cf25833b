#include "wordcatcher/c/Call.h"

#include <algorithm>
#include <cstddef>
#include <cstring>
#include <iterator>
#include <new>
#include <stdexcept>
#include <string>

#include "wordcatcher/Error.h"
#include "wordcatcher/Version.h"

namespace wordcatcher::c {

namespace {

static_assert(WORDCATCHER_NOT_FOUND == static_cast<int>(ErrorCode::notFound) &&
              WORDCATCHER_NOT_READABLE == static_cast<int>(ErrorCode::notReadable) &&
              WORDCATCHER_NOT_WRITABLE == static_cast<int>(ErrorCode::notWritable) &&
              WORDCATCHER_NOT_AN_INDEX == static_cast<int>(ErrorCode::notAnIndex) &&
              WORDCATCHER_DAMAGED == static_cast<int>(ErrorCode::damaged) &&
              WORDCATCHER_BAD_INPUT == static_cast<int>(ErrorCode::badInput) &&
              WORDCATCHER_TOO_LARGE == static_cast<int>(ErrorCode::tooLarge));

bool isContinuation(char byte) { return (static_cast<unsigned char>(byte) & 0xC0U) == 0x80U; }

/// The longest head of up to `length` bytes that cuts no character apart.
std::string_view headOf(std::string_view text, std::size_t length) {
  while (length > 0 && isContinuation(text[length])) {
    --length;
  }
  return text.substr(0, length);
}

/// The longest tail of up to `length` bytes that cuts no character apart.
std::string_view tailOf(std::string_view text, std::size_t length) {
  std::size_t begin = text.size() - length;
  while (begin < text.size() && isContinuation(text[begin])) {
    ++begin;
  }
  return text.substr(begin);
}

/// A sentence may begin with a path of any length and end with what to do, so what does not fit is
/// left out of its middle.
wordcatcher_code fill(wordcatcher_error* error, wordcatcher_code code, std::string_view sentence) {
  if (error == nullptr) {
    return code;
  }
  constexpr std::string_view kGap = "...";
  constexpr std::size_t kRoom = std::size(wordcatcher_error{}.message) - 1;
  constexpr std::size_t kHalf = (kRoom - kGap.size()) / 2;
  error->code = code;
  char* end = std::begin(error->message);
  const auto append = [&end](std::string_view part) {
    end = std::copy(part.begin(), part.end(), end);
  };
  if (sentence.size() <= kRoom) {
    append(sentence);
  } else {
    append(headOf(sentence, kHalf));
    append(kGap);
    append(tailOf(sentence, kHalf));
  }
  *end = '\0';
  return code;
}

}  // namespace

wordcatcher_code reportSuccess(wordcatcher_error* error) noexcept {
  return fill(error, WORDCATCHER_OK, "");
}

wordcatcher_code report(const std::exception_ptr& exception, wordcatcher_error* error) noexcept {
  try {
    std::rethrow_exception(exception);
  } catch (const Error& failure) {
    return fill(error, static_cast<wordcatcher_code>(failure.code()), failure.what());
  } catch (const std::bad_alloc&) {
    return fill(error, WORDCATCHER_NO_MEMORY, "Memory ran out; free some and try again.");
  } catch (const std::length_error&) {
    return fill(error, WORDCATCHER_TOO_LARGE,
                "This is more than memory can count; give it in smaller parts.");
  } catch (const std::exception& failure) {
    return fill(error, WORDCATCHER_INTERNAL, failure.what());
  } catch (...) {
    return fill(error, WORDCATCHER_INTERNAL, "An unknown failure; please report it.");
  }
}

void require(const void* argument, const char* name) {
  if (argument == nullptr) {
    throw Error(ErrorCode::badInput,
                "The argument \"" + std::string(name) + "\" is NULL; give a pointer to something.");
  }
}

std::string_view textArgument(const char* text, std::size_t length, const char* name) {
  if (length == 0) {
    return {};
  }
  require(text, name);
  return {text, length == WORDCATCHER_NUL ? std::strlen(text) : length};
}

}  // namespace wordcatcher::c

const char* wordcatcher_code_name(wordcatcher_code code) {
  switch (code) {
    case WORDCATCHER_OK:
      return "ok";
    case WORDCATCHER_NOT_FOUND:
      return "not found";
    case WORDCATCHER_NOT_READABLE:
      return "not readable";
    case WORDCATCHER_NOT_WRITABLE:
      return "not writable";
    case WORDCATCHER_NOT_AN_INDEX:
      return "not an index";
    case WORDCATCHER_DAMAGED:
      return "damaged";
    case WORDCATCHER_BAD_INPUT:
      return "bad input";
    case WORDCATCHER_TOO_LARGE:
      return "too large";
    case WORDCATCHER_NO_MEMORY:
      return "no memory";
    case WORDCATCHER_INTERNAL:
      return "internal";
    default:
      return "unknown";
  }
}

const char* wordcatcher_version() { return wordcatcher::versionString; }
