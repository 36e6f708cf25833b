// Stands in for the C library's system log in the program that it is linked into, and prints each
// line to standard output behind its priority.

#include <cstdarg>
#include <cstdio>

namespace {

void record(int priority, const char* format, std::va_list arguments) {
  static_cast<void>(std::printf("%d ", priority));
  static_cast<void>(std::vprintf(format, arguments));
  static_cast<void>(std::putchar('\n'));
}

}  // namespace

// <syslog.h> stays out: with _FORTIFY_SOURCE it defines syslog() itself, by way of the second of
// these.
extern "C" {

__attribute__((visibility("default"), format(printf, 2, 3))) void syslog(int priority,
                                                                         const char* format, ...) {
  std::va_list arguments;
  va_start(arguments, format);
  record(priority, format, arguments);
  va_end(arguments);
}

__attribute__((visibility("default"), format(printf, 3, 4))) void __syslog_chk(int priority,
                                                                               int /*flag*/,
                                                                               const char* format,
                                                                               ...) {
  std::va_list arguments;
  va_start(arguments, format);
  record(priority, format, arguments);
  va_end(arguments);
}

}  // extern "C"
