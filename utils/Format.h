/// @file
/// Formatters of strings: for the fmt library where it is installed, and for `std::format` where the standard
/// library has it.
///
/// Include this header before the first string is formatted. A string is formatted like a `std::string_view`,
/// with the same options; a string16 is converted to UTF-8, with U+FFFD in place of malformed text.

#pragma once

#include <string_view>
#if __has_include(<version>)
#include <version>
#endif
#if __has_include(<fmt/format.h>)
#define MIREL_HAS_FMT
#include <fmt/format.h>
#endif
#if defined(__cpp_lib_format)
#include <format>
#endif

#include "Std.h"
#include "Utf.h"

namespace mirel::detail {

/// Formats a string: passes a view of it, or of its copy in UTF-8, to the base class, the formatter of
/// std::string_view.
template <class T, class ViewFormatter> struct StringFormatter : ViewFormatter {
  template <class Context> auto format(const basic_xstring<T>& text, Context& context) const {
    ViewFormatter view = *this; // a copy, since format() isn't const in early standard libraries
    if constexpr (sizeof(T) == 1) {
      return view.format(View(text), context);
    } else {
      string8 utf8;
      Utf8FromUtf16Lossy(utf8, text);
      return view.format(View(utf8), context);
    }
  }
};

} // namespace mirel::detail

/// @cond
// Full specialisations: a partial one would be ambiguous with fmt's own for ranges.
#if defined(MIREL_HAS_FMT)
namespace mirel::detail {
template <class T> using FmtFormatter = StringFormatter<T, fmt::formatter<std::string_view>>;
}
template <> struct fmt::formatter<mirel::string8> : mirel::detail::FmtFormatter<mirel::char8> {};
template <> struct fmt::formatter<mirel::string16> : mirel::detail::FmtFormatter<mirel::char16> {};
template <> struct fmt::formatter<mirel::mstring8> : mirel::detail::FmtFormatter<mirel::char8> {};
template <> struct fmt::formatter<mirel::mstring16> : mirel::detail::FmtFormatter<mirel::char16> {};
#undef MIREL_HAS_FMT
#endif
#if defined(__cpp_lib_format)
namespace mirel::detail {
template <class T> using StdFormatter = StringFormatter<T, std::formatter<std::string_view>>;
}
template <> struct std::formatter<mirel::string8> : mirel::detail::StdFormatter<mirel::char8> {};
template <> struct std::formatter<mirel::string16> : mirel::detail::StdFormatter<mirel::char16> {};
template <> struct std::formatter<mirel::mstring8> : mirel::detail::StdFormatter<mirel::char8> {};
template <> struct std::formatter<mirel::mstring16> : mirel::detail::StdFormatter<mirel::char16> {};
#endif
/// @endcond
