// The input, taken block by block, and what each block is in the encodings.

#pragma once

#include <optional>
#include <string_view>

#include <utils/Utf.h>

#include "Files.h"

namespace transcode {

using mirel::string16;
using mirel::string8;

enum class Encoding { kUtf8, kUtf16Le, kUtf16Be, kAscii };

inline bool IsUtf16(Encoding encoding) {
  return encoding == Encoding::kUtf16Le || encoding == Encoding::kUtf16Be;
}

/// What is done with malformed text, and whether there is more to do than to look for it.
enum class Mode { kConvert, kReplace, kCheck };

/// Where the first malformed sequence of a block is, in bytes, and what is wrong with it.
struct Fault {
  ssize_t offset;
  const char* reason;
};

/// Goes through the input in blocks that end between sequences.
///
/// A block is there as UTF-8 and as UTF-16 for the price of one conversion: one of the two is the input's
/// own. To check a text takes no conversion, and then its blocks are there as they stand in the input only.
class Blocks {
public:
  Blocks(Input& input, Encoding from, Mode mode);

  /// Goes to the next block. @return false past the last one
  bool Next();
  /// The first fault of the text, if it is in the block; the block ends before it unless it is replaced.
  const std::optional<Fault>& FirstFault() const { return m_fault; }
  /// How many U+FFFD stand for malformed text so far.
  int64 Replacements() const { return m_replacements; }

  /// The block as it stands in the input, as UTF-16 in the machine's byte order, and as UTF-8.
  std::string_view Bytes() const { return {m_buffer.data(), static_cast<std::size_t>(m_size)}; }
  const string16& Text() const { return m_text; }
  std::string_view Utf8() const;
  Encoding From() const { return m_from; }
  /// The block in another encoding; valid until the next call.
  std::string_view In(Encoding to);
  /// Converts the block back from what it was converted to, and tells whether it is what came in.
  bool ComesBack();

private:
  void Decode(ssize_t fed, bool isEnd);
  void DecodeUtf8(ssize_t fed, bool isEnd);
  void DecodeUtf16(bool isEnd);
  void DecodeAscii();
  void EndOddly();
  template <class T> ssize_t Check(const T* p, ssize_t n, bool isEnd);
  template <class Stream> bool Note(const Stream& stream, int64 begin, ssize_t unitBytes);

  Input& m_input;
  const Encoding m_from;
  const Mode m_mode;
  mirel::Utf8Stream m_toUtf16;
  mirel::Utf16Stream m_toUtf8;
  string8 m_buffer;     ///< the block, and behind it the start of a sequence that goes on in the next one
  ssize_t m_filled = 0; ///< bytes of the buffer that are of the input
  ssize_t m_size = 0;   ///< bytes of the buffer that are of the block
  string16 m_text;      ///< the block
  string8 m_utf8;       ///< the block, where the input isn't UTF-8 itself or has been replaced in part
  bool m_isReplaced = false; ///< whether a part of this block is
  int64 m_replacements = 0;
  std::optional<Fault> m_fault;
  string16 m_otherOrder; ///< room for units whose bytes are exchanged
  string8 m_back;        ///< room for UTF-8 that is compared with the input
};

} // namespace transcode
