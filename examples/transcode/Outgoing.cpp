#include "Outgoing.h"

namespace transcode {

void Outgoing::BeginFile() {
  m_unmappableCount = 0;
  m_firstUnmappable.reset();
}

std::string_view Outgoing::Encode(Blocks& block) {
  const bool hasMark = block.BeginsWithMark() && m_to.IsUnicode(); // Fit() leaves it out
  const bool getsMark = !m_hasBegun && (m_mark == Mark::kAdd || (m_mark == Mark::kKeep && hasMark));
  const string16& text = m_to.IsUnicode() ? block.Text() : Fit(block);
  if (!m_hasBegun && m_to.IsByMark()) // without a mark it is read as big-endian
    m_order = getsMark ? ByteOrder::kLittle : ByteOrder::kBig;
  m_hasBegun = true;
  const bool isAsItWas = m_lineEnds == LineEnds::kKeep && getsMark == hasMark;
  if (isAsItWas && m_to.form == Form::kUtf8)
    return block.Utf8();
  if (isAsItWas)
    return transcode::Encode(text, m_to.form, m_order, m_scratch);
  m_text.clear();
  if (getsMark)
    m_text.push_back(kByteOrderMark);
  AppendLines(text.begin() + hasMark, text.end());
  return transcode::Encode(m_text, m_to.form, m_order, m_scratch);
}

std::string_view Outgoing::EndFile() {
  m_text.clear();
  if (m_keepsCr)
    m_text.push_back('\r');
  m_keepsCr = false;
  return transcode::Encode(m_text, m_to.form, m_order, m_scratch);
}

/// Leaves out the mark, and replaces, drops or stops at code points that the encoding lacks.
const string16& Outgoing::Fit(const Blocks& block) {
  const string16& text = block.Text();
  m_firstUnmappable.reset();
  m_fitting.clear();
  for (const char16* p = text.begin() + block.BeginsWithMark();;) {
    const char16* const begin = p;
    p += LengthBelow(m_to.Limit(), p, text.end() - p);
    m_fitting.push_back(begin, p);
    if (p == text.end())
      return m_fitting;
    const char32_t codePoint = *mirel::CodePoints(p, text.end() - p).begin();
    if (m_unmappableCount == 0)
      m_firstUnmappable = Unmappable{p - text.begin(), codePoint};
    if (m_mode == Mode::kConvert)
      return m_fitting;
    ++m_unmappableCount;
    if (m_mode == Mode::kReplace)
      m_fitting.push_back('?');
    p += codePoint < 0x10000 ? 1 : 2;
  }
}

/// A line ends with a newline, or a carriage return and a newline. Any other carriage return is text.
void Outgoing::AppendLines(const char16* p, const char16* end) {
  if (m_lineEnds == LineEnds::kKeep) {
    m_text.push_back(p, end);
    return;
  }
  for (;;) {
    const char16* const newline = mirel::Find(p, end, char16('\n'));
    Append(p, newline);
    if (newline == end)
      return;
    m_keepsCr = false;
    if (m_lineEnds == LineEnds::kCrLf)
      m_text.push_back('\r');
    m_text.push_back('\n');
    p = newline + 1;
  }
}

/// Appends text without newlines; a carriage return at its end may belong to one.
void Outgoing::Append(const char16* p, const char16* end) {
  if (p == end)
    return;
  if (m_keepsCr)
    m_text.push_back('\r');
  m_keepsCr = end[-1] == '\r';
  m_text.push_back(p, end - m_keepsCr);
}

} // namespace transcode
