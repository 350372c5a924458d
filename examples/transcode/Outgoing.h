// Prepares text for the output: byte order mark, line ends, encoding.

#pragma once

#include <optional>
#include <string_view>

#include "Blocks.h"

namespace transcode {

/// Whether the output begins with a byte order mark: if the input does, never, or always.
enum class Mark { kKeep, kStrip, kAdd };
enum class LineEnds { kKeep, kLf, kCrLf };

/// A code point that the encoding lacks, and its index in the text of a block.
struct Unmappable {
  ssize_t index;
  char32_t codePoint;
};

/// Gives the text of one file after another the mark, the line ends and the encoding of the output.
///
/// Text that doesn't change isn't copied: the result may refer to the block. The mark that a file begins with
/// isn't part of its text, so it is dropped when it follows the text of another file.
class Outgoing {
public:
  Outgoing(const Encoding& to, Mark mark, LineEnds lineEnds, Mode mode)
      : m_to(to), m_mark(mark), m_lineEnds(lineEnds), m_mode(mode), m_order(to.order) {}

  void BeginFile();
  /// Encodes a block, up to the first code point that the encoding lacks if that ends the program. The result
  /// is valid until the next call.
  std::string_view Encode(Blocks& block);
  /// Encodes what was kept back at the end of the last block.
  std::string_view EndFile();

  /// The first code point of the file that the encoding lacks, if it is in the block.
  const std::optional<Unmappable>& FirstUnmappable() const { return m_firstUnmappable; }
  /// The number of the file's code points that the encoding lacks and that have been replaced or dropped.
  int64 UnmappableCount() const { return m_unmappableCount; }

private:
  const string16& Fit(const Blocks& block);
  void AppendLines(const char16* p, const char16* end);
  void Append(const char16* p, const char16* end);

  const Encoding& m_to;
  const Mark m_mark;
  const LineEnds m_lineEnds;
  const Mode m_mode;
  ByteOrder m_order;
  bool m_hasBegun = false;
  bool m_keepsCr = false; ///< whether a carriage return is kept back until it is known what follows it
  std::optional<Unmappable> m_firstUnmappable;
  int64 m_unmappableCount = 0;
  string16 m_fitting; ///< the text without what the encoding lacks
  string16 m_text;    ///< the text with other line ends, or another beginning
  Scratch m_scratch;
};

} // namespace transcode
