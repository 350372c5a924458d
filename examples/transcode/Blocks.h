// Reads the input block by block, and decodes each block to UTF-16 and UTF-8.

#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include <utils/Utf.h>

#include "CodeUnits.h"
#include "Files.h"

namespace transcode {

/// What to do with text that is malformed or that the output's encoding lacks. kCheck only looks for
/// malformed text.
enum class Mode { kConvert, kReplace, kDrop, kCheck };

/// Where the first malformed sequence of a block is, in bytes, and what is wrong with it.
struct Fault {
  ssize_t offset;
  const char* reason;
};

/// Reads a file in blocks that end between sequences.
///
/// A block is available as UTF-16 and as UTF-8, at the cost of one conversion: where the input is one of the
/// two, the conversion to the other also checks the text. kCheck converts nothing, and only the bytes of a
/// block are available.
class Blocks {
public:
  /// The replacement is the unit that replaces malformed text in kReplace.
  Blocks(Input& input, const Encoding& from, Mode mode, char16 replacement);

  /// Goes to the next block. @return false past the last one
  bool Next();
  /// The first fault of the file, if this block has it. If the fault ends the program, the block ends before
  /// it.
  const std::optional<Fault>& FirstFault() const { return m_fault; }
  /// The number of malformed sequences that have been replaced or dropped so far.
  int64 Faults() const { return m_faults; }

  /// The bytes of the block in the input.
  std::string_view Bytes() const { return {m_buffer.data(), static_cast<std::size_t>(m_size)}; }
  /// The code units of UTF-16 or UTF-32 input: those of the block, and then perhaps some of the next one.
  const string16& Units16() const { return m_hasOwnUnits ? m_units16 : m_text; }
  const std::u32string& Units32() const { return m_units32; }
  Form From() const { return m_from.form; }
  /// The byte order of the units; for kByMark, the one that the mark tells.
  ByteOrder Order() const { return m_order; }

  /// The text of the block, as UTF-16 in the machine's byte order and as UTF-8.
  const string16& Text() const { return m_text; }
  std::string_view Utf8();
  /// Returns whether the text begins with the file's byte order mark.
  bool BeginsWithMark() const { return m_isFirst && !m_text.empty() && m_text[0] == kByteOrderMark; }
  /// The number of the block's bytes before an index of its text. It isn't valid if U+FFFD replaces some of
  /// them.
  ssize_t OffsetOf(ssize_t index) const;

private:
  /// Where the text continues after a malformed sequence.
  struct Resumption {
    ssize_t offset; ///< in bytes of the block
    ssize_t index;  ///< in units of its text
  };

  void Decode(bool isEnd);
  void DecodeUtf8(bool isEnd);
  void DecodeUtf16(bool isEnd);
  template <class Stream, class CharOut, class CharIn>
  ssize_t DecodeWhole(mirel::basic_xstring<CharOut>& dst, const CharIn* p, ssize_t n, bool isEnd);
  void DecodeUtf32();
  void DecodeBytes();
  template <class T, class FindChunk> void DecodeChunks(const T* p, ssize_t n, FindChunk findChunk);
  bool ContinuesAfter(const Fault& fault, ssize_t length);
  ByteOrder OrderByMark() const;

  Input& m_input;
  const Encoding& m_from;
  const Mode m_mode;
  const char16 m_replacement;
  ByteOrder m_order;
  bool m_isFirst = true;      ///< whether the block is the first one
  string8 m_buffer;           ///< the block, then the beginning of a sequence that the next block completes
  ssize_t m_filled = 0;       ///< the number of bytes in the buffer
  ssize_t m_size = 0;         ///< the number of bytes in the block
  bool m_hasOwnUnits = false; ///< whether m_units16 isn't the text, because the input is malformed
  bool m_isChanged = false;   ///< whether anything in the block is replaced or dropped
  string16 m_text;
  string16 m_units16;
  std::u32string m_units32;
  string8 m_utf8; ///< the text, where the input isn't UTF-8 itself
  bool m_hasUtf8 = false;
  std::vector<Resumption> m_resumptions;
  int64 m_faults = 0;
  std::optional<Fault> m_fault;
};

} // namespace transcode
