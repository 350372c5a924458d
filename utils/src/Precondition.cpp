// The facility behind `assert` is declared only while NDEBUG isn't defined.
#undef NDEBUG
#include <assert.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include <utils/Precondition.h>

namespace mirel {

namespace {

/// Cuts off what precedes the last directory utils/. For inline code, __FILE__ is the path by which the
/// program found the header.
const char* IncludeName(const char* file) {
  while (const char* const folder = std::strstr(file, "/utils/"))
    file = folder + 1;
  return file;
}

} // namespace

void AssertionFailed(const char* expression, const char* file, int line, const char* function) {
#if defined(__ANDROID__)
  __assert2(IncludeName(file), line, function, expression);
#elif defined(__GLIBC__) && !defined(MIREL_NO_ASSERT_FACILITY)
  __assert_fail(expression, IncludeName(file), static_cast<unsigned>(line), function);
#else
  // The text is glibc's. Other C libraries have other facilities, or none.
#ifdef __linux__
  std::fprintf(stderr, "%s: ", program_invocation_short_name);
#endif
  std::fprintf(stderr, "%s:%d: %s: Assertion `%s' failed.\n", IncludeName(file), line, function, expression);
  std::abort();
#endif
}

} // namespace mirel
