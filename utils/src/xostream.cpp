#include <utils/xostream.h>

#include <algorithm>
#include <cstring>
#include <limits>
#include <locale>
#include <ostream>
#include <streambuf>
#include <utility>

#include <utils/Precondition.h>
#include <utils/xstring.h>

namespace mirel {

namespace detail { // not an unnamed namespace: g++ warns of a member of such a type in unity builds

/// Buffers text in a block, so that the sink is called seldom, and adds the indent between a newline and the
/// next byte. A line of at least the block's size, or any text of that size while there is no indent, goes to
/// the sink without being copied.
class IndentingBuffer : public std::streambuf {
public:
  explicit IndentingBuffer(IOutputStream& os) : sink(&os) {}

  /// Writes the block to the sink. Every member of xostream that writes ends with this call.
  void FlushBlock() { WriteToSink(block, filled); }

  IOutputStream* sink; ///< null once closed
  ssize_t indent = 0;

protected:
  int_type overflow(int_type c) override {
    const char byte = traits_type::to_char_type(c);
    xsputn(&byte, 1);
    return traits_type::not_eof(c);
  }

  std::streamsize xsputn(const char* p, std::streamsize n) override {
    if (sink == nullptr)
      return n;
    for (const char* const end = p + n; p != end;) {
      AddIndent();
      const char* const newline = indent == 0 ? end : mirel::Find(p, end, '\n');
      const char* const lineEnd = newline == end ? end : newline + 1;
      Add(p, lineEnd - p);
      p = lineEnd;
    }
    return n;
  }

  int sync() override {
    FlushBlock();
    if (sink != nullptr)
      sink->FlushStream();
    return 0;
  }

private:
  static constexpr ssize_t kBlockSize = 512;
  static constexpr ssize_t kInLine = std::numeric_limits<ssize_t>::max();

  void AddIndent() {
    while (gathered < indent) {
      if (filled == kBlockSize)
        FlushBlock();
      const ssize_t n = std::min(indent - gathered, kBlockSize - filled);
      std::memset(block + filled, ' ', static_cast<std::size_t>(n));
      filled += n;
      gathered += n;
    }
  }

  /// Adds text that needs no indent.
  void Add(const char* p, ssize_t n) {
    if (n >= kBlockSize) {
      FlushBlock();
      gathered = After(p, n);
      return WriteToSink(p, n);
    }
    const ssize_t fitting = std::min(n, kBlockSize - filled);
    Copy(p, fitting);
    if (fitting < n) {
      FlushBlock();
      Copy(p + fitting, n - fitting);
    }
  }

  void Copy(const char* p, ssize_t n) {
    if (n <= 0)
      return;
    std::memcpy(block + filled, p, static_cast<std::size_t>(n));
    filled += n;
    gathered = After(p, n);
  }

  static ssize_t After(const char* p, ssize_t n) { return p[n - 1] == '\n' ? 0 : kInLine; }

  /// Writes bytes to the sink. If it throws, they count as not written and are dropped, because the exception
  /// tells the caller of them. The next bytes get the part of the indent that is still missing.
  void WriteToSink(const char* p, ssize_t n) {
    const ssize_t after = std::exchange(gathered, written);
    filled = 0;
    if (sink != nullptr && n > 0)
      sink->WriteStream(p, n);
    gathered = written = after;
  }

  char block[kBlockSize];
  ssize_t filled = 0;
  ssize_t written = kInLine;  ///< how much of the line's indent the sink has; kInLine after the indent
  ssize_t gathered = kInLine; ///< how much of the line's indent the sink will have once it has the block
};

} // namespace detail

namespace {

/// Clamps x to what the standard library's std::streamsize holds, which on 32-bit processors has 32 bits.
std::streamsize ForStandard(streamsize x) {
  using Limits = std::numeric_limits<std::streamsize>;
  return static_cast<std::streamsize>(std::clamp<streamsize>(x, Limits::min(), Limits::max()));
}

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

  void PutText(const char* p, ssize_t pn) {
    const streamsize padding = buffer.sink != nullptr ? std::max<streamsize>(width(), 0) - pn : 0;
    width(0);
    for (streamsize k = 0; k < padding; ++k)
      buffer.sputc(' ');
    PutBytes(p, pn);
  }

  void PutBytes(const char* p, ssize_t pn) {
    buffer.sputn(p, pn);
    buffer.FlushBlock();
  }

  /// Writes a number or an address. It clears the state first: a sink that threw within an earlier `<<` has
  /// left badbit.
  template <class X> void Put(X x) {
    clear();
    *this << x;
    buffer.FlushBlock();
  }

  detail::IndentingBuffer buffer;
};

IOutputStream::~IOutputStream() = default;

xostream::xostream(IOutputStream& os) : m_os(new IndentingOutputStreamToOStream(os)) {}
xostream::~xostream() { delete m_os; }

void xostream::close() {
  m_os->buffer.FlushBlock();
  if (IOutputStream* const sink = std::exchange(m_os->buffer.sink, nullptr))
    sink->FlushStream();
}

void xostream::write(const xchar* p, ssize_t pn) {
  MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
  m_os->PutBytes(p, pn);
}
void xostream::writebytes(const uint8* p, ssize_t pn) { write(reinterpret_cast<const xchar*>(p), pn); }

void xostream::put(bool x) { m_os->Put(x); }
void xostream::put(char x) { m_os->PutText(&x, 1); }
void xostream::put(signed char x) { put(static_cast<char>(x)); }
void xostream::put(unsigned char x) { put(static_cast<char>(x)); }
void xostream::put(wchar_t x) { m_os->PutCodePoint(static_cast<char32_t>(x)); }
void xostream::put(char16_t x) { m_os->PutCodePoint(x); }
void xostream::put(char32_t x) { m_os->PutCodePoint(x); }
void xostream::put(short x) { m_os->Put(x); }
void xostream::put(unsigned short x) { m_os->Put(x); }
void xostream::put(int x) { m_os->Put(x); }
void xostream::put(unsigned int x) { m_os->Put(x); }
void xostream::put(long x) { m_os->Put(x); }
void xostream::put(unsigned long x) { m_os->Put(x); }
void xostream::put(long long x) { m_os->Put(x); }
void xostream::put(unsigned long long x) { m_os->Put(x); }
void xostream::put(float x) { m_os->Put(x); }
void xostream::put(double x) { m_os->Put(x); }
void xostream::put(long double x) { m_os->Put(x); }
void xostream::put(const void* x) { m_os->Put(x); }
void xostream::put(ConstString8Z x) {
  MIREL_ASSERT(x);
  m_os->PutText(x, GetStringLength(x));
}
void xostream::put(const char8* p, ssize_t pn) { put_internal(p, pn, m_os->width()); }
void xostream::put_internal(const xchar* p, ssize_t pn, ssize_t width) {
  MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
  m_os->width(width);
  m_os->PutText(p, pn);
}

void xostream::flush() { m_os->buffer.pubsync(); }
void xostream::endl() {
  m_os->PutBytes("\n", 1);
  flush();
}
void xostream::ends() { m_os->PutBytes("", 1); }

streamsize xostream::precision() const { return m_os->precision(); }
streamsize xostream::precision(streamsize x) { return m_os->precision(ForStandard(x)); }
streamsize xostream::width() const { return m_os->width(); }
streamsize xostream::width(streamsize x) { return m_os->width(ForStandard(x)); }
void xostream::Indent(ssize_t indent) {
  MIREL_ASSERT(0 <= indent);
  m_os->buffer.indent = indent;
}
ssize_t xostream::GetIndent() const { return m_os->buffer.indent; }

} // namespace mirel
