// Helpers of the tests: strings of either width from literals, and allocations that are counted or fail.

#pragma once

#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <utils/xstring.h>

using mirel::basic_xstring;
using mirel::char16;
using mirel::char8;
using mirel::ssize_t;
using mirel::xvector;

constexpr ssize_t kNpos = -1;

/// Makes a string with a unit for each byte of text.
template <class T> basic_xstring<T> Of(const std::string& text) {
  basic_xstring<T> result;
  for (const char c : text)
    result.push_back(static_cast<T>(static_cast<unsigned char>(c)));
  return result;
}

template <class T> std::basic_string<T> Std(const xvector<T>& v) {
  return v.empty() ? std::basic_string<T>()
                   : std::basic_string<T>(v.begin(), v.end()); // libstdc++ gives null pointers to memcpy
}

/// Expects that an edit leaves a unit for each byte of text.
template <class T> void ExpectText(const xvector<T>& v, const std::string& text, const char* edit) {
  EXPECT_EQ(Std(v), Std(Of<T>(text))) << "after " << edit;
}
#define EXPECT_EDIT(S, EDIT, TEXT)                                                                           \
  do {                                                                                                       \
    EDIT;                                                                                                    \
    ExpectText(S, TEXT, #EDIT);                                                                              \
  } while (false)

/// The code units that a typed test runs for.
using CodeUnits = testing::Types<char8, char16>;

namespace allocation {

inline thread_local long count = 0;            ///< how many allocations this thread has made
inline thread_local long failAfter = -1;       ///< how many more succeed before all fail; -1 if none fails
inline thread_local std::size_t requested = 0; ///< the size of the last one, in bytes

/// Counts the allocations of an action.
template <class F> long Count(const F& action) {
  const long before = count;
  action();
  return count - before;
}

} // namespace allocation
