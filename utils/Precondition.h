/// @file
/// The precondition assertion: a bad argument stops the process, in every build.
///
/// Unlike `assert` it ignores NDEBUG, both the library's and the program's: a check that is inlined into an
/// optimised program must not disappear there. With glibc and on Android the C library's own `assert`
/// makes the report; elsewhere the library prints glibc's line itself.

#pragma once

#include "BasicTypes.h"

namespace mirel {

/// Reports a violated precondition through the C library's assertion facility and ends the process (SIGABRT).
/// With a C library other than glibc's and Android's, it prints glibc's line to standard error itself.
///
/// @param expression  the violated expression, as text
/// @param file        the source file of the check; the report shows its path from the last utils/ on
/// @param line        the line in that file
/// @param function    the signature of the function that made the check
[[noreturn, gnu::cold]] MIREL_API void AssertionFailed(const char* expression, const char* file, int line,
                                                       const char* function);

namespace detail {

/// Returns whether n elements from index i on lie within size elements. It is right for all values: i + n,
/// which could overflow, isn't computed.
constexpr bool IsSubrange(ssize_t i, ssize_t n, ssize_t size) {
  return 0 <= i && 0 <= n && i <= size && n <= size - i;
}

} // namespace detail

} // namespace mirel

/// Stops the process with the given text unless the condition, evaluated once, is true.
#define MIREL_ASSERT_AS(condition, text)                                                                     \
  ((condition) ? static_cast<void>(0)                                                                        \
               : ::mirel::AssertionFailed(text, __FILE__, __LINE__, __PRETTY_FUNCTION__))

/// Stops the process with the expression's own text unless the expression, evaluated once, is true.
#define MIREL_ASSERT(expression) MIREL_ASSERT_AS(expression, #expression)

/// Asserts that n elements from index i on lie within size elements; i + n isn't computed, so it can't
/// overflow. For (ri, rn, r.size()) the text is "0 <= ri && 0 <= rn && ri+rn <= r.size()".
#define MIREL_ASSERT_SUBRANGE(i, n, size)                                                                    \
  MIREL_ASSERT_AS(::mirel::detail::IsSubrange(i, n, size),                                                   \
                  "0 <= " #i " && 0 <= " #n " && " #i "+" #n " <= " #size)
