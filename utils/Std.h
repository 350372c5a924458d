/// @file
/// What connects the strings to the standard library: operators, hashes, views, copies, and streams.
///
/// Everything but FillFrom() uses only public members of the strings. A program that doesn't include this
/// header pays nothing for it. Formatted output is in utils/Format.h.

#pragma once

#include <cstddef>
#include <cstring>
#include <iosfwd>
#include <string>
#include <string_view>
#include <type_traits>

#include "Integers.h"
#include "MovableString.h"
#include "Precondition.h"
#include "RangeAlgorithms.h"
#include "Storage.h"
#include "xstring.h"
#include "xvector.h"

namespace mirel {

namespace detail {

/// Matches what converts to a std::string_view, except null-terminated strings and integers.
template <class T, class V>
using IfView = std::enable_if_t<sizeof(T) == 1 && std::is_convertible_v<const V&, std::string_view> &&
                                    !std::is_convertible_v<const V&, const T*> && !kIsInteger<V>,
                                int>;

/// Refers to the code units of an operand: a string, a null-terminated string or a view.
template <class T> struct TextRef {
  TextRef(const xvector<T>& s) : p(s.data()), n(s.size()) {}
  TextRef(const T* s) : p(s), n((MIREL_ASSERT(s != nullptr), GetStringLength(s))) {}
  TextRef(std::nullptr_t) = delete;
  template <class X, IfIntegers<X> = 0> TextRef(X) = delete; // a literal 0 converts to a null pointer
  template <class V, IfView<T, V> = 0> TextRef(const V& v) {
    const std::string_view view = v;
    p = view.data();
    n = static_cast<ssize_t>(view.size());
  }

  const T* p;
  ssize_t n;
};

/// Keeps an operand out of template argument deduction, so that T comes from the other one.
template <class T> struct NotDeduced { typedef TextRef<T> type; };
template <class T> using Operand = typename NotDeduced<T>::type;

/// The type of a text's code units, whatever holds the text.
template <class A>
using UnitOf = std::conditional_t<std::is_convertible_v<const A&, TextRef<char16>>, char16, char8>;

/// Lets a template take part in overload resolution only if all A are texts of code units T.
template <class T, class... A>
using IfTexts = std::enable_if_t<(std::is_convertible_v<const A&, TextRef<T>> && ...), int>;

template <class T> bool IsSameText(TextRef<T> a, TextRef<T> b) {
  return a.n == b.n && IsEqual(a.p, a.p + a.n, b.p);
}
template <class T> int CompareText(TextRef<T> a, TextRef<T> b) {
  return LexicographicalCompareX(a.p, a.p + a.n, b.p, b.p + b.n);
}

/// Hashes the bytes of the units.
template <class T> std::size_t HashText(TextRef<T> text) {
  return std::hash<std::string_view>()(
      {reinterpret_cast<const char*>(text.p), static_cast<std::size_t>(text.n) * sizeof(T)});
}

} // namespace detail

/// @name Comparison
/// Compare strings, vectors and results of `+` of one width with each other, or with an Operand on either
/// side: a null-terminated string or, for 8-bit text, whatever converts to `std::string_view`. Code units
/// compare as unsigned values; a proper prefix of a string orders before it. A literal null pointer or 0
/// doesn't compile. Nothing is allocated. The cost is at worst linear in the shorter length, plus the length
/// of a null-terminated string, which is measured first.
/// @pre "s != nullptr" of a null-terminated string
///
/// @snippet examples/reference.cpp operators
/// @{

/// Returns whether a and b have equal code units, as _Eq() does.
template <class T> bool operator==(const xvector<T>& a, const xvector<T>& b) { return a._Eq(b); }
/// Returns whether a and b have equal code units.
template <class T> bool operator==(const xvector<T>& a, detail::Operand<T> b) {
  return detail::IsSameText<T>(a, b);
}
/// Returns whether a and b have equal code units.
template <class T> bool operator==(detail::Operand<T> a, const xvector<T>& b) {
  return detail::IsSameText<T>(a, b);
}
/// Returns whether a and b differ.
template <class T> bool operator!=(const xvector<T>& a, const xvector<T>& b) { return !(a == b); }
/// Returns whether a and b differ.
template <class T> bool operator!=(const xvector<T>& a, detail::Operand<T> b) { return !(a == b); }
/// Returns whether a and b differ.
template <class T> bool operator!=(detail::Operand<T> a, const xvector<T>& b) { return !(a == b); }
/// Returns whether a orders before b, as _Lt() does.
template <class T> bool operator<(const xvector<T>& a, const xvector<T>& b) { return a._Lt(b); }
/// Returns whether a orders before b.
template <class T> bool operator<(const xvector<T>& a, detail::Operand<T> b) {
  return detail::CompareText<T>(a, b) < 0;
}
/// Returns whether a orders before b.
template <class T> bool operator<(detail::Operand<T> a, const xvector<T>& b) {
  return detail::CompareText<T>(a, b) < 0;
}
/// Returns whether a orders after b.
template <class T> bool operator>(const xvector<T>& a, const xvector<T>& b) { return b < a; }
/// Returns whether a orders after b.
template <class T> bool operator>(const xvector<T>& a, detail::Operand<T> b) { return b < a; }
/// Returns whether a orders after b.
template <class T> bool operator>(detail::Operand<T> a, const xvector<T>& b) { return b < a; }
/// Returns whether a orders before b or equals it.
template <class T> bool operator<=(const xvector<T>& a, const xvector<T>& b) { return !(b < a); }
/// Returns whether a orders before b or equals it.
template <class T> bool operator<=(const xvector<T>& a, detail::Operand<T> b) { return !(b < a); }
/// Returns whether a orders before b or equals it.
template <class T> bool operator<=(detail::Operand<T> a, const xvector<T>& b) { return !(b < a); }
/// Returns whether a orders after b or equals it.
template <class T> bool operator>=(const xvector<T>& a, const xvector<T>& b) { return !(a < b); }
/// Returns whether a orders after b or equals it.
template <class T> bool operator>=(const xvector<T>& a, detail::Operand<T> b) { return !(a < b); }
/// Returns whether a orders after b or equals it.
template <class T> bool operator>=(detail::Operand<T> a, const xvector<T>& b) { return !(a < b); }

/// @}
/// @name Keys
/// Comparators and a hash for maps. They let you search a map for any text that the operators compare,
/// without copying it into a key: a `std::map` from C++17 on, an unordered map from C++20 on. A pointer is
/// always a null-terminated string, never an address, even where both operands are pointers.
/// @pre "s != nullptr" of a null-terminated string
///
/// @snippet examples/reference.cpp keys
/// @{

/// Orders texts as the operator `<` does.
/// @snippet examples/reference.cpp keys
struct Less {
  typedef void is_transparent; ///< Lets look-ups take other types than the key's.
  /// Returns whether a orders before b.
  template <class A, class B, detail::IfTexts<detail::UnitOf<A>, A, B> = 0>
  bool operator()(const A& a, const B& b) const {
    return detail::CompareText<detail::UnitOf<A>>(a, b) < 0;
  }
};

/// Compares texts as the operator `==` does.
/// @snippet examples/reference.cpp keys
struct Equal {
  typedef void is_transparent; ///< Lets look-ups take other types than the key's.
  /// Returns whether a and b have equal code units.
  template <class A, class B, detail::IfTexts<detail::UnitOf<A>, A, B> = 0>
  bool operator()(const A& a, const B& b) const {
    return detail::IsSameText<detail::UnitOf<A>>(a, b);
  }
};

/// Hashes a text, whatever holds it; the hash of 8-bit text is that of its `std::string_view`. `std::hash` of
/// a string, the default of unordered containers, gives the same value. Neither is noexcept: libstdc++'s
/// containers then store the hash with each key, as they do for std::string.
/// @snippet examples/reference.cpp keys
struct Hash {
  typedef void is_transparent; ///< Lets look-ups take other types than the key's.
  /// Returns the hash of the code units.
  template <class A, detail::IfTexts<detail::UnitOf<A>, A> = 0> std::size_t operator()(const A& text) const {
    return detail::HashText<detail::UnitOf<A>>(text);
  }
};

/// @}
/// @name Views, and copies to and from standard strings
/// A char16 is not a char16_t, and neither may be read through a pointer to the other. So there are no views
/// of 16-bit text, only copies.
/// @snippet examples/reference.cpp views
/// @{

/// Returns a view of s. It is valid until the next change of s, c_str() included. A call with a temporary
/// doesn't compile.
inline std::string_view View(const xvector<char8>& s) {
  return {s.data(), static_cast<std::size_t>(s.size())};
}
std::string_view View(const xvector<char8>&&) = delete;
/// Copies s into a standard string.
inline std::string ToString(const xvector<char8>& s) { return std::string(View(s)); }
/// Copies s into a standard string.
inline std::u16string ToU16String(const xvector<char16>& s) {
  std::u16string result(static_cast<std::size_t>(s.size()), u'\0');
  if (!s.empty()) // memcpy may not be given null pointers
    std::memcpy(result.data(), s.data(), result.size() * sizeof(char16));
  return result;
}
/// Copies the view's text, nulls included. A literal ends at its first null.
inline string8 ToString8(std::string_view s) { return string8(s.data(), static_cast<ssize_t>(s.size())); }
#if defined(__cpp_lib_char8_t)
/// Copies the view's text, of a `u8"..."` literal for example, from C++20 on.
inline string8 ToString8(std::u8string_view s) {
  return string8(reinterpret_cast<const char8*>(s.data()), static_cast<ssize_t>(s.size()));
}
#endif
/// Copies the view's text, of a `u"..."` literal or a std::u16string for example.
string16 ToString16(std::u16string_view s);

/// @}

/// Writes the text to a standard stream, padded to the stream's width as a `std::string_view` is. It takes
/// results of `+` and other vectors of char8 too.
template <class Traits>
std::basic_ostream<char, Traits>& operator<<(std::basic_ostream<char, Traits>& os, const xvector<char8>& s) {
  return os << std::basic_string_view<char, Traits>(s.data(), static_cast<std::size_t>(s.size()));
}

/// Appends what f writes. It makes room for `most` units without initialising them, calls f(p, most) with p
/// at the first of them, and keeps as many units as f returns.
///
///     while (FillFrom(text, 65536, [&](char* p, ssize_t n) { return std::fread(p, 1, size_t(n), f); }) > 0)
///       ;
///
/// Over many calls, each unit is moved a constant number of times on average. If f throws, the contents stay
/// as they were, and so they do if a failed allocation throws std::bad_alloc. f may not use dst.
/// @pre "0 <= most"; then, for f's result, "0 <= filled && filled <= most"
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
// Hidden from the reference, which has no page for std::hash.
template <class T> struct std::hash<mirel::basic_xstring<T>> {
  std::size_t operator()(const mirel::basic_xstring<T>& s) const { return mirel::detail::HashText<T>(s); }
};
template <class T> struct std::hash<mirel::MovableString<T>> : std::hash<mirel::basic_xstring<T>> {};
/// @endcond
