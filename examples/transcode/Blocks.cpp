#include "Blocks.h"

#include <algorithm>
#include <type_traits>

namespace transcode {

namespace {

/// The capacity of a pipe. A block stays in the cache while it is decoded, counted and written; blocks of
/// half the size and up to four times the size were no faster.
constexpr ssize_t kBlock = 1 << 16;
/// The most bytes that a block leaves to the next one: part of a UTF-8 sequence, one and a half UTF-16 units,
/// or part of a UTF-32 unit.
constexpr ssize_t kMaxUnfinished = 3;

/// The well-formed units at the beginning of a text, and what follows them: nothing, an incomplete sequence,
/// or a malformed one.
struct Chunk {
  ssize_t size;
  ssize_t malformed;  ///< the number of units of the malformed sequence
  const char* reason; ///< null if there is none
};

/// Finds the first fault of UTF-8 or UTF-16. A sequence at the end that the next block may complete isn't a
/// fault; a stream decides that.
template <class T> Chunk FindChunk(const T* p, ssize_t n, bool isEnd) {
  const ssize_t size = mirel::FindMalformed(p, n);
  if (size < 0)
    return {n, 0, nullptr};
  const mirel::MalformedText malformed = mirel::ExplainMalformed(p, n, size);
  std::conditional_t<sizeof(T) == 1, mirel::Utf8Stream, mirel::Utf16Stream> rest;
  std::conditional_t<sizeof(T) == 1, string16, string8> none;
  if (!isEnd && size + malformed.length == n && rest.Append(none, p + size, malformed.length))
    return {size, 0, nullptr};
  return {size, malformed.length, Describe(malformed.reason)};
}

Chunk FindChunkOfUtf32(const char32_t* p, ssize_t n) {
  const auto isSurrogate = [](char32_t c) { return c >> 11 == 0xD800 >> 11; };
  const ssize_t size = std::find_if(p, p + n, [&](char32_t c) { return c > 0x10FFFF || isSurrogate(c); }) - p;
  if (size == n)
    return {n, 0, nullptr};
  return {size, 1,
          isSurrogate(p[size]) ? "surrogate in UTF-32" : Describe(mirel::MalformedReason::kBeyondUnicode)};
}

Chunk FindChunkOfAscii(const char16* p, ssize_t n) {
  const ssize_t size = LengthBelow(0x80, p, n);
  return {size, size < n, size < n ? "byte above 7F" : nullptr};
}

void AppendText(string16& text, const char* p, ssize_t n) { mirel::AppendUtf16(text, p, n); }
void AppendText(string16& text, const char16* p, ssize_t n) { text.push_back(p, p + n); }
void AppendText(string16& text, const char32_t* p, ssize_t n) {
  std::for_each(p, p + n, [&text](char32_t c) { mirel::AppendCodePoint(text, c); });
}

void SetFromBytes(string16& units, const char* p, ssize_t n) {
  units.resize(n, 0);
  std::transform(p, p + n, units.data(), [](char c) { return static_cast<unsigned char>(c); });
}

} // namespace

Blocks::Blocks(Input& input, const Encoding& from, Mode mode, char16 replacement)
    : m_input(input), m_from(from), m_mode(mode), m_replacement(replacement), m_order(from.order),
      m_buffer(kBlock + kMaxUnfinished, '\0') {}

bool Blocks::Next() {
  bool isEnd = false;
  m_isFirst = m_isFirst && m_size == 0;
  m_fault.reset();
  do {
    m_buffer.move(0, m_size, m_filled - m_size);
    m_filled -= m_size;
    const ssize_t count = m_input.Read(m_buffer.data() + m_filled, kBlock);
    m_filled += count;
    isEnd = count == 0;
    if (m_filled == 0)
      return false;
    Decode(isEnd);
  } while (m_size == 0 && !isEnd && !m_fault);
  return true;
}

/// Decodes the buffer as far as it is well-formed, replaced or dropped; that is the block.
void Blocks::Decode(bool isEnd) {
  m_utf8.clear();
  m_resumptions.clear();
  m_hasUtf8 = false;
  m_hasOwnUnits = false;
  m_isChanged = false;
  m_size = 0;
  if (m_order == ByteOrder::kByMark) {
    if (m_filled < UnitSize(m_from.form) && !isEnd)
      return;
    m_order = OrderByMark();
  }
  switch (m_from.form) {
  case Form::kUtf8: DecodeUtf8(isEnd); break;
  case Form::kUtf16: DecodeUtf16(isEnd); break;
  case Form::kUtf32: DecodeUtf32(); break;
  case Form::kLatin1:
  case Form::kAscii: DecodeBytes(); break;
  }
  const ssize_t rest = m_filled - m_size;
  if (isEnd && rest > 0 && rest < UnitSize(m_from.form) &&
      ContinuesAfter({m_size, Describe(mirel::MalformedReason::kTruncated)}, rest))
    m_size = m_filled;
}

/// Reads the byte order from the mark. Without one it is big-endian: RFC 2781, section 4.3, and the Unicode
/// Standard, definitions D98 and D101.
ByteOrder Blocks::OrderByMark() const {
  const ssize_t size = UnitSize(m_from.form);
  const std::string_view mark =
      size == 2 ? std::string_view("\xFF\xFE", 2) : std::string_view("\xFF\xFE\0\0", 4);
  const bool isLittle = std::string_view(m_buffer.data(), std::size_t(std::min(m_filled, size))) == mark;
  return isLittle ? ByteOrder::kLittle : ByteOrder::kBig;
}

void Blocks::DecodeUtf8(bool isEnd) {
  m_text.clear();
  m_size = DecodeWhole<mirel::Utf8Stream>(m_text, m_buffer.data(), m_filled, isEnd);
  if (m_size < 0)
    DecodeChunks(m_buffer.data(), m_filled,
                 [isEnd](const char* p, ssize_t n) { return FindChunk(p, n, isEnd); });
}

void Blocks::DecodeUtf16(bool isEnd) {
  ReadUnits(m_text, m_buffer.data(), m_filled, m_order);
  const ssize_t size = DecodeWhole<mirel::Utf16Stream>(m_utf8, m_text.data(), m_text.size(), isEnd);
  m_size = 2 * size;
  m_hasUtf8 = size >= 0;
  if (m_hasUtf8 && !m_isChanged) {
    m_text.resize(size, 0);
    return;
  }
  m_units16.swap(m_text);
  m_hasOwnUnits = true;
  if (m_hasUtf8)
    mirel::Utf16FromUtf8(m_text, m_utf8);
  else
    DecodeChunks(m_units16.data(), m_units16.size(),
                 [isEnd](const char16* p, ssize_t n) { return FindChunk(p, n, isEnd); });
}

/// Converts all units at once: the fast path. @return how many units make complete sequences, or -1 if one is
/// malformed and the stream doesn't replace it; always -1 in kCheck, which converts nothing
template <class Stream, class CharOut, class CharIn>
ssize_t Blocks::DecodeWhole(mirel::basic_xstring<CharOut>& dst, const CharIn* p, ssize_t n, bool isEnd) {
  // A stream replaces with U+FFFD only, and drops nothing.
  const bool replaces = m_mode == Mode::kReplace && m_replacement == 0xFFFD;
  Stream stream(replaces ? mirel::OnMalformed::kReplace : mirel::OnMalformed::kStop);
  if (m_mode == Mode::kCheck || !stream.Append(dst, p, n))
    return -1;
  const ssize_t pending = isEnd ? 0 : stream.pending();
  if (isEnd && !stream.Finish(dst))
    return -1;
  if (stream.replacements() > 0) {
    if (m_faults == 0)
      m_fault = Fault{static_cast<ssize_t>(stream.malformed().offset) * ssize_t(sizeof(CharIn)),
                      Describe(stream.malformed().reason)};
    m_faults += stream.replacements();
    m_isChanged = true;
  }
  return n - pending;
}

void Blocks::DecodeUtf32() {
  ReadUnits(m_units32, m_buffer.data(), m_filled, m_order);
  DecodeChunks(m_units32.data(), static_cast<ssize_t>(m_units32.size()), FindChunkOfUtf32);
}

void Blocks::DecodeBytes() {
  SetFromBytes(m_text, m_buffer.data(), m_filled);
  if (m_from.form == Form::kLatin1 || LengthBelow(0x80, m_text.data(), m_filled) == m_filled) {
    m_size = m_filled;
    return;
  }
  m_units16.swap(m_text);
  DecodeChunks(m_units16.data(), m_filled, FindChunkOfAscii);
}

/// Decodes the block chunk by chunk, with a fault after each chunk but the last.
template <class T, class FindChunk> void Blocks::DecodeChunks(const T* p, ssize_t n, FindChunk findChunk) {
  const ssize_t unitSize = UnitSize(m_from.form);
  m_text.clear();
  m_utf8.clear();
  for (ssize_t i = 0;;) {
    const Chunk chunk = findChunk(p + i, n - i);
    if (m_mode != Mode::kCheck)
      AppendText(m_text, p + i, chunk.size);
    i += chunk.size;
    m_size = i * unitSize;
    if (chunk.reason == nullptr || !ContinuesAfter({m_size, chunk.reason}, chunk.malformed * unitSize))
      return;
    i += chunk.malformed;
  }
}

/// Notes a fault of length bytes, and replaces it in kReplace. @return whether decoding continues after it
bool Blocks::ContinuesAfter(const Fault& fault, ssize_t length) {
  if (m_faults == 0)
    m_fault = fault;
  if (m_mode != Mode::kReplace && m_mode != Mode::kDrop)
    return false;
  ++m_faults;
  m_hasUtf8 = false;
  m_isChanged = true;
  if (m_mode == Mode::kReplace)
    m_text.push_back(m_replacement);
  m_resumptions.push_back({fault.offset + length, m_text.size()});
  return true;
}

std::string_view Blocks::Utf8() {
  if (m_from.form == Form::kUtf8 && !m_isChanged)
    return Bytes();
  if (!m_hasUtf8)
    mirel::Utf8FromUtf16(m_utf8, m_text);
  m_hasUtf8 = true;
  return BytesOf(m_utf8);
}

ssize_t Blocks::OffsetOf(ssize_t index) const {
  Resumption last = {0, 0};
  for (const Resumption& resumption : m_resumptions)
    if (resumption.index <= index)
      last = resumption;
  return last.offset + EncodedSize(m_from.form, m_text.data() + last.index, index - last.index);
}

} // namespace transcode
