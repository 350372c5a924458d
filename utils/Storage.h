/// @file
/// Writing into a vector's unused capacity: make room, write, then set the size.
///
/// This is for the library's own functions, and checks nothing. Programs use FillFrom() of utils/Std.h, which
/// checks how much was written.

#pragma once

#include "xvector.h"

namespace mirel::detail {

struct Storage {
  /// Makes room for count more elements, with the capacity growing as in every edit, and returns the address
  /// of the first. The contents stay as they are, even if it throws.
  template <class T> static T* Grow(xvector<T>& v, ssize_t count) {
    const ssize_t size = v.m_buffer.size_;
    v.m_buffer.growbytes(xvector<T>::Bytes(count));
    v.m_buffer.size_ = size;
    return v.data_end();
  }
  /// Makes the first size elements of the storage the contents. The caller has written them.
  template <class T> static void SetSize(xvector<T>& v, ssize_t size) {
    v.m_buffer.size_ = size * ssize_t(sizeof(T));
  }
  /// Reduces the storage to capacity elements, if it is larger. capacity must be at least 1 and at least the
  /// size.
  template <class T> static void Shrink(xvector<T>& v, ssize_t capacity) {
    if (capacity < v.capacity())
      v.m_buffer.Shrink(capacity * ssize_t(sizeof(T)));
  }
};

} // namespace mirel::detail
