/// @file
/// Conversions of text that arrives in pieces. A piece may end within a sequence.

#pragma once

#include <string_view>
#include <type_traits>

#include "Malformed.h"
#include "xstring.h"

namespace mirel {

/// Converts text that arrives in pieces; use it as Utf8Stream or Utf16Stream. However the text is cut, the
/// result is that of the whole text.
/// @snippet examples/reference.cpp streams
template <class CharOut, class CharIn> class MIREL_API UtfStream {
  /// Matches what converts to a std::string_view, where the input is UTF-8.
  template <class V>
  using IfView = std::enable_if_t<sizeof(CharIn) == 1 && std::is_convertible_v<const V&, std::string_view> &&
                                      !std::is_null_pointer_v<V>,
                                  int>;

public:
  /// Makes a stream at the beginning of a text.
  explicit UtfStream(OnMalformed onMalformed = OnMalformed::kStop) : m_onMalformed(onMalformed) {}

  /// Converts the units pending from the last piece and the pn units at p, and appends the result to dst.
  /// Units at the end that may begin a sequence are pending until later pieces complete it or show that it is
  /// malformed: up to three bytes of UTF-8, one unit of UTF-16.
  ///
  /// A failed allocation throws std::bad_alloc; dst then holds the beginning of the result, and the stream
  /// can't go on: assign a new one to it. The source may not lie in dst.
  /// @return false once the stream has stopped at a malformed sequence; dst then holds what precedes it
  /// @pre "pn == 0 || (pn > 0 && p != nullptr)"
  bool Append(basic_xstring<CharOut>& dst, const CharIn* p, ssize_t pn);
  /// Converts the next piece, the text of a string, and appends the result to dst.
  bool Append(basic_xstring<CharOut>& dst, const xvector<CharIn>& text) {
    return Append(dst, text.data(), text.size());
  }
  /// Converts the next piece, the UTF-8 text of a view, a std::string or a literal, and appends the result to
  /// dst.
  template <class V, IfView<V> = 0> bool Append(basic_xstring<CharOut>& dst, const V& text) {
    const std::string_view view = text;
    return Append(dst, view.data(), static_cast<ssize_t>(view.size()));
  }
  /// Ends the text. Pending units are malformed, since nothing completes them: they become U+FFFD in dst or
  /// stop the stream. A failed allocation throws as in Append(). The next Append() or Finish() begins another
  /// text; until then the members below describe this one.
  /// @return false if the stream has stopped at malformed text; always true with kReplace
  bool Finish(basic_xstring<CharOut>& dst);

  /// The number of units taken so far, with the pending ones; once the stream has stopped, the offset of
  /// the malformed sequence.
  int64 position() const { return m_converted + m_pending; }
  /// The number of units that wait for the next piece.
  ssize_t pending() const { return m_pending; }
  /// The number of U+FFFD that have replaced malformed text so far.
  int64 replacements() const { return m_replacements; }
  /// The first malformed sequence, its offset counted from the beginning of the text. While there is none,
  /// the reason is kNone and the offset npos (-1).
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

typedef UtfStream<char16, char8> Utf8Stream;  ///< Converts UTF-8 to UTF-16.
typedef UtfStream<char8, char16> Utf16Stream; ///< Converts UTF-16 to UTF-8.

extern template class UtfStream<char16, char8>;
extern template class UtfStream<char8, char16>;

} // namespace mirel
