/// @file
/// The sink of bytes that an output stream writes to.

#pragma once

#include "BasicTypes.h"

namespace mirel {

/// Where the bytes of an xostream go: implement it for a file, a socket or a string.
/// An exception that an implementation throws propagates to the caller of the stream. The stream counts the
/// bytes of that call as not written.
/// @snippet examples/reference.cpp sinks
struct MIREL_API IOutputStream {
  virtual ~IOutputStream();
  /// Takes the count bytes at address, all of them; count is above 0.
  virtual void WriteStream(const void* address, ssize_t count) = 0;
  /// Passes on what the sink has buffered.
  virtual void FlushStream() = 0;
};

} // namespace mirel
