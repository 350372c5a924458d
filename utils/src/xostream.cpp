#include <utils/xostream.h>

#include <cstring>
#include <locale>
#include <ostream>
#include <streambuf>
#include <string_view>

#include <utils/Precondition.h>
#include <utils/xstring.h>

namespace mirel {

namespace {

/// Hands bytes on without keeping any, with the indent between a newline and the next byte.
class IndentingBuffer : public std::streambuf {
public:
  explicit IndentingBuffer(IOutputStream& os) : sink(&os) {}

  IOutputStream* sink; ///< null once closed
  ssize_t indent = 0;

protected:
  int_type overflow(int_type c) override {
    const char byte = traits_type::to_char_type(c);
    xsputn(&byte, 1);
    return c;
  }

  std::streamsize xsputn(const char* p, std::streamsize n) override {
    const char* const end = p + n;
    while (sink && p != end) {
      if (atLineStart)
        WriteIndent();
      const char* const newline = Find(p, end, '\n');
      const char* const lineEnd = newline == end ? end : newline + 1;
      atLineStart = newline != end;
      sink->WriteStream(p, lineEnd - p);
      p = lineEnd;
    }
    return n;
  }

  int sync() override {
    if (sink)
      sink->FlushStream();
    return 0;
  }

private:
  void WriteIndent() {
    static constexpr std::string_view kSpaces = "                ";
    for (ssize_t n = indent; n > 0; n -= ssize_t(kSpaces.size()))
      sink->WriteStream(kSpaces.data(), n < ssize_t(kSpaces.size()) ? n : ssize_t(kSpaces.size()));
  }

  bool atLineStart = false;
};

} // namespace

class IndentingOutputStreamToOStream : public std::ostream {
public:
  explicit IndentingOutputStreamToOStream(IOutputStream& sink) : std::ostream(nullptr), buffer(sink) {
    rdbuf(&buffer);
    imbue(std::locale::classic());
    exceptions(badbit); // what the sink throws reaches the caller
  }

  void PutCodePoint(char32_t c) {
    const bool isPair = c > 0xFFFF;
    const char16 units[] = {static_cast<char16>(isPair ? 0xD7C0 + (c >> 10) : c),
                            static_cast<char16>(0xDC00 + (c & 0x3FF))};
    string8 text;
    if (c > 0x10FFFF || !Utf8FromUtf16(text, units, isPair ? 2 : 1))
      text = "\xEF\xBF\xBD";
    PutText(text.data(), text.size());
  }

  void PutText(const char* p, ssize_t pn) { *this << std::string_view(p, static_cast<std::size_t>(pn)); }

  /// Forgets that the sink has failed: it has been told, and may have recovered.
  IndentingOutputStreamToOStream& Ready() {
    clear();
    return *this;
  }

  IndentingBuffer buffer;
};

IOutputStream::~IOutputStream() = default;

xostream::xostream(IOutputStream& os) : m_os(new IndentingOutputStreamToOStream(os)) {}
xostream::~xostream() { delete m_os; }

void xostream::close() {
  flush();
  m_os->buffer.sink = nullptr;
}

void xostream::write(const xchar* p, ssize_t pn) {
  MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
  m_os->Ready().write(p, pn);
}
void xostream::writebytes(const uint8* p, ssize_t pn) { write(reinterpret_cast<const xchar*>(p), pn); }

void xostream::put(bool x) { m_os->Ready() << x; }
void xostream::put(char x) { m_os->Ready() << x; }
void xostream::put(signed char x) { m_os->Ready() << x; }
void xostream::put(unsigned char x) { m_os->Ready() << x; }
void xostream::put(wchar_t x) { m_os->Ready().PutCodePoint(static_cast<char32_t>(x)); }
void xostream::put(char16_t x) { m_os->Ready().PutCodePoint(x); }
void xostream::put(char32_t x) { m_os->Ready().PutCodePoint(x); }
void xostream::put(short x) { m_os->Ready() << x; }
void xostream::put(unsigned short x) { m_os->Ready() << x; }
void xostream::put(int x) { m_os->Ready() << x; }
void xostream::put(unsigned int x) { m_os->Ready() << x; }
void xostream::put(long x) { m_os->Ready() << x; }
void xostream::put(unsigned long x) { m_os->Ready() << x; }
void xostream::put(long long x) { m_os->Ready() << x; }
void xostream::put(unsigned long long x) { m_os->Ready() << x; }
void xostream::put(float x) { m_os->Ready() << x; }
void xostream::put(double x) { m_os->Ready() << x; }
void xostream::put(long double x) { m_os->Ready() << x; }
void xostream::put(const void* x) { m_os->Ready() << x; }
void xostream::put(ConstString8Z x) {
  MIREL_ASSERT(x);
  m_os->Ready() << x;
}
void xostream::put(const char8* p, ssize_t pn) { put_internal(p, pn, width()); }
void xostream::put_internal(const xchar* p, ssize_t pn, ssize_t width) {
  MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
  m_os->width(width);
  m_os->Ready().PutText(p, pn);
}

void xostream::flush() { m_os->Ready().flush(); }
void xostream::endl() {
  m_os->Ready().put('\n');
  flush();
}
void xostream::ends() { m_os->Ready().put('\0'); }

streamsize xostream::precision() const { return m_os->precision(); }
streamsize xostream::precision(streamsize x) { return m_os->precision(x); }
streamsize xostream::width() const { return m_os->width(); }
streamsize xostream::width(streamsize x) { return m_os->width(x); }
void xostream::Indent(ssize_t indent) {
  MIREL_ASSERT(0 <= indent);
  m_os->buffer.indent = indent;
}
ssize_t xostream::GetIndent() const { return m_os->buffer.indent; }

} // namespace mirel
