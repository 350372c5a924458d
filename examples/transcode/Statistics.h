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

  /// The place at an offset of the block that comes next, in words: "byte 12 (line 2, column 1)".
  std::string PlaceIn(const Blocks& block, ssize_t offset) const;
  /// Notes how many malformed sequences were replaced, and where the first was.
  void SetReplacements(int64 count, const std::string& first);
  /// Both in words: "2 malformed sequences replaced, the first at byte 3 (line 1, column 4)", or nothing.
  std::string Replaced() const;
  /// The table of it all under the given title.
  string8 Report(const std::string& title) const;

private:
  std::string Place() const;
  template <class T> void AdvanceOver(const T* p, ssize_t n);

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
  int64 m_replacements = 0;
  std::string m_firstReplaced;
};

} // namespace transcode
