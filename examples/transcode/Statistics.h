// What there is to tell of a text that has gone by in blocks.

#pragma once

#include <string>

#include <utils/xstring.h>

#include "Blocks.h"

namespace transcode {

using mirel::int64;

/// A line ends with a newline, which isn't counted to it; what follows the last newline is a line too.
class Statistics {
public:
  /// Counts what tells where the text has got to, in as many bytes of the block.
  void Advance(const Blocks& block, ssize_t bytes);
  /// Counts the rest of what the report tells. Comes after Advance with the same block.
  void Examine(Blocks& block);

  /// The place at an offset in bytes of the block that comes next, in words: "byte 12 (line 2, column 1)".
  std::string PlaceIn(const Blocks& block, ssize_t offset) const;
  /// The table of it all under the given title.
  string8 Report(const std::string& title) const;

private:
  std::string Place() const;
  template <class T, class CountColumns> void AdvanceOver(const T* p, ssize_t n, CountColumns countColumns);
  bool ComesBack(Blocks& block);

  int64 m_bytes = 0;
  int64 m_newlines = 0;
  int64 m_column = 0; ///< code points after the last newline
  int64 m_utf8Units = 0;
  int64 m_utf16Units = 0;
  int64 m_codePoints = 0;
  int64 m_asciiCodePoints = 0;
  int64 m_longestLine = 0;
  int64 m_line = 0; ///< code points of the line that goes on in the next block
  bool m_comesBack = true;
  string16 m_backText; ///< room for the text when it has gone there and back
  Room m_room;
};

} // namespace transcode
