/// @file
/// UTF-8 and UTF-16 text: where it is malformed, how long it is in the other encoding, and conversions that
/// append, that replace malformed text, and that take the standard library's views.
///
/// It adds to the conversions of utils/xstring.h what a program that handles text needs around them, and
/// includes the ranges of code points (utils/CodePoints.h) and the conversions of text in pieces
/// (utils/UtfStream.h). It has no state, and allocates nothing but what a destination needs.
///
/// What is well-formed is defined by the Unicode Standard: table 3-7 for UTF-8, definition D91 for UTF-16.
/// Each function takes a pointer and a count of units, or a string; in 8 bits also a std::string_view, and so
/// a std::string and a literal. A null pointer with a count of 0 is an empty text. Every function takes
/// linear time, and looks at no unit outside the text.

#pragma once

#include <cstddef>
#include <string_view>

#include "CodePoints.h"
#include "Malformed.h"
#include "UtfStream.h"
#include "xstring.h"

namespace mirel {

/// @name Checking
/// @snippet examples/reference.cpp checking
/// @{

/// Where the first sequence begins that isn't well-formed, in units, or npos (-1) where there is none.
/// @pre "pn == 0 || (pn > 0 && p != nullptr)"
MIREL_API ssize_t FindMalformed(const char8* p, ssize_t pn);
/// Finds malformed UTF-16. @pre "pn == 0 || (pn > 0 && p != nullptr)"
MIREL_API ssize_t FindMalformed(const char16* p, ssize_t pn);
/// Finds malformed text in a string.
inline ssize_t FindMalformed(const xvector<char8>& text) { return FindMalformed(text.data(), text.size()); }
/// Finds malformed text in a string.
inline ssize_t FindMalformed(const xvector<char16>& text) { return FindMalformed(text.data(), text.size()); }
/// Finds malformed text in a view.
inline ssize_t FindMalformed(std::string_view text) {
  return FindMalformed(text.data(), detail::SizeOf(text));
}
ssize_t FindMalformed(std::nullptr_t) = delete;

/// Whether the text is well-formed UTF-8. @pre "pn == 0 || (pn > 0 && p != nullptr)"
inline bool IsWellFormed(const char8* p, ssize_t pn) { return FindMalformed(p, pn) < 0; }
/// Whether the text is well-formed UTF-16. @pre "pn == 0 || (pn > 0 && p != nullptr)"
inline bool IsWellFormed(const char16* p, ssize_t pn) { return FindMalformed(p, pn) < 0; }
/// Whether a string is well-formed.
inline bool IsWellFormed(const xvector<char8>& text) { return FindMalformed(text) < 0; }
/// Whether a string is well-formed.
inline bool IsWellFormed(const xvector<char16>& text) { return FindMalformed(text) < 0; }
/// Whether the text of a view is well-formed.
inline bool IsWellFormed(std::string_view text) { return FindMalformed(text) < 0; }
bool IsWellFormed(std::nullptr_t) = delete;

/// What is wrong with the sequence that begins at an offset: for a result of FindMalformed(), or any other
/// boundary of sequences. For a well-formed one the reason is kNone, and the length its own. Constant time.
/// @pre "pn == 0 || (pn > 0 && p != nullptr)", then "0 <= offset && offset < pn"
MIREL_API MalformedText ExplainMalformed(const char8* p, ssize_t pn, ssize_t offset);
/// Explains a sequence of UTF-16.
/// @pre "pn == 0 || (pn > 0 && p != nullptr)", then "0 <= offset && offset < pn"
MIREL_API MalformedText ExplainMalformed(const char16* p, ssize_t pn, ssize_t offset);
/// Explains a sequence of a string. @pre "0 <= offset && offset < pn", where pn is its size
inline MalformedText ExplainMalformed(const xvector<char8>& text, ssize_t offset) {
  return ExplainMalformed(text.data(), text.size(), offset);
}
/// Explains a sequence of a string. @pre "0 <= offset && offset < pn", where pn is its size
inline MalformedText ExplainMalformed(const xvector<char16>& text, ssize_t offset) {
  return ExplainMalformed(text.data(), text.size(), offset);
}
/// Explains a sequence of a view's text. @pre "0 <= offset && offset < pn", where pn is its size
inline MalformedText ExplainMalformed(std::string_view text, ssize_t offset) {
  return ExplainMalformed(text.data(), detail::SizeOf(text), offset);
}
MalformedText ExplainMalformed(std::nullptr_t, ssize_t) = delete;

/// @}
/// @name Counting
/// Lengths are those of what the lossy conversions give, which on well-formed text is what the strict ones
/// do.
/// @snippet examples/reference.cpp counting
/// @{

/// The units of a UTF-8 text in UTF-16. @pre "pn == 0 || (pn > 0 && p != nullptr)"
MIREL_API ssize_t Utf16Length(const char8* p, ssize_t pn);
/// The units of a string in UTF-16.
inline ssize_t Utf16Length(const xvector<char8>& text) { return Utf16Length(text.data(), text.size()); }
/// The units of a view's text in UTF-16.
inline ssize_t Utf16Length(std::string_view text) { return Utf16Length(text.data(), detail::SizeOf(text)); }
ssize_t Utf16Length(std::nullptr_t) = delete;

/// The units of a UTF-16 text in UTF-8, but PTRDIFF_MAX where a program of 32 bits can't count them.
/// @pre "pn == 0 || (pn > 0 && p != nullptr)"
MIREL_API ssize_t Utf8Length(const char16* p, ssize_t pn);
/// The units of a string in UTF-8.
inline ssize_t Utf8Length(const xvector<char16>& text) { return Utf8Length(text.data(), text.size()); }

/// The code points of a UTF-8 text, and one for each maximal subpart of malformed text.
/// @pre "pn == 0 || (pn > 0 && p != nullptr)"
MIREL_API ssize_t CountCodePoints(const char8* p, ssize_t pn);
/// The code points of a UTF-16 text, and one for each unpaired surrogate.
/// @pre "pn == 0 || (pn > 0 && p != nullptr)"
MIREL_API ssize_t CountCodePoints(const char16* p, ssize_t pn);
/// The code points of a string.
inline ssize_t CountCodePoints(const xvector<char8>& text) {
  return CountCodePoints(text.data(), text.size());
}
/// The code points of a string.
inline ssize_t CountCodePoints(const xvector<char16>& text) {
  return CountCodePoints(text.data(), text.size());
}
/// The code points of a view's text.
inline ssize_t CountCodePoints(std::string_view text) {
  return CountCodePoints(text.data(), detail::SizeOf(text));
}
ssize_t CountCodePoints(std::nullptr_t) = delete;

/// @}
/// @name Strict conversions
/// Replace the contents of the destination, as the conversions of utils/xstring.h do: false where the source
/// is malformed, and the destination then holds what precedes the malformed sequence. A failed allocation
/// throws std::bad_alloc and leaves the beginning of the result in the destination. The source may not lie in
/// the destination.
/// @snippet examples/reference.cpp strict conversions
/// @{

/// UTF-8 to UTF-16.
inline bool Utf16FromUtf8(string16& dst, const xvector<char8>& text) {
  return Utf16FromUtf8(dst, text.data(), text.size());
}
/// UTF-8 to UTF-16, from a view.
inline bool Utf16FromUtf8(string16& dst, std::string_view text) {
  return Utf16FromUtf8(dst, text.data(), detail::SizeOf(text));
}
/// UTF-16 to UTF-8.
inline bool Utf8FromUtf16(string8& dst, const xvector<char16>& text) {
  return Utf8FromUtf16(dst, text.data(), text.size());
}
/// UTF-16 to UTF-8, from a view or a literal of the standard library's UTF-16. It is copied by blocks on the
/// stack, since a char16_t is another type than a char16.
MIREL_API bool Utf8FromUtf16(string8& dst, std::u16string_view text);

/// @}
/// @name Appending conversions
/// Append the result to what the destination holds: false where the source is malformed, and what precedes
/// the malformed sequence has then been appended. A failed allocation throws std::bad_alloc and leaves what
/// the destination held and the beginning of the result. Where storage grows, it at least doubles, so that
/// many small texts take amortised linear time. The source may not lie in the destination. A UtfStream that
/// replaces malformed text appends too.
/// @snippet examples/reference.cpp appending conversions
/// @{

/// Appends UTF-8 as UTF-16. @pre "pn == 0 || (pn > 0 && p != nullptr)"
MIREL_API bool AppendUtf16(string16& dst, const char8* p, ssize_t pn);
/// Appends a string as UTF-16.
inline bool AppendUtf16(string16& dst, const xvector<char8>& text) {
  return AppendUtf16(dst, text.data(), text.size());
}
/// Appends a view's text as UTF-16.
inline bool AppendUtf16(string16& dst, std::string_view text) {
  return AppendUtf16(dst, text.data(), detail::SizeOf(text));
}
bool AppendUtf16(string16&, std::nullptr_t) = delete;
/// Appends UTF-16 as UTF-8. @pre "pn == 0 || (pn > 0 && p != nullptr)"
MIREL_API bool AppendUtf8(string8& dst, const char16* p, ssize_t pn);
/// Appends a string as UTF-8.
inline bool AppendUtf8(string8& dst, const xvector<char16>& text) {
  return AppendUtf8(dst, text.data(), text.size());
}

/// @}
/// @name Lossy conversions
/// Replace the contents of the destination with the text, in which each maximal subpart of malformed text has
/// become U+FFFD, as in browsers and in Python (Unicode Standard 3.9, U+FFFD Substitution of Maximal
/// Subparts). They return how many there are. A failed allocation throws std::bad_alloc and leaves the
/// beginning of the result in the destination. The source may not lie in the destination. AppendCodePoint()
/// of each of CodePoints() does it within one encoding.
/// @snippet examples/reference.cpp lossy conversions
/// @{

/// UTF-8 to UTF-16. @pre "pn == 0 || (pn > 0 && p != nullptr)"
MIREL_API ssize_t Utf16FromUtf8Lossy(string16& dst, const char8* p, ssize_t pn);
/// UTF-8 to UTF-16, from a string.
inline ssize_t Utf16FromUtf8Lossy(string16& dst, const xvector<char8>& text) {
  return Utf16FromUtf8Lossy(dst, text.data(), text.size());
}
/// UTF-8 to UTF-16, from a view.
inline ssize_t Utf16FromUtf8Lossy(string16& dst, std::string_view text) {
  return Utf16FromUtf8Lossy(dst, text.data(), detail::SizeOf(text));
}
ssize_t Utf16FromUtf8Lossy(string16&, std::nullptr_t) = delete;
/// UTF-16 to UTF-8. @pre "pn == 0 || (pn > 0 && p != nullptr)"
MIREL_API ssize_t Utf8FromUtf16Lossy(string8& dst, const char16* p, ssize_t pn);
/// UTF-16 to UTF-8, from a string.
inline ssize_t Utf8FromUtf16Lossy(string8& dst, const xvector<char16>& text) {
  return Utf8FromUtf16Lossy(dst, text.data(), text.size());
}

/// @}

} // namespace mirel
