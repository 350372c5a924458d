/// @file
/// The strings at home in the standard library: operators, hashes, views, conversions, and streams.
///
/// All of it stands on what the strings have, and a program that doesn't include this header pays nothing.
/// Formatted output is in utils/Format.h.

#pragma once

#include <cstddef>
#include <cstring>
#include <iosfwd>
#include <string>
#include <string_view>
#include <type_traits>

#include "MovableString.h"
#include "Storage.h"
#include "xstring.h"

namespace mirel {

namespace detail {

/// Takes what a std::string_view sees, and nothing that is a null-terminated string already.
template <class T, class V>
using IfView = std::enable_if_t<sizeof(T) == 1 && std::is_convertible_v<const V&, std::string_view> &&
                                    !std::is_convertible_v<const V&, const T*> && !kIsInteger<V>,
                                int>;

/// The code units of whatever may stand beside a string in a comparison or a look-up.
template <class T> struct TextRef {
  TextRef(const xvector<T>& s) : p(s.data()), n(s.size()) {}
  TextRef(const T* s) : p(s), n((MIREL_ASSERT(s != nullptr), GetStringLength(s))) {}
  TextRef(std::nullptr_t) = delete;
  template <class X, IfIntegers<X> = 0> TextRef(X) = delete; // a literal 0 would be a null pointer
  template <class V, IfView<T, V> = 0> TextRef(const V& v) {
    const std::string_view view = v;
    p = view.data();
    n = static_cast<ssize_t>(view.size());
  }

  const T* p;
  ssize_t n;
};

/// The operand that no type is deduced from.
template <class T> struct NotDeduced { typedef TextRef<T> type; };
template <class T> using Operand = typename NotDeduced<T>::type;

/// The code unit of text in any form.
template <class A>
using UnitOf = std::conditional_t<std::is_convertible_v<const A&, TextRef<char16>>, char16, char8>;

/// Takes text of one width.
template <class T, class... A>
using IfTexts = std::enable_if_t<(std::is_convertible_v<const A&, TextRef<T>> && ...), int>;

template <class T> bool IsSameText(TextRef<T> a, TextRef<T> b) {
  return a.n == b.n && IsEqual(a.p, a.p + a.n, b.p);
}
template <class T> int CompareText(TextRef<T> a, TextRef<T> b) {
  return LexicographicalCompareX(a.p, a.p + a.n, b.p, b.p + b.n);
}

/// Of the bytes of the units: any object may be read as bytes.
template <class T> std::size_t HashText(TextRef<T> text) {
  return std::hash<std::string_view>()(
      {reinterpret_cast<const char*>(text.p), static_cast<std::size_t>(text.n) * sizeof(T)});
}

} // namespace detail

/// @name Comparison
/// Of strings, vectors and sums of one width with each other, and with an Operand on either side: a
/// null-terminated string or, in 8 bits, whatever converts to `std::string_view`. Code units compare as
/// unsigned values; of a string and its proper prefix, the prefix is first. A literal null pointer or 0
/// doesn't compile. Nothing is allocated; the cost is at worst linear in the shorter length.
/// @pre "s != nullptr" of a null-terminated string
///
/// @snippet examples/reference.cpp operators
/// @{

/// Same code units, as _Eq().
template <class T> bool operator==(const xvector<T>& a, const xvector<T>& b) { return a._Eq(b); }
/// Same code units.
template <class T> bool operator==(const xvector<T>& a, detail::Operand<T> b) {
  return detail::IsSameText<T>(a, b);
}
/// Same code units.
template <class T> bool operator==(detail::Operand<T> a, const xvector<T>& b) {
  return detail::IsSameText<T>(a, b);
}
/// Other code units.
template <class T> bool operator!=(const xvector<T>& a, const xvector<T>& b) { return !(a == b); }
/// Other code units.
template <class T> bool operator!=(const xvector<T>& a, detail::Operand<T> b) { return !(a == b); }
/// Other code units.
template <class T> bool operator!=(detail::Operand<T> a, const xvector<T>& b) { return !(a == b); }
/// Whether a orders before b, as _Lt().
template <class T> bool operator<(const xvector<T>& a, const xvector<T>& b) { return a._Lt(b); }
/// Whether a orders before b.
template <class T> bool operator<(const xvector<T>& a, detail::Operand<T> b) {
  return detail::CompareText<T>(a, b) < 0;
}
/// Whether a orders before b.
template <class T> bool operator<(detail::Operand<T> a, const xvector<T>& b) {
  return detail::CompareText<T>(a, b) < 0;
}
/// Whether a orders after b.
template <class T> bool operator>(const xvector<T>& a, const xvector<T>& b) { return b < a; }
/// Whether a orders after b.
template <class T> bool operator>(const xvector<T>& a, detail::Operand<T> b) { return b < a; }
/// Whether a orders after b.
template <class T> bool operator>(detail::Operand<T> a, const xvector<T>& b) { return b < a; }
/// Whether a orders before b, or is the same.
template <class T> bool operator<=(const xvector<T>& a, const xvector<T>& b) { return !(b < a); }
/// Whether a orders before b, or is the same.
template <class T> bool operator<=(const xvector<T>& a, detail::Operand<T> b) { return !(b < a); }
/// Whether a orders before b, or is the same.
template <class T> bool operator<=(detail::Operand<T> a, const xvector<T>& b) { return !(b < a); }
/// Whether a orders after b, or is the same.
template <class T> bool operator>=(const xvector<T>& a, const xvector<T>& b) { return !(a < b); }
/// Whether a orders after b, or is the same.
template <class T> bool operator>=(const xvector<T>& a, detail::Operand<T> b) { return !(a < b); }
/// Whether a orders after b, or is the same.
template <class T> bool operator>=(detail::Operand<T> a, const xvector<T>& b) { return !(a < b); }

/// @}
/// @name Keys
/// What a map is told to compare and hash by, so that it is searched with whatever the operators compare, and
/// copies nothing: a `std::map` from C++17 on, an unordered one from C++20 on. Pointers are null-terminated
/// strings, two of them too: never addresses.
/// @snippet examples/reference.cpp keys
/// @{

/// The order of the operator `<`.
/// @snippet examples/reference.cpp keys
struct Less {
  typedef void is_transparent; ///< Look-ups take other types than the key's.
  /// Whether a orders before b.
  template <class A, class B, detail::IfTexts<detail::UnitOf<A>, A, B> = 0>
  bool operator()(const A& a, const B& b) const {
    return detail::CompareText<detail::UnitOf<A>>(a, b) < 0;
  }
};

/// The equality of the operator `==`.
/// @snippet examples/reference.cpp keys
struct Equal {
  typedef void is_transparent; ///< Look-ups take other types than the key's.
  /// Whether a and b have the same code units.
  template <class A, class B, detail::IfTexts<detail::UnitOf<A>, A, B> = 0>
  bool operator()(const A& a, const B& b) const {
    return detail::IsSameText<detail::UnitOf<A>>(a, b);
  }
};

/// The hash of a text, whatever holds it; of 8-bit text that of the `std::string_view`. `std::hash` of a
/// string is the same, for the default of unordered containers. Neither is noexcept: GNU's containers then
/// keep the hash with each key, as they do for their own strings.
/// @snippet examples/reference.cpp keys
struct Hash {
  typedef void is_transparent; ///< Look-ups take other types than the key's.
  /// The hash of the code units.
  template <class A, detail::IfTexts<detail::UnitOf<A>, A> = 0> std::size_t operator()(const A& text) const {
    return detail::HashText<detail::UnitOf<A>>(text);
  }
};

/// @}
/// @name Views, and copies to and from standard strings
/// A char16 is no char16_t, and neither may be read through a pointer to the other; so 16-bit text has copies
/// only.
/// @snippet examples/reference.cpp views
/// @{

/// The units of s. The view is valid until the next change of s, c_str() included; of a temporary it doesn't
/// compile.
inline std::string_view View(const xvector<char8>& s) {
  return {s.data(), static_cast<std::size_t>(s.size())};
}
std::string_view View(const xvector<char8>&&) = delete;
/// A copy as a standard string.
inline std::string ToString(const xvector<char8>& s) { return std::string(View(s)); }
/// A copy as a standard string.
inline std::u16string ToU16String(const xvector<char16>& s) {
  std::u16string result(static_cast<std::size_t>(s.size()), u'\0');
  if (!s.empty()) // memcpy may not be given null pointers
    std::memcpy(result.data(), s.data(), result.size() * sizeof(char16));
  return result;
}
/// A copy of what is seen, zeros included. A literal's ends before its first zero.
inline string8 ToString8(std::string_view s) { return string8(s.data(), static_cast<ssize_t>(s.size())); }
#if defined(__cpp_lib_char8_t)
/// A copy of what is seen, as a `u8"..."` literal from C++20 on.
inline string8 ToString8(std::u8string_view s) {
  return string8(reinterpret_cast<const char8*>(s.data()), static_cast<ssize_t>(s.size()));
}
#endif
/// A copy of what is seen, as a `u"..."` literal or a standard string.
string16 ToString16(std::u16string_view s);

/// @}

/// Writes the text to a standard stream, padded to the stream's width as a `std::string_view` is. It takes
/// sums and other vectors of char8 too.
template <class Traits>
std::basic_ostream<char, Traits>& operator<<(std::basic_ostream<char, Traits>& os, const xvector<char8>& s) {
  return os << std::basic_string_view<char, Traits>(s.data(), static_cast<std::size_t>(s.size()));
}

/// Appends what f writes: makes room for up to most units without filling them, calls f(p, most), where p
/// points to the room, and keeps as many units as f returns.
///
///     while (FillFrom(text, 65536, [&](char* p, ssize_t n) { return std::fread(p, 1, size_t(n), file); }) >
///     0)
///       ;
///
/// A run of calls moves each unit a constant number of times on average. If f throws, the contents are as
/// they were; f may not use dst.
/// @pre "0 <= most", then "0 <= filled && filled <= most" of what f returns
/// @return what f returned, as an ssize_t
template <class T, class N, class F, detail::IfIntegers<N> = 0>
ssize_t FillFrom(xvector<T>& dst, N most, F&& f) {
  const ssize_t room = detail::Count(most);
  MIREL_ASSERT_AS(0 <= room, "0 <= most");
  T* const p = detail::Storage::Grow(dst, room);
  const ssize_t filled = detail::Count(f(p, room));
  MIREL_ASSERT_AS(0 <= filled && filled <= room, "0 <= filled && filled <= most");
  detail::Storage::SetSize(dst, dst.size() + filled);
  return filled;
}

inline string16 ToString16(std::u16string_view s) {
  string16 result;
  FillFrom(result, s.size(), [s](char16* p, ssize_t n) {
    if (n != 0) // memcpy may not be given null pointers
      std::memcpy(p, s.data(), static_cast<std::size_t>(n) * sizeof(char16));
    return n;
  });
  return result;
}

} // namespace mirel

/// @cond
// The reference would have no page for them. The hash of a string8 is that of the std::string_view.
template <class T> struct std::hash<mirel::basic_xstring<T>> {
  std::size_t operator()(const mirel::basic_xstring<T>& s) const { return mirel::detail::HashText<T>(s); }
};
template <class T> struct std::hash<mirel::MovableString<T>> : std::hash<mirel::basic_xstring<T>> {};
/// @endcond
