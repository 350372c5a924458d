/// @file
/// Conversions of text that comes in pieces, which may end within a sequence.

#pragma once

#include <string_view>
#include <type_traits>

#include "Malformed.h"
#include "xstring.h"

namespace mirel {

/// What a conversion in pieces does with malformed text.
enum class OnMalformed {
  kStop,   ///< It converts nothing from the first malformed sequence on.
  kReplace ///< It replaces each maximal subpart by U+FFFD.
};

/// A conversion of text in pieces: Utf8Stream and Utf16Stream. Any way of cutting a text into pieces gives
/// the result of the whole text.
/// @snippet examples/reference.cpp streams
template <class CharOut, class CharIn> class MIREL_API UtfStream {
public:
  /// A stream at the beginning of a text.
  explicit UtfStream(OnMalformed onMalformed = OnMalformed::kStop) : m_onMalformed(onMalformed) {}

  /// Converts the pn units at p, and those that were kept of the last piece, behind what dst holds. What may
  /// be the beginning of a sequence that goes on in the next piece is kept: up to three bytes of UTF-8, one
  /// unit of UTF-16.
  ///
  /// A failed allocation throws std::bad_alloc; dst then holds the beginning of the result, and the stream
  /// can't go on: assign a new one to it. The source may not lie in dst.
  /// @return false where the text has a malformed sequence and the stream stops at it, and from then on; dst
  /// holds what precedes it
  /// @pre "pn == 0 || (pn > 0 && p != nullptr)"
  bool Append(basic_xstring<CharOut>& dst, const CharIn* p, ssize_t pn);
  /// Appends a piece of text.
  bool Append(basic_xstring<CharOut>& dst, const xvector<CharIn>& text) {
    return Append(dst, text.data(), text.size());
  }
  /// Appends a piece of UTF-8 that a std::string_view sees, a std::string or a literal too.
  template <class V,
            std::enable_if_t<sizeof(CharIn) == 1 && std::is_convertible_v<const V&, std::string_view> &&
                                 !std::is_null_pointer_v<V>,
                             int> = 0>
  bool Append(basic_xstring<CharOut>& dst, const V& text) {
    const std::string_view view = text;
    return Append(dst, view.data(), static_cast<ssize_t>(view.size()));
  }
  /// Ends the text. What was kept is malformed, since nothing completes it, and becomes U+FFFD or stops the
  /// stream. The next call begins another text; until then the members below tell of this one.
  /// @return whether the text was well-formed, or has been replaced where it wasn't
  bool Finish(basic_xstring<CharOut>& dst);

  /// The units of the text so far, those that were kept included; once the stream has stopped, the offset of
  /// the malformed sequence.
  int64 position() const { return m_converted + m_pending; }
  /// How many of them are kept for the next piece.
  ssize_t pending() const { return m_pending; }
  /// How many U+FFFD stand for malformed text so far.
  int64 replacements() const { return m_replacements; }
  /// The first malformed sequence; the offset is from the beginning of the text. Its reason is kNone and its
  /// offset npos while there is none.
  const MalformedText& malformed() const { return m_malformed; }

private:
  bool HasStopped() const;
  void Convert(basic_xstring<CharOut>& dst, const CharIn* p, ssize_t pn, const CharIn* end);
  ssize_t CompletePending(basic_xstring<CharOut>& dst, const CharIn* p, ssize_t pn);

  OnMalformed m_onMalformed;
  bool m_isFinished = false;
  CharIn m_kept[3] = {};
  ssize_t m_pending = 0;
  int64 m_converted = 0;
  int64 m_replacements = 0;
  MalformedText m_malformed = {-1, 0, MalformedReason::kNone};
};

typedef UtfStream<char16, char8> Utf8Stream;  ///< Takes UTF-8 and gives UTF-16.
typedef UtfStream<char8, char16> Utf16Stream; ///< Takes UTF-16 and gives UTF-8.

extern template class UtfStream<char16, char8>;
extern template class UtfStream<char8, char16>;

} // namespace mirel
