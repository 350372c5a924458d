// The input, taken block by block, and what each block is as UTF-16 and UTF-8.

#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include <utils/Utf.h>

#include "CodeUnits.h"
#include "Files.h"

namespace transcode {

/// What is done with text that is malformed or that the output's encoding lacks, and whether there is more to
/// do than to look for it.
enum class Mode { kConvert, kReplace, kDrop, kCheck };

/// Where the first malformed sequence of a block is, in bytes, and what is wrong with it.
struct Fault {
  ssize_t offset;
  const char* reason;
};

/// Goes through a file in blocks that end between sequences.
///
/// A block is there as UTF-16, and as UTF-8 for no more than a conversion: where the input is one of the two,
/// it is that which checks the text, too. To look for faults alone takes none, and then blocks are there as
/// they stand in the input only.
class Blocks {
public:
  /// The replacement is what stands for malformed text if that is replaced.
  Blocks(Input& input, const Encoding& from, Mode mode, char16 replacement);

  /// Goes to the next block. @return false past the last one
  bool Next();
  /// The first fault of the file, if it is in the block; the block ends before it if it ends the program.
  const std::optional<Fault>& FirstFault() const { return m_fault; }
  /// How many malformed sequences have been replaced or dropped so far.
  int64 Faults() const { return m_faults; }

  /// The block as it stands in the input.
  std::string_view Bytes() const { return {m_buffer.data(), static_cast<std::size_t>(m_size)}; }
  /// The code units of the input, of which those of the block come first: of UTF-16, and of UTF-32.
  const string16& Units16() const { return m_hasOwnUnits ? m_units16 : m_text; }
  const std::u32string& Units32() const { return m_units32; }
  Form From() const { return m_from.form; }
  /// The byte order of the units, which a mark has decided if it was to.
  ByteOrder Order() const { return m_order; }

  /// The text of the block, as UTF-16 in the machine's byte order and as UTF-8.
  const string16& Text() const { return m_text; }
  std::string_view Utf8();
  /// Whether the text begins with a byte order mark that the file begins with.
  bool BeginsWithMark() const { return m_isFirst && !m_text.empty() && m_text[0] == kByteOrderMark; }
  /// The bytes of the block that stand before an index of its text; not where U+FFFD replaces some.
  ssize_t OffsetOf(ssize_t index) const;

private:
  /// Where the text goes on behind a malformed sequence.
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
  template <class T, class FindPiece> void DecodePieces(const T* p, ssize_t n, FindPiece findPiece);
  bool GoesOnBehind(const Fault& fault, ssize_t length);
  ByteOrder OrderByMark() const;

  Input& m_input;
  const Encoding& m_from;
  const Mode m_mode;
  const char16 m_replacement;
  ByteOrder m_order;
  bool m_isFirst = true; ///< whether the block is the first one
  string8 m_buffer;      ///< the block, and behind it the start of a sequence that goes on in the next one
  ssize_t m_filled = 0;  ///< bytes of the buffer that are of the input
  ssize_t m_size = 0;    ///< bytes of the buffer that are of the block
  bool m_hasOwnUnits = false; ///< whether the units of UTF-16 aren't the text, since that isn't well-formed
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
