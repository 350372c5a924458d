// Statistics of a text that is read in blocks.

#pragma once

#include <string>

#include <utils/xstring.h>

#include "Blocks.h"

namespace transcode {

using mirel::int64;

/// Counts units, code points and lines. A newline ends a line and isn't part of it; text after the last
/// newline is a line too.
class Statistics {
public:
  /// Moves the place forward by so many bytes of the block.
  void Advance(const Blocks& block, ssize_t bytes);
  /// Counts the rest of the report. Call it after Advance() for the same block.
  void Examine(Blocks& block);

  /// Describes the place at an offset, in bytes, of the next block: "byte 12 (line 2, column 1)".
  std::string PlaceIn(const Blocks& block, ssize_t offset) const;
  /// Returns the table of all counts under a title.
  string8 Report(const std::string& title) const;

private:
  std::string Place() const;
  template <class T, class CountColumns> void AdvanceOver(const T* p, ssize_t n, CountColumns countColumns);
  bool IsSameAfterRoundTrip(Blocks& block);

  int64 m_bytes = 0;
  int64 m_newlines = 0;
  int64 m_column = 0; ///< code points after the last newline
  int64 m_utf8Units = 0;
  int64 m_utf16Units = 0;
  int64 m_codePoints = 0;
  int64 m_asciiCodePoints = 0;
  int64 m_longestLine = 0;
  int64 m_line = 0; ///< code points of the line that continues in the next block
  bool m_isSameAfterRoundTrip = true;
  string16 m_roundTripText;
  Scratch m_scratch;
};

} // namespace transcode
