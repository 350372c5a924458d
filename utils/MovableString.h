/// @file
/// MovableString<T>, a string with move operations.
///
/// It derives from basic_xstring and adds nothing but the moves, so it may be passed wherever a string or a
/// vector is taken.

#pragma once

#include <type_traits>

#include "NotOffered.h"
#include "xstring.h"
#include "xvector.h"

namespace mirel {

/// A string whose moves take over the storage in constant time, where those of a basic_xstring copy.
///
/// A `std::vector` of movable strings grows, sorts and erases without copying any text. A moved-from string
/// is empty and has no storage.
///
/// A movable string takes over the storage of a temporary or moved basic_xstring. To pass the storage of a
/// movable string `m` to a basic_xstring `s`, call `s.swap(m)`. Inherited members keep their result types:
/// `substr()` returns a basic_xstring, whose storage is taken over without a copy, and `+` returns a vector,
/// which is copied.
/// @snippet examples/reference.cpp MovableString
template <class T> class MIREL_DESCRIBED MovableString : public basic_xstring<T> {
  typedef basic_xstring<T> Base;

public:
  /// Makes an empty string, without storage.
  MovableString() noexcept {}
  using Base::Base;
  /// Copies a string; the capacity is the size.
  MovableString(const MovableString&) = default;
  /// Takes over the storage of r, which is then empty.
  MovableString(MovableString&& r) noexcept { this->swap(r); }
  /// Copies a basic_xstring.
  MovableString(const Base& r) : Base(r) {}
  /// Takes over the storage of r, which is then empty.
  MovableString(Base&& r) noexcept { this->swap(r); }
  /// Releases the storage.
  ~MovableString() = default;

  using Base::operator=;
  /// Becomes a copy of r; the storage is kept if it is large enough.
  MovableString& operator=(const MovableString& r) = default;
  /// Releases its own storage and takes over that of r, which is then empty.
  MovableString& operator=(MovableString&& r) noexcept { return *this = static_cast<Base&&>(r); }
  /// Becomes a copy of a vector, such as a result of operator+. It is a template so that braces never convert
  /// to a vector.
  template <class V, std::enable_if_t<std::is_same_v<V, xvector<T>>, int> = 0>
  MovableString& operator=(const V& r) {
    xvector<T>::operator=(r);
    return *this;
  }
  /// Releases its own storage and takes over that of r, which is then empty.
  MovableString& operator=(Base&& r) noexcept {
    // A mere swap with r is slower where a std::vector moves its strings by one place: each load waits for
    // the store before it, 2.5 ns instead of 0.9.
    Base taken;
    taken.swap(r);
    this->swap(taken);
    return *this;
  }
  /// @cond
  template <class X, class Hint = detail::Instead<T, X>> void operator=(const X&) = delete;
  /// @endcond
};

/// Exchanges the contents of two strings in constant time.
template <class T> void swap(MovableString<T>& a, MovableString<T>& b) noexcept { a.swap(b); }

typedef MovableString<char8> mstring8;   ///< A movable string of UTF-8 code units, or of any bytes.
typedef MovableString<char16> mstring16; ///< A movable string of UTF-16 code units.

} // namespace mirel
