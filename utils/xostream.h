/// @file
/// xostream, the formatted text output stream.
///
/// It formats as the standard library's streams do, in the classic locale, and hands every byte to its sink
/// at once. It knows no containers: strings write themselves to it.

#pragma once

#include <cstddef>

#include <utils/StreamInterfaces.h>
#include <utils/xchar.h>

namespace mirel {

/// A count or position in a stream.
typedef int64 streamsize;

class IndentingOutputStreamToOStream;

/// Writes text to an IOutputStream, which must outlive it. What the sink throws leaves the member that was
/// called; the next one tries again.
class MIREL_API xostream {
public:
  /// A function that does something to a stream, for use with <<.
  typedef xostream& (*Manipulator)(xostream&);

  /// @name Construction
  /// @{

  xostream(IOutputStream& os);
  /// Flushes nothing: all that was written is with the sink already.
  ~xostream();
  /// Flushes; after it nothing reaches the sink any more.
  void close();

  /// @}
  /// @name Writing bytes as they are
  /// Zeros included; width and precision don't matter, the indent does. A null pointer may come with a count
  /// of 0.
  /// @pre "pn == 0 || (pn > 0 && p != nullptr)"
  /// @{

  void write(const xchar* p, ssize_t pn);
  void writebytes(const uint8* p, ssize_t pn);

  /// @}
  /// @name Writing values
  /// As `<<` of the standard streams, padded to width(), which is 0 again afterwards. Wide characters are
  /// written as UTF-8, and as U+FFFD where they are no code points by themselves.
  /// @{

  void put(bool x);
  void put(char x);
  void put(signed char x);
  void put(unsigned char x);
  void put(wchar_t x);
  void put(char16_t x);
  void put(char32_t x);
  void put(short x);
  void put(unsigned short x);
  void put(int x);
  void put(unsigned int x);
  void put(long x);
  void put(unsigned long x);
  void put(long long x);
  void put(unsigned long long x);
  void put(float x);
  void put(double x);
  void put(long double x);
  void put(const void* x);
  /// A zero-terminated run. @pre "x"
  void put(ConstString8Z x);
  /// A counted run. @pre "pn == 0 || (pn > 0 && p != nullptr)"
  void put(const char8* p, ssize_t pn);
  /// A counted run, padded to the given width in place of width().
  void put_internal(const xchar* p, ssize_t pn, ssize_t width);
  xostream& operator<<(Manipulator manipulator) { return manipulator(*this); }
  xostream& operator<<(std::nullptr_t) = delete; // a literal 0 is no manipulator

  /// @}
  /// @name Line ends, flushing
  /// @{

  /// Passes the sink's FlushStream() on.
  void flush();
  /// A newline and a flush.
  void endl();
  /// A zero byte.
  void ends();

  /// @}
  /// @name Format
  /// The setters return the old value.
  /// @{

  streamsize precision() const;
  streamsize precision(streamsize x);
  streamsize width() const;
  streamsize width(streamsize x);
  /// Sets the number of spaces that are put after each newline, before whatever comes next. @pre "0 <=
  /// indent"
  void Indent(ssize_t indent);
  ssize_t GetIndent() const;

  /// @}

private:
  xostream(const xostream&);
  xostream& operator=(const xostream&);

  IndentingOutputStreamToOStream* m_os;
};

} // namespace mirel
