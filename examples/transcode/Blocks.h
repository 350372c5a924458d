// The input, taken block by block, and what each block is in the encodings.

#pragma once

#include <string_view>

#include <utils/xstring.h>

#include "Files.h"

namespace transcode {

using mirel::string16;
using mirel::string8;

enum class Encoding { kUtf8, kUtf16Le, kUtf16Be, kAscii };

/// Goes through the input in blocks that end between sequences, so that each can be converted for itself.
///
/// A block is there as UTF-8 and as UTF-16 for the price of one conversion: one of the two is the input's
/// own.
class Blocks {
public:
  Blocks(Input& input, Encoding from);

  /// Goes to the next block. @return false behind the last one
  bool Next();
  /// Whether the block isn't followed by a fault. Where it is, the block is the text before the fault.
  bool IsWellFormed() const { return m_isWellFormed; }

  /// The block as it stands in the input, as UTF-16 in the machine's byte order, and as UTF-8.
  std::string_view Bytes() const { return {m_buffer.data(), static_cast<std::size_t>(m_size)}; }
  const string16& Text() const { return m_text; }
  std::string_view Utf8() const;
  /// The block in another encoding; valid until the next call.
  std::string_view In(Encoding to);
  /// Converts the block back from what it was converted to, and tells whether it is what came in.
  bool ComesBack();

private:
  ssize_t Decode();

  Input& m_input;
  const Encoding m_from;
  string8 m_buffer;      ///< the block, and behind it the start of a sequence that goes on in the next one
  ssize_t m_filled = 0;  ///< bytes of the buffer that are of the input
  ssize_t m_size = 0;    ///< bytes of the buffer that are of the block
  string16 m_text;       ///< the block
  string8 m_utf8;        ///< the block, where the input isn't UTF-8 itself
  string16 m_otherOrder; ///< room for units whose bytes are exchanged
  string8 m_back;        ///< room for UTF-8 that is compared with the input
  bool m_isWellFormed = true;
};

} // namespace transcode
