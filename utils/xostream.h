/// @file
/// xostream, the formatted text output stream.
///
/// It formats as the standard library's streams do, in the classic locale, and keeps no byte back: when a
/// member returns, the sink has what it wrote. Its interface names no containers: a string writes itself to
/// it.

#pragma once

#include <cstddef>
#include <type_traits>

#include "StreamInterfaces.h"
#include "xchar.h"

namespace mirel {

/// A count or position in a stream.
typedef int64 streamsize;

class IndentingOutputStreamToOStream;

namespace detail {

/// The return type of the deleted put(), so that the compiler's message says what to write instead.
struct ConvertToCharsOrVoidPointer {};

/// Lets a template take part in overload resolution only if C is one of the types.
template <class C, class... Types>
using IfOneOf = std::enable_if_t<(std::is_same_v<std::remove_cv_t<C>, Types> || ...), int>;

} // namespace detail

/// Writes text to an IOutputStream, which must outlive it. Bad arguments stop the process with the text given
/// after "@pre", before anything is written. One thread at a time may use a stream.
///
/// @par Calls of the sink
/// Text that needs neither indent nor padding reaches the sink in one call. Other text is gathered, with its
/// spaces, into calls of up to 512 bytes; a line of 512 bytes or more, or a whole text of that size while
/// there is no indent, has a call of its own.
/// @par A sink that throws
/// Its exception ends the member that was called, and goes to the caller. The bytes of the throwing call
/// count as not written, and the rest of what the member writes is dropped. The next member calls the sink
/// again, and doesn't repeat spaces of an indent that the sink has taken.
///
/// @snippet examples/reference.cpp xostream
class MIREL_API xostream {
public:
  /// A function that `<<` calls with the stream.
  typedef xostream& (*Manipulator)(xostream&);

  /// @name Construction
  /// @snippet examples/reference.cpp closing
  /// @{

  /// Makes a stream that writes to os. A failed allocation throws std::bad_alloc.
  xostream(IOutputStream& os);
  /// Flushes nothing: the sink has everything that was written.
  ~xostream();
  /// Flushes and lets go of the sink: from then on writing does nothing.
  void close();

  /// @}
  /// @name Writing bytes as they are
  /// Write bytes unformatted, nulls included: the indent applies, but not the width. A null pointer with a
  /// count of 0 writes nothing.
  /// @snippet examples/reference.cpp writing bytes
  /// @{

  /// Writes the pn bytes at p to the sink before it returns. @pre "pn == 0 || (pn > 0 && p != nullptr)"
  void write(const xchar* p, ssize_t pn);
  /// Writes the pn bytes at p to the sink, as write() does. @pre "pn == 0 || (pn > 0 && p != nullptr)"
  void writebytes(const uint8* p, ssize_t pn);

  /// @}
  /// @name Writing values
  /// Write values as `<<` of the standard streams does, padded to width(), which is 0 again afterwards. Wide
  /// characters are written as UTF-8, and as U+FFFD if they aren't Unicode scalar values. The `<<` of an
  /// xostream takes 8-bit strings and manipulators only.
  /// @snippet examples/reference.cpp writing values
  /// @{

  void put(bool x);               ///< Writes 0 or 1.
  void put(char x);               ///< Writes one byte.
  void put(signed char x);        ///< Writes one byte.
  void put(unsigned char x);      ///< Writes one byte.
  void put(wchar_t x);            ///< Writes a code point in UTF-8.
  void put(char16_t x);           ///< Writes a code point in UTF-8; a surrogate becomes U+FFFD.
  void put(char32_t x);           ///< Writes a code point in UTF-8.
  void put(short x);              ///< Writes a decimal number.
  void put(unsigned short x);     ///< Writes a decimal number, even for a char16, which is the same type.
  void put(int x);                ///< Writes a decimal number.
  void put(unsigned int x);       ///< Writes a decimal number.
  void put(long x);               ///< Writes a decimal number.
  void put(unsigned long x);      ///< Writes a decimal number.
  void put(long long x);          ///< Writes a decimal number.
  void put(unsigned long long x); ///< Writes a decimal number.
  void put(float x);              ///< Writes a number with at most precision() significant digits.
  void put(double x);             ///< Writes a number with at most precision() significant digits.
  void put(long double x);        ///< Writes a number with at most precision() significant digits.
  /// Writes an address in hexadecimal. A pointer to char or char8_t is text instead; one to other characters
  /// doesn't compile.
  void put(const void* x);
  /// Writes a null-terminated string. @pre "x"
  void put(ConstString8Z x);
#ifdef __cpp_char8_t
  void put(char8_t x) { put(static_cast<char>(x)); } ///< Writes one byte.
  /// Writes a null-terminated string of UTF-8. @pre "x"
  void put(const char8_t* x) { put(reinterpret_cast<const char8*>(x)); }
#endif
  /// Writes the pn bytes at p. @pre "pn == 0 || (pn > 0 && p != nullptr)"
  void put(const char8* p, ssize_t pn);
  /// Writes the pn bytes at p, padded to the given width instead of width().
  /// @pre "pn == 0 || (pn > 0 && p != nullptr)"
  void put_internal(const xchar* p, ssize_t pn, ssize_t width);
  /// Calls the manipulator with this stream and returns its result.
  xostream& operator<<(Manipulator manipulator) { return manipulator(*this); }
  xostream& operator<<(std::nullptr_t) = delete; // a literal 0 isn't a manipulator
  /// @cond
  template <class C, detail::IfOneOf<C, signed char, unsigned char, wchar_t, char16_t, char32_t, char16> = 0>
  detail::ConvertToCharsOrVoidPointer put(C*) = delete;
  /// @endcond

  /// @}
  /// @name Line ends, flushing
  /// @snippet examples/reference.cpp line ends
  /// @{

  /// Calls the sink's FlushStream().
  void flush();
  /// Writes a newline and flushes.
  void endl();
  /// Writes a null byte.
  void ends();

  /// @}
  /// @name Format
  /// precision() and width() return the old value when they set a new one.
  /// @snippet examples/reference.cpp format
  /// @{

  streamsize precision() const;       ///< The significant digits of a floating-point number, 6 at first.
  streamsize precision(streamsize x); ///< Sets the significant digits of floating-point numbers.
  streamsize width() const;       ///< The bytes that the next value is padded to, on the left; 0 at first.
  streamsize width(streamsize x); ///< Sets the bytes that the next value is padded to, on the left.
  /// Sets the number of spaces between each newline and the byte that follows. @pre "0 <= indent"
  void Indent(ssize_t indent);
  ssize_t GetIndent() const; ///< The number of spaces after a newline, 0 at first.

  /// @}

private:
  xostream(const xostream&);
  xostream& operator=(const xostream&);

  IndentingOutputStreamToOStream* m_os;
};

} // namespace mirel
