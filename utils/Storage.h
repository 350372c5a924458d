/// @file
/// What follows from writing into a vector's unused capacity: its size is set afterwards.
///
/// Programs have FillFrom() of utils/Std.h for that, which checks what was written. This is for the library's
/// own functions, and checks nothing.

#pragma once

#include "xvector.h"

namespace mirel::detail {

struct Storage {
  /// Makes room for count elements more by the rule of all growth, and returns where they go. The contents
  /// stay as they are, also where it throws.
  template <class T> static T* Grow(xvector<T>& v, ssize_t count) {
    const ssize_t size = v.m_buffer.size_;
    v.m_buffer.growbytes(xvector<T>::Bytes(count));
    v.m_buffer.size_ = size;
    return v.data_end();
  }
  /// Makes the first size elements of the storage the contents; they have been written.
  template <class T> static void SetSize(xvector<T>& v, ssize_t size) {
    v.m_buffer.size_ = size * ssize_t(sizeof(T));
  }
  /// Gives back what is more than capacity elements, of which there are at least as many as v has.
  template <class T> static void GiveBack(xvector<T>& v, ssize_t capacity) {
    if (capacity < v.capacity())
      v.m_buffer.Shrink(capacity * ssize_t(sizeof(T)));
  }
};

} // namespace mirel::detail
