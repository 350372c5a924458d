#include "Statistics.h"

#include <algorithm>
#include <iterator>
#include <limits>
#include <type_traits>

#include <utils/xostream.h>

namespace transcode {

namespace {

using mirel::char16;

/// Counts the units of [p, end) that are of a kind. The inner loop's counter is as wide as a unit, so that
/// compilers vectorise the loop well.
template <class T, class Predicate> ssize_t Count(const T* p, const T* end, Predicate isOfKind) {
  using Counter = std::conditional_t<sizeof(T) == 1, unsigned char, char16>;
  constexpr ssize_t kMax = std::numeric_limits<Counter>::max();
  ssize_t total = 0;
  while (p != end) {
    const T* const stop = p + std::min<ssize_t>(end - p, kMax);
    Counter count = 0;
    for (; p != stop; ++p)
      count = static_cast<Counter>(count + isOfKind(*p));
    total += count;
  }
  return total;
}

/// A sink that collects what is written.
struct MemorySink : mirel::IOutputStream {
  void WriteStream(const void* address, ssize_t count) override {
    text.append(static_cast<const char*>(address), count);
  }
  void FlushStream() override {}
  string8 text;
};

} // namespace

void Statistics::Advance(const Blocks& block, ssize_t bytes) {
  const auto each = [](const auto*, ssize_t n) { return n; };
  const auto codePoints = [](const auto* p, ssize_t n) { return mirel::CountCodePoints(p, n); };
  m_bytes += bytes;
  switch (block.From()) {
  case Form::kUtf8: AdvanceOver(block.Bytes().data(), bytes, codePoints); break;
  case Form::kUtf16: AdvanceOver(block.Units16().data(), bytes / 2, codePoints); break;
  case Form::kUtf32: AdvanceOver(block.Units32().data(), bytes / 4, each); break;
  case Form::kLatin1:
  case Form::kAscii: AdvanceOver(block.Bytes().data(), bytes, each); break;
  }
}

template <class T, class CountColumns>
void Statistics::AdvanceOver(const T* p, ssize_t n, CountColumns countColumns) {
  const ssize_t newlines = Count(p, p + n, [](T unit) { return unit == '\n'; });
  const T* lastLine = p;
  if (newlines > 0) {
    lastLine = std::find(std::reverse_iterator(p + n), std::reverse_iterator(p), T('\n')).base();
    m_column = 0;
  }
  m_newlines += newlines;
  m_column += countColumns(lastLine, p + n - lastLine);
}

std::string Statistics::PlaceIn(const Blocks& block, ssize_t offset) const {
  Statistics there = *this;
  there.Advance(block, offset);
  return there.Place();
}

void Statistics::Examine(Blocks& block) {
  const string16& text = block.Text();
  m_utf8Units += static_cast<ssize_t>(block.Utf8().size());
  m_utf16Units += text.size();
  m_codePoints += mirel::CountCodePoints(text);
  m_asciiCodePoints += Count(text.begin(), text.end(), [](char16 unit) { return unit < 0x80; });
  for (const char16* p = text.begin(); p != text.end();) {
    const char16* const lineEnd = mirel::Find(p, text.end(), char16('\n'));
    m_line += mirel::CountCodePoints(p, lineEnd - p);
    m_longestLine = std::max(m_longestLine, m_line);
    p = lineEnd;
    if (p != text.end()) {
      m_line = 0;
      ++p;
    }
  }
  m_isSameAfterRoundTrip = IsSameAfterRoundTrip(block) && m_isSameAfterRoundTrip;
}

/// Converts the block back, and returns whether that gives the bytes of the input.
bool Statistics::IsSameAfterRoundTrip(Blocks& block) {
  const bool isUtf8 = block.From() == Form::kUtf8; // the text has been converted to UTF-16 already
  if (!isUtf8)
    mirel::Utf16FromUtf8(m_roundTripText, block.Utf8());
  return Encode(isUtf8 ? block.Text() : m_roundTripText, block.From(), block.Order(), m_scratch) ==
         block.Bytes();
}

std::string Statistics::Place() const {
  return "byte " + std::to_string(m_bytes) + " (line " + std::to_string(m_newlines + 1) + ", column " +
         std::to_string(m_column + 1) + ")";
}

string8 Statistics::Report(const std::string& title) const {
  MemorySink sink;
  mirel::xostream os(sink);
  const auto row = [&os](const char* name, int64 value) {
    os << name;
    os.width(12);
    os.put(value);
    os.endl();
  };
  os << title.c_str() << ":";
  os.Indent(2);
  os.endl();
  row("bytes                 ", m_bytes);
  row("UTF-8 code units      ", m_utf8Units);
  row("UTF-16 code units     ", m_utf16Units);
  row("code points           ", m_codePoints);
  row("lines                 ", m_newlines + (m_column > 0));
  row("longest line          ", m_longestLine);
  os << "ASCII code points     ";
  os.width(12);
  os.precision(4);
  os.put(m_codePoints == 0
             ? 0.0
             : 100.0 * static_cast<double>(m_asciiCodePoints) / static_cast<double>(m_codePoints));
  os << " %";
  os.endl();
  os << "round trip            " << (m_isSameAfterRoundTrip ? "  same bytes" : " OTHER BYTES");
  os.Indent(0);
  os.endl();
  return sink.text;
}

} // namespace transcode
