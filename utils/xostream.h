/// @file
/// xostream, the formatted text output stream.
///
/// It formats as the standard library's streams do, in the classic locale, and keeps no byte back: what a
/// member writes is with the sink when it returns. It knows no containers: strings write themselves to it.

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

/// What put() of a pointer to other characters returns, as the compiler names it.
struct ConvertToCharsOrVoidPointer {};

/// The characters that aren't printed by a pointer to them, and those of string16.
template <class C, class... Others>
using IfOneOf = std::enable_if_t<(std::is_same_v<std::remove_cv_t<C>, Others> || ...), int>;

} // namespace detail

/// Writes text to an IOutputStream, which must outlive it. Bad arguments stop the process with the text given
/// after "@pre", before anything is written. One thread at a time may use a stream.
///
/// @par Calls of the sink
/// Text that needs no indent reaches the sink in one call, text with indents in one for each 512 bytes or for
/// each line that is longer.
/// @par A sink that throws
/// ends the member that was called, and its exception goes to the caller. The bytes of the throwing call
/// count as not written, and what the member had still to write is dropped. The next member calls the sink
/// again; spaces of an indent that the sink has already taken aren't repeated.
///
/// @snippet examples/reference.cpp xostream
class MIREL_API xostream {
public:
  /// A function that does something to a stream, for use with <<.
  typedef xostream& (*Manipulator)(xostream&);

  /// @name Construction
  /// @snippet examples/reference.cpp closing
  /// @{

  /// Will write to os. A failed allocation throws std::bad_alloc.
  xostream(IOutputStream& os);
  /// Flushes nothing: all that was written is with the sink already.
  ~xostream();
  /// Flushes; after it nothing reaches the sink any more, and writing does nothing.
  void close();

  /// @}
  /// @name Writing bytes as they are
  /// Zeros included; width and precision don't matter, the indent does. A null pointer may come with a count
  /// of 0.
  /// @snippet examples/reference.cpp writing bytes
  /// @{

  /// The pn bytes at p, handed to the sink before it returns. @pre "pn == 0 || (pn > 0 && p != nullptr)"
  void write(const xchar* p, ssize_t pn);
  /// Hands the pn bytes at p to the sink before it returns. @pre "pn == 0 || (pn > 0 && p != nullptr)"
  void writebytes(const uint8* p, ssize_t pn);

  /// @}
  /// @name Writing values
  /// As `<<` of the standard streams, padded to width(), which is 0 again afterwards. Wide characters are
  /// written as UTF-8, and as U+FFFD where they are no code points by themselves. `<<` takes
  /// strings and manipulators only.
  /// @snippet examples/reference.cpp writing values
  /// @{

  void put(bool x);               ///< 0 or 1.
  void put(char x);               ///< One byte.
  void put(signed char x);        ///< One byte.
  void put(unsigned char x);      ///< One byte.
  void put(wchar_t x);            ///< A code point in UTF-8.
  void put(char16_t x);           ///< A code point in UTF-8; half a surrogate pair is U+FFFD.
  void put(char32_t x);           ///< A code point in UTF-8.
  void put(short x);              ///< A decimal number.
  void put(unsigned short x);     ///< A decimal number, as a char16 is, which is this type.
  void put(int x);                ///< A decimal number.
  void put(unsigned int x);       ///< A decimal number.
  void put(long x);               ///< A decimal number.
  void put(unsigned long x);      ///< A decimal number.
  void put(long long x);          ///< A decimal number.
  void put(unsigned long long x); ///< A decimal number.
  void put(float x);              ///< A number of precision() significant digits.
  void put(double x);             ///< A number of precision() significant digits.
  void put(long double x);        ///< A number of precision() significant digits.
  void put(const void* x);        ///< An address, in hexadecimal; that of characters doesn't compile.
  /// Writes a null-terminated string. @pre "x"
  void put(ConstString8Z x);
#ifdef __cpp_char8_t
  void put(char8_t x) { put(static_cast<char>(x)); }                     ///< One byte.
  void put(const char8_t* x) { put(reinterpret_cast<const char8*>(x)); } ///< As of the same chars.
#endif
  /// A counted run. @pre "pn == 0 || (pn > 0 && p != nullptr)"
  void put(const char8* p, ssize_t pn);
  /// A counted run, padded to the given width in place of width().
  /// @pre "pn == 0 || (pn > 0 && p != nullptr)"
  void put_internal(const xchar* p, ssize_t pn, ssize_t width);
  /// Calls the manipulator with this stream, which it returns.
  xostream& operator<<(Manipulator manipulator) { return manipulator(*this); }
  xostream& operator<<(std::nullptr_t) = delete; // a literal 0 is no manipulator
  /// @cond
  template <class C, detail::IfOneOf<C, signed char, unsigned char, wchar_t, char16_t, char32_t, char16> = 0>
  detail::ConvertToCharsOrVoidPointer put(C*) = delete;
  /// @endcond

  /// @}
  /// @name Line ends, flushing
  /// @snippet examples/reference.cpp line ends
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
  /// @snippet examples/reference.cpp format
  /// @{

  streamsize precision() const;       ///< Significant digits of a number with a point, 6 at first.
  streamsize precision(streamsize x); ///< Sets that number.
  streamsize width() const;           ///< Bytes that the next value is padded to, on the left; 0 at first.
  streamsize width(streamsize x);     ///< Sets that number for the next value.
  /// Sets the number of spaces that are put after each newline, before whatever comes next.
  /// @pre "0 <= indent"
  void Indent(ssize_t indent);
  ssize_t GetIndent() const; ///< That number of spaces, 0 at first.

  /// @}

private:
  xostream(const xostream&);
  xostream& operator=(const xostream&);

  IndentingOutputStreamToOStream* m_os;
};

} // namespace mirel
