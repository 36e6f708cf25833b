#ifndef WORDCATCHER_C_CALL_H
#define WORDCATCHER_C_CALL_H

#include <exception>
#include <memory>
#include <string_view>
#include <utility>

#include "wordcatcher/wordcatcher.h"

namespace wordcatcher::c {

/// The code of an exception, and its sentence in `error`, which may be null. Never throws.
wordcatcher_code report(const std::exception_ptr& exception, wordcatcher_error* error) noexcept;

wordcatcher_code reportSuccess(wordcatcher_error* error) noexcept;

/// Throws Error (badInput) when a required argument is null.
void require(const void* argument, const char* name);

/// A string argument. Throws Error (badInput) for a null that is not the empty string.
std::string_view textArgument(const char* text, std::size_t length, const char* name);

/// Runs an action and turns whatever it throws into a code.
template <typename Action>
wordcatcher_code call(wordcatcher_error* error, const Action& action) noexcept {
  try {
    action();
    return reportSuccess(error);
  } catch (...) {
    return report(std::current_exception(), error);
  }
}

/// The same for an action that makes a std::unique_ptr of what it hands out, null after a failure.
template <typename Handle, typename Action>
wordcatcher_code make(Handle** result, const char* name, wordcatcher_error* error,
                      const Action& action) noexcept {
  if (result == nullptr) {
    return call(error, [name] { require(nullptr, name); });
  }
  *result = nullptr;
  return call(error, [&] { *result = action().release(); });
}

}  // namespace wordcatcher::c

#endif
