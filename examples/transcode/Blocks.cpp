#include "Blocks.h"

#include <algorithm>
#include <cstring>

namespace transcode {

namespace {

using mirel::char16;

/// What a pipe holds. A block stays in the cache while it is decoded, counted and written; from half to four
/// times the size was no faster.
constexpr ssize_t kBlock = 1 << 16;
/// The most bytes that a block leaves to the next one: of a UTF-8 sequence, or a unit and a half of UTF-16.
constexpr ssize_t kMaxUnfinished = 3;

unsigned char Byte(char c) { return static_cast<unsigned char>(c); }

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

mirel::OnMalformed PolicyOf(Mode mode) {
  return mode == Mode::kReplace ? mirel::OnMalformed::kReplace : mirel::OnMalformed::kStop;
}

} // namespace

Blocks::Blocks(Input& input, Encoding from, Mode mode)
    : m_input(input), m_from(from), m_mode(mode), m_toUtf16(PolicyOf(mode)), m_toUtf8(PolicyOf(mode)),
      m_buffer(kBlock + kMaxUnfinished, '\0') {}

bool Blocks::Next() {
  bool isEnd = false;
  m_fault.reset();
  do {
    m_buffer.move(0, m_size, m_filled - m_size);
    m_filled -= m_size;
    const ssize_t fed = m_filled, count = m_input.Read(m_buffer.data() + fed, kBlock);
    m_filled += count;
    isEnd = count == 0;
    if (m_filled == 0)
      return false;
    Decode(fed, isEnd);
  } while (m_size == 0 && !isEnd && !m_fault);
  return true;
}

/// Sets the block to what is well-formed or replaced; its first bytes, as many as fed, were seen before.
void Blocks::Decode(ssize_t fed, bool isEnd) {
  const int64 before = m_replacements;
  if (IsUtf16(m_from))
    DecodeUtf16(isEnd);
  else if (m_from == Encoding::kAscii)
    DecodeAscii();
  else if (m_mode == Mode::kCheck)
    m_size = Check(m_buffer.data(), m_filled, isEnd);
  else
    DecodeUtf8(fed, isEnd);
  m_isReplaced = m_replacements != before;
  if (!m_isReplaced)
    return;
  if (IsUtf16(m_from))
    mirel::Utf16FromUtf8(m_text, m_utf8);
  else
    mirel::Utf8FromUtf16(m_utf8, m_text);
}

void Blocks::DecodeUtf8(ssize_t fed, bool isEnd) {
  const int64 begin = m_toUtf16.position() - fed;
  m_text.clear();
  if (isEnd)
    m_toUtf16.Finish(m_text);
  else
    m_toUtf16.Append(m_text, m_buffer.data() + fed, m_filled - fed);
  m_size = m_filled - m_toUtf16.pending();
  if (Note(m_toUtf16, begin, 1))
    m_size = m_fault->offset;
}

void Blocks::DecodeUtf16(bool isEnd) {
  m_text.resize(m_filled / 2, 0);
  if (m_filled >= 2)
    std::memcpy(m_text.data(), m_buffer.data(), 2 * static_cast<std::size_t>(m_text.size()));
  if (IsOtherOrder(m_from))
    ExchangeBytes(m_text);
  const ssize_t fed = m_toUtf8.pending();
  const int64 begin = m_toUtf8.position() - fed;
  m_utf8.clear();
  if (m_mode == Mode::kCheck) {
    m_text.resize(Check(m_text.data(), m_text.size(), isEnd), 0);
  } else {
    m_toUtf8.Append(m_utf8, m_text.data() + fed, m_text.size() - fed);
    if (isEnd)
      m_toUtf8.Finish(m_utf8);
    m_text.resize(m_text.size() - m_toUtf8.pending(), 0);
    if (Note(m_toUtf8, begin, 2))
      m_text.resize(m_fault->offset / 2, 0);
  }
  m_size = 2 * m_text.size();
  if (isEnd && m_filled % 2 != 0 && m_size + 1 == m_filled)
    EndOddly();
}

/// The input ends with half a unit.
void Blocks::EndOddly() {
  if (m_mode == Mode::kReplace) {
    mirel::AppendCodePoint(m_utf8, 0xFFFD);
    m_size = m_filled;
  }
  if (m_replacements == 0)
    m_fault = Fault{m_filled - 1, Describe(mirel::MalformedReason::kTruncated)};
  m_replacements += m_mode == Mode::kReplace;
}

void Blocks::DecodeAscii() {
  m_size = AsciiLength(m_buffer.data(), m_filled);
  mirel::Utf16FromAscii(m_text, m_buffer.data(), m_size);
  if (m_size == m_filled)
    return;
  if (m_replacements == 0)
    m_fault = Fault{m_size, "byte above 7F"};
  if (m_mode != Mode::kReplace)
    return;
  for (; m_size < m_filled; ++m_size) {
    const bool isAscii = Byte(m_buffer[m_size]) < 0x80;
    mirel::AppendCodePoint(m_text, isAscii ? Byte(m_buffer[m_size]) : 0xFFFD);
    m_replacements += !isAscii;
  }
}

/// How many of n units are well-formed. Those that the next block may complete, as a stream would keep them,
/// are left for then.
template <class T> ssize_t Blocks::Check(const T* p, ssize_t n, bool isEnd) {
  const ssize_t size = mirel::FindMalformed(p, n);
  if (size < 0)
    return n;
  const mirel::MalformedText malformed = mirel::ExplainMalformed(p, n, size);
  std::conditional_t<sizeof(T) == 1, mirel::Utf8Stream, mirel::Utf16Stream> rest;
  std::conditional_t<sizeof(T) == 1, string16, string8> none;
  if (isEnd || size + malformed.length < n || !rest.Append(none, p + size, malformed.length))
    m_fault = Fault{size * ssize_t(sizeof(T)), Describe(malformed.reason)};
  return size;
}

/// Notes what a stream has found in a block that begins with the given unit. @return whether the block ends
/// there
template <class Stream> bool Blocks::Note(const Stream& stream, int64 begin, ssize_t unitBytes) {
  const mirel::MalformedText& malformed = stream.malformed();
  if (malformed.offset >= begin && m_replacements == 0)
    m_fault = Fault{static_cast<ssize_t>(malformed.offset - begin) * unitBytes, Describe(malformed.reason)};
  m_replacements = stream.replacements();
  return m_fault && m_mode != Mode::kReplace;
}

std::string_view Blocks::Utf8() const { return IsUtf16(m_from) || m_isReplaced ? BytesOf(m_utf8) : Bytes(); }

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
