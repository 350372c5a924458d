#include "Blocks.h"

#include <algorithm>
#include <cstring>

namespace transcode {

namespace {

using mirel::char16;

/// What a pipe holds. A block stays in the cache while it is decoded, counted and written; from half to four
/// times the size was no faster.
constexpr ssize_t kBlock = 1 << 16;
/// The most bytes of a sequence that isn't whole.
constexpr ssize_t kMaxUnfinished = 3;

unsigned char Byte(char c) { return static_cast<unsigned char>(c); }

/// How many of the n bytes at p may belong to a sequence that the last of them don't finish. Whether it is
/// well-formed will be seen when the rest is there.
ssize_t Unfinished(const char* p, ssize_t n, Encoding encoding) {
  switch (encoding) {
  case Encoding::kUtf8:
    for (ssize_t k = 1; k <= std::min(n, kMaxUnfinished); ++k) {
      const unsigned byte = Byte(p[n - k]);
      if (byte >= 0xC0) {
        const ssize_t length = byte >= 0xF0 ? 4 : byte >= 0xE0 ? 3 : 2;
        return k < length ? k : 0;
      }
      if (byte < 0x80)
        break;
    }
    return 0;
  case Encoding::kUtf16Le:
  case Encoding::kUtf16Be: {
    const ssize_t odd = n % 2;
    const bool isUnit = n >= 2;
    const unsigned high = isUnit ? Byte(p[n - odd - (encoding == Encoding::kUtf16Be ? 2 : 1)]) : 0;
    const bool isLeadSurrogate = (high & 0xFC) == 0xD8;
    return odd + (isLeadSurrogate ? 2 : 0);
  }
  case Encoding::kAscii: break;
  }
  return 0;
}

bool IsUtf16(Encoding encoding) { return encoding == Encoding::kUtf16Le || encoding == Encoding::kUtf16Be; }

/// Whether the machine keeps units in the other byte order than the encoding does.
bool IsOtherOrder(Encoding encoding) {
  const char16 one = 1;
  char first;
  std::memcpy(&first, &one, 1);
  return (first == 1) != (encoding == Encoding::kUtf16Le);
}

void ExchangeBytes(string16& units) {
  for (char16& unit : units)
    unit = static_cast<char16>(unit << 8 | unit >> 8);
}

std::string_view BytesOf(const string8& s) { return {s.data(), static_cast<std::size_t>(s.size())}; }

std::string_view BytesOf(const string16& s) {
  return {reinterpret_cast<const char*>(s.data()), 2 * static_cast<std::size_t>(s.size())};
}

/// How many of the n bytes at p stand before the first that isn't ASCII.
ssize_t AsciiLength(const char* p, ssize_t n) {
  unsigned char all = 0;
  for (ssize_t i = 0; i < n; ++i)
    all = static_cast<unsigned char>(all | Byte(p[i]));
  if (all < 0x80)
    return n;
  return std::find_if(p, p + n, [](char c) { return Byte(c) >= 0x80; }) - p;
}

} // namespace

Blocks::Blocks(Input& input, Encoding from)
    : m_input(input), m_from(from), m_buffer(kBlock + kMaxUnfinished, '\0') {}

bool Blocks::Next() {
  bool isEnd = false;
  do {
    m_buffer.move(0, m_size, m_filled - m_size);
    m_filled -= m_size;
    const ssize_t count = m_input.Read(m_buffer.data() + m_filled, kBlock);
    m_filled += count;
    isEnd = count == 0;
    m_size = isEnd ? m_filled : m_filled - Unfinished(m_buffer.data(), m_filled, m_from);
  } while (m_size == 0 && !isEnd);
  const ssize_t wellFormed = Decode();
  m_isWellFormed = wellFormed == m_size;
  m_size = wellFormed;
  return m_filled != 0;
}

/// Converts the block as far as it is well-formed. @return how many bytes that are
ssize_t Blocks::Decode() {
  const char* const p = m_buffer.data();
  switch (m_from) {
  case Encoding::kUtf8:
    if (mirel::Utf16FromUtf8(m_text, p, m_size))
      return m_size;
    mirel::Utf8FromUtf16(m_back, m_text.data(), m_text.size());
    return m_back.size();
  case Encoding::kUtf16Le:
  case Encoding::kUtf16Be:
    m_text.resize(m_size / 2, 0);
    if (m_size >= 2)
      std::memcpy(m_text.data(), p, 2 * static_cast<std::size_t>(m_text.size()));
    if (IsOtherOrder(m_from))
      ExchangeBytes(m_text);
    if (!mirel::Utf8FromUtf16(m_utf8, m_text.data(), m_text.size()))
      mirel::Utf16FromUtf8(m_text, m_utf8.data(), m_utf8.size());
    return 2 * m_text.size();
  case Encoding::kAscii: break;
  }
  const ssize_t length = AsciiLength(p, m_size);
  mirel::Utf16FromAscii(m_text, p, length);
  return length;
}

std::string_view Blocks::Utf8() const { return IsUtf16(m_from) ? BytesOf(m_utf8) : Bytes(); }

std::string_view Blocks::In(Encoding to) {
  if (!IsUtf16(to))
    return Utf8();
  if (!IsOtherOrder(to))
    return BytesOf(m_text);
  m_otherOrder = m_text;
  ExchangeBytes(m_otherOrder);
  return BytesOf(m_otherOrder);
}

bool Blocks::ComesBack() {
  if (!IsUtf16(m_from)) {
    mirel::Utf8FromUtf16(m_back, m_text.data(), m_text.size());
    return BytesOf(m_back) == Bytes();
  }
  mirel::Utf16FromUtf8(m_otherOrder, m_utf8.data(), m_utf8.size());
  if (IsOtherOrder(m_from))
    ExchangeBytes(m_otherOrder);
  return BytesOf(m_otherOrder) == Bytes();
}

} // namespace transcode
