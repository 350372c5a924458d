// Compiled twice where an earlier version takes part. The second time, the headers are that version's, and
// `mirel` is a macro for its namespace.
#include "Library.h"

#include <map>

namespace {

/// Our copy of a text, the same one for every search through it.
template <class T> const mirel::basic_xstring<T>& Held(const StdString<T>& text) {
  static auto& held = *new std::map<const void*, mirel::basic_xstring<T>>;
  const auto at = held.find(&text);
  return at != held.end() ? at->second : held.emplace(&text, OurOf<T>(text)).first->second;
}

template <class T> Contender Search(Op op, const StdString<T>& text, const StdString<T>& needle) {
  return Searching(op, Held<T>(text), Held<T>(needle));
}

/// Converts each of the texts by convert(destination, pointer, size).
template <class Out, class In, class Convert>
Contender Converting(const std::vector<StdString<In>>& texts, bool isFresh, Convert convert) {
  const auto into = [convert](mirel::basic_xstring<Out>& destination, const StdString<In>& text) {
    convert(destination, reinterpret_cast<const In*>(text.data()), static_cast<ssize_t>(text.size()));
  };
  if (isFresh)
    return Over(texts, [into](const StdString<In>& text) {
      mirel::basic_xstring<Out> result;
      into(result, text);
      benchmark::DoNotOptimize(result.c_str());
      return result.size();
    });
  static auto& reused = *new mirel::basic_xstring<Out>;
  return Over(texts, [into](const StdString<In>& text) {
    into(reused, text);
    return reused.size();
  });
}

Contender ToUtf16(const std::vector<std::string>& texts, bool isFresh) {
  return Converting<char16, char8>(texts, isFresh, [](auto& to, const char8* from, ssize_t n) {
    return mirel::Utf16FromUtf8(to, from, n);
  });
}

Contender ToUtf8(const std::vector<std::u16string>& texts, bool isFresh) {
  return Converting<char8, char16>(texts, isFresh, [](auto& to, const char16* from, ssize_t n) {
    return mirel::Utf8FromUtf16(to, from, n);
  });
}

Contender ReportMalformed(const Malformed& malformed) {
  static auto& reused = *new mirel::string16;
  return Reporting(malformed, [](const char* text, std::size_t size) {
    return !mirel::Utf16FromUtf8(reused, text, static_cast<ssize_t>(size));
  });
}

} // namespace

#ifdef mirel
#define LIBRARY kBefore
#else
#define LIBRARY kOurs
#endif

const Library LIBRARY = {Search<char8>, Search<char16>, ToUtf16, ToUtf8, ReportMalformed};
