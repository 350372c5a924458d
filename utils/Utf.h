/// @file
/// UTF-8 and UTF-16 text: where it is malformed, how long it is in the other encoding, and conversions that
/// append, that replace malformed text, and that take the standard library's views.
///
/// It completes the conversions of utils/xstring.h, and includes the ranges of code points
/// (utils/CodePoints.h) and the conversions of text in pieces (utils/UtfStream.h). It has no state, and
/// allocates nothing but what a destination needs.
///
/// What is well-formed is defined by the Unicode Standard: table 3-7 for UTF-8, definition D91 for UTF-16.
/// Each function takes a pointer and a count of units, or a string; for 8-bit text also a std::string_view,
/// and so a std::string or a literal. A null pointer with a count of 0 is an empty text. Every function takes
/// at most linear time, and reads no unit outside the text.

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

/// Finds the first malformed sequence of a UTF-8 text.
/// @return the index of its first unit, or npos (-1) if the text is well-formed
/// @pre "pn == 0 || (pn > 0 && p != nullptr)"
MIREL_API ssize_t FindMalformed(const char8* p, ssize_t pn);
/// Finds the first unpaired surrogate of a UTF-16 text: its index, or npos (-1).
/// @pre "pn == 0 || (pn > 0 && p != nullptr)"
MIREL_API ssize_t FindMalformed(const char16* p, ssize_t pn);
/// Finds the first malformed sequence of a string: the index of its first unit, or npos (-1).
inline ssize_t FindMalformed(const xvector<char8>& text) { return FindMalformed(text.data(), text.size()); }
/// Finds the first unpaired surrogate of a string: its index, or npos (-1).
inline ssize_t FindMalformed(const xvector<char16>& text) { return FindMalformed(text.data(), text.size()); }
/// Finds the first malformed sequence of a view's text: the index of its first unit, or npos (-1).
inline ssize_t FindMalformed(std::string_view text) {
  return FindMalformed(text.data(), detail::SizeOf(text));
}
ssize_t FindMalformed(std::nullptr_t) = delete;

/// Returns whether the text is well-formed UTF-8. @pre "pn == 0 || (pn > 0 && p != nullptr)"
inline bool IsWellFormed(const char8* p, ssize_t pn) { return FindMalformed(p, pn) < 0; }
/// Returns whether the text is well-formed UTF-16. @pre "pn == 0 || (pn > 0 && p != nullptr)"
inline bool IsWellFormed(const char16* p, ssize_t pn) { return FindMalformed(p, pn) < 0; }
/// Returns whether a string is well-formed UTF-8.
inline bool IsWellFormed(const xvector<char8>& text) { return FindMalformed(text) < 0; }
/// Returns whether a string is well-formed UTF-16.
inline bool IsWellFormed(const xvector<char16>& text) { return FindMalformed(text) < 0; }
/// Returns whether a view's text is well-formed UTF-8.
inline bool IsWellFormed(std::string_view text) { return FindMalformed(text) < 0; }
bool IsWellFormed(std::nullptr_t) = delete;

/// Explains what is wrong with the sequence that begins at offset, which is a result of FindMalformed() or
/// another index at which a sequence begins. For a well-formed sequence, the result has its length and the
/// reason kNone. Constant time.
/// @pre "pn == 0 || (pn > 0 && p != nullptr)", then "0 <= offset && offset < pn"
MIREL_API MalformedText ExplainMalformed(const char8* p, ssize_t pn, ssize_t offset);
/// Explains what is wrong with the UTF-16 sequence that begins at an offset. Constant time.
/// @pre "pn == 0 || (pn > 0 && p != nullptr)", then "0 <= offset && offset < pn"
MIREL_API MalformedText ExplainMalformed(const char16* p, ssize_t pn, ssize_t offset);
/// Explains what is wrong with the sequence at an offset in a UTF-8 string. Constant time.
/// @pre "0 <= offset && offset < pn", where pn is the string's size
inline MalformedText ExplainMalformed(const xvector<char8>& text, ssize_t offset) {
  return ExplainMalformed(text.data(), text.size(), offset);
}
/// Explains what is wrong with the sequence at an offset in a UTF-16 string. Constant time.
/// @pre "0 <= offset && offset < pn", where pn is the string's size
inline MalformedText ExplainMalformed(const xvector<char16>& text, ssize_t offset) {
  return ExplainMalformed(text.data(), text.size(), offset);
}
/// Explains what is wrong with the sequence at an offset in a view's text. Constant time.
/// @pre "0 <= offset && offset < pn", where pn is the view's size
inline MalformedText ExplainMalformed(std::string_view text, ssize_t offset) {
  return ExplainMalformed(text.data(), detail::SizeOf(text), offset);
}
MalformedText ExplainMalformed(std::nullptr_t, ssize_t) = delete;

/// @}
/// @name Counting
/// Malformed text counts as the U+FFFD that the lossy conversions put in its place.
/// @snippet examples/reference.cpp counting
/// @{

/// Counts the units that a UTF-8 text takes in UTF-16. @pre "pn == 0 || (pn > 0 && p != nullptr)"
MIREL_API ssize_t Utf16Length(const char8* p, ssize_t pn);
/// Counts the units that a UTF-8 string takes in UTF-16.
inline ssize_t Utf16Length(const xvector<char8>& text) { return Utf16Length(text.data(), text.size()); }
/// Counts the units that a view's UTF-8 text takes in UTF-16.
inline ssize_t Utf16Length(std::string_view text) { return Utf16Length(text.data(), detail::SizeOf(text)); }
ssize_t Utf16Length(std::nullptr_t) = delete;

/// Counts the units that a UTF-16 text takes in UTF-8. In a 32-bit program they can be more than an ssize_t
/// holds; the result is then PTRDIFF_MAX.
/// @pre "pn == 0 || (pn > 0 && p != nullptr)"
MIREL_API ssize_t Utf8Length(const char16* p, ssize_t pn);
/// Counts the units that a UTF-16 string takes in UTF-8, PTRDIFF_MAX if an ssize_t can't hold the number.
inline ssize_t Utf8Length(const xvector<char16>& text) { return Utf8Length(text.data(), text.size()); }

/// Counts the code points of a UTF-8 text, and one for each maximal subpart of malformed text.
/// @pre "pn == 0 || (pn > 0 && p != nullptr)"
MIREL_API ssize_t CountCodePoints(const char8* p, ssize_t pn);
/// Counts the code points of a UTF-16 text, and one for each unpaired surrogate.
/// @pre "pn == 0 || (pn > 0 && p != nullptr)"
MIREL_API ssize_t CountCodePoints(const char16* p, ssize_t pn);
/// Counts the code points of a string, and one for each maximal subpart of malformed text.
inline ssize_t CountCodePoints(const xvector<char8>& text) {
  return CountCodePoints(text.data(), text.size());
}
/// Counts the code points of a string, and one for each unpaired surrogate.
inline ssize_t CountCodePoints(const xvector<char16>& text) {
  return CountCodePoints(text.data(), text.size());
}
/// Counts the code points of a view's text, and one for each maximal subpart of malformed text.
inline ssize_t CountCodePoints(std::string_view text) {
  return CountCodePoints(text.data(), detail::SizeOf(text));
}
ssize_t CountCodePoints(std::nullptr_t) = delete;

/// @}
/// @name Strict conversions
/// Replace the contents of the destination, as the conversions of utils/xstring.h do. They return false where
/// the source is malformed; the destination then holds what precedes the malformed sequence. A failed
/// allocation throws std::bad_alloc and leaves the beginning of the result in the destination. The source may
/// not lie in the destination.
/// @snippet examples/reference.cpp strict conversions
/// @{

/// Converts a string from UTF-8 to UTF-16.
inline bool Utf16FromUtf8(string16& dst, const xvector<char8>& text) {
  return Utf16FromUtf8(dst, text.data(), text.size());
}
/// Converts a view's text from UTF-8 to UTF-16.
inline bool Utf16FromUtf8(string16& dst, std::string_view text) {
  return Utf16FromUtf8(dst, text.data(), detail::SizeOf(text));
}
/// Converts a string from UTF-16 to UTF-8.
inline bool Utf8FromUtf16(string8& dst, const xvector<char16>& text) {
  return Utf8FromUtf16(dst, text.data(), text.size());
}
/// Converts a view's text, or a literal, from UTF-16 to UTF-8. The text is copied to the stack a block at a
/// time, since char16_t is a different type from char16.
MIREL_API bool Utf8FromUtf16(string8& dst, std::u16string_view text);

/// @}
/// @name Appending conversions
/// Append the result to what the destination holds. They return false where the source is malformed, after
/// appending what precedes the malformed sequence. A failed allocation throws std::bad_alloc and leaves what
/// the destination held and the beginning of the result. Where the storage of a destination that isn't empty
/// grows, it at least doubles, so that many small texts take amortised linear time. The source may not lie in
/// the destination. To replace malformed text while appending, use a UtfStream.
/// @snippet examples/reference.cpp appending conversions
/// @{

/// Appends a UTF-8 text as UTF-16. @pre "pn == 0 || (pn > 0 && p != nullptr)"
MIREL_API bool AppendUtf16(string16& dst, const char8* p, ssize_t pn);
/// Appends a UTF-8 string as UTF-16.
inline bool AppendUtf16(string16& dst, const xvector<char8>& text) {
  return AppendUtf16(dst, text.data(), text.size());
}
/// Appends a view's UTF-8 text as UTF-16.
inline bool AppendUtf16(string16& dst, std::string_view text) {
  return AppendUtf16(dst, text.data(), detail::SizeOf(text));
}
bool AppendUtf16(string16&, std::nullptr_t) = delete;
/// Appends a UTF-16 text as UTF-8. @pre "pn == 0 || (pn > 0 && p != nullptr)"
MIREL_API bool AppendUtf8(string8& dst, const char16* p, ssize_t pn);
/// Appends a UTF-16 string as UTF-8.
inline bool AppendUtf8(string8& dst, const xvector<char16>& text) {
  return AppendUtf8(dst, text.data(), text.size());
}

/// @}
/// @name Lossy conversions
/// Replace the contents of the destination. Each maximal subpart of malformed text becomes U+FFFD, as in
/// browsers and in Python (Unicode Standard 3.9, U+FFFD Substitution of Maximal Subparts); the conversions
/// return how many there are. A failed allocation throws std::bad_alloc and leaves the beginning of the
/// result in the destination. The source may not lie in the destination. To replace malformed text without
/// changing the encoding, pass each of CodePoints() to AppendCodePoint().
/// @snippet examples/reference.cpp lossy conversions
/// @{

/// Converts UTF-8 to UTF-16 and replaces malformed text. @return how many U+FFFD replace it
/// @pre "pn == 0 || (pn > 0 && p != nullptr)"
MIREL_API ssize_t Utf16FromUtf8Lossy(string16& dst, const char8* p, ssize_t pn);
/// Converts a string from UTF-8 to UTF-16 and replaces malformed text. @return how many U+FFFD replace it
inline ssize_t Utf16FromUtf8Lossy(string16& dst, const xvector<char8>& text) {
  return Utf16FromUtf8Lossy(dst, text.data(), text.size());
}
/// Converts a view's text from UTF-8 to UTF-16 and replaces malformed text. @return how many U+FFFD replace
/// it
inline ssize_t Utf16FromUtf8Lossy(string16& dst, std::string_view text) {
  return Utf16FromUtf8Lossy(dst, text.data(), detail::SizeOf(text));
}
ssize_t Utf16FromUtf8Lossy(string16&, std::nullptr_t) = delete;
/// Converts UTF-16 to UTF-8 and replaces unpaired surrogates. @return how many U+FFFD replace them
/// @pre "pn == 0 || (pn > 0 && p != nullptr)"
MIREL_API ssize_t Utf8FromUtf16Lossy(string8& dst, const char16* p, ssize_t pn);
/// Converts a string from UTF-16 to UTF-8 and replaces unpaired surrogates. @return how many U+FFFD replace
/// them
inline ssize_t Utf8FromUtf16Lossy(string8& dst, const xvector<char16>& text) {
  return Utf8FromUtf16Lossy(dst, text.data(), text.size());
}

/// @}

} // namespace mirel
