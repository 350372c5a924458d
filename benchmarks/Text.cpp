// Checks, counts, walks and lossy conversions. A contender that can detect malformed text does: simdutf,
// whose functions only count, checks the text first. u_countChar32 and utfcpp's unchecked iterators detect
// none.
#include "Cases.h"
#include "Simdutf.h"
#include "Texts.h"

#include <algorithm>

#include <unicode/ustring.h>
#include <unicode/utf16.h>
#include <unicode/utf8.h>
#include <utf8.h>
#include <utils/Utf.h>

#ifdef HAVE_QT
#include <QString>
#endif

namespace {

constexpr std::size_t kMaxUnits = std::size_t(4) << 20;

const char16* Units(const std::u16string& text) { return reinterpret_cast<const char16*>(text.data()); }
ssize_t Size(const std::string& text) { return static_cast<ssize_t>(text.size()); }
ssize_t Size(const std::u16string& text) { return static_cast<ssize_t>(text.size()); }

/// Walks the code points with ICU's macro, which gives -1 for malformed text.
template <class F> bool EachByIcu(const std::string& text, const F& f) {
  const auto* const s = reinterpret_cast<const uint8_t*>(text.data());
  const auto size = static_cast<int32_t>(text.size());
  bool isWellFormed = true;
  for (int32_t i = 0, c = 0; i < size;) {
    U8_NEXT(s, i, size, c);
    isWellFormed = isWellFormed && c >= 0;
    f(static_cast<char32_t>(c));
  }
  return isWellFormed;
}

void RegisterChecks8(const Language& language, std::size_t size) {
  const auto& texts = *new std::vector<std::string>(TextsIn<char>(language, size));
  Case check("Text", "FindMalformed", language.name, size, "bytes");
  Case length("Text", "Utf16Length", language.name, size, "bytes");
  Case count("Text", "CountCodePoints", language.name, size, "bytes");
  check.Against("ours",
                Over(texts, [](const std::string& s) { return mirel::IsWellFormed(s.data(), Size(s)); }));
  length.Against("ours",
                 Over(texts, [](const std::string& s) { return mirel::Utf16Length(s.data(), Size(s)); }));
  count.Against("ours",
                Over(texts, [](const std::string& s) { return mirel::CountCodePoints(s.data(), Size(s)); }));
#ifdef HAVE_SIMDUTF
  for (const SimdutfContender& contender : Simdutf()) {
    const auto* const k = contender.second;
    check.Against(contender.first,
                  Over(texts, [k](const std::string& s) { return k->validate_utf8(s.data(), s.size()); }));
    length.Against(contender.first, Over(texts, [k](const std::string& s) {
                     return k->validate_utf8(s.data(), s.size())
                                ? k->utf16_length_from_utf8(s.data(), s.size())
                                : 0;
                   }));
    count.Against(contender.first, Over(texts, [k](const std::string& s) {
                    return k->validate_utf8(s.data(), s.size()) ? k->count_utf8(s.data(), s.size()) : 0;
                  }));
  }
#endif
  check.Against("ICU", Over(texts, [](const std::string& s) { return EachByIcu(s, [](char32_t) {}); }));
  length.Against("ICU", Over(texts, [](const std::string& s) {
                   int32_t n = 0;
                   UErrorCode error = U_ZERO_ERROR;
                   u_strFromUTF8(nullptr, 0, &n, s.data(), int32_t(s.size()), &error);
                   return n;
                 }));
  count.Against("ICU", Over(texts, [](const std::string& s) {
                  ssize_t n = 0;
                  EachByIcu(s, [&n](char32_t) { ++n; });
                  return n;
                }));
  check.Against("utfcpp",
                Over(texts, [](const std::string& s) { return utf8::is_valid(s.begin(), s.end()); }));
  count.Against("utfcpp",
                Over(texts, [](const std::string& s) { return utf8::distance(s.begin(), s.end()); }));
}

void RegisterChecks16(const Language& language, std::size_t size) {
  const auto& texts = *new std::vector<std::u16string>(TextsIn<char16_t>(language, size));
  Case check("Text", "FindMalformed", language.name, size, "16-bit units");
  Case length("Text", "Utf8Length", language.name, size, "16-bit units");
  Case count("Text", "CountCodePoints", language.name, size, "16-bit units");
  check.Against("ours",
                Over(texts, [](const std::u16string& s) { return mirel::IsWellFormed(Units(s), Size(s)); }));
  length.Against("ours",
                 Over(texts, [](const std::u16string& s) { return mirel::Utf8Length(Units(s), Size(s)); }));
  count.Against(
      "ours", Over(texts, [](const std::u16string& s) { return mirel::CountCodePoints(Units(s), Size(s)); }));
#ifdef HAVE_SIMDUTF
  for (const SimdutfContender& contender : Simdutf()) {
    const auto* const k = contender.second;
    check.Against(contender.first, Over(texts, [k](const std::u16string& s) {
                    return k->validate_utf16le(s.data(), s.size());
                  }));
    length.Against(contender.first, Over(texts, [k](const std::u16string& s) {
                     return k->validate_utf16le(s.data(), s.size())
                                ? k->utf8_length_from_utf16le(s.data(), s.size())
                                : 0;
                   }));
    count.Against(contender.first, Over(texts, [k](const std::u16string& s) {
                    return k->validate_utf16le(s.data(), s.size()) ? k->count_utf16le(s.data(), s.size()) : 0;
                  }));
  }
#endif
  length.Against("ICU", Over(texts, [](const std::u16string& s) {
                   int32_t n = 0;
                   UErrorCode error = U_ZERO_ERROR;
                   u_strToUTF8(nullptr, 0, &n, s.data(), int32_t(s.size()), &error);
                   return n;
                 }));
  count.Against(
      "ICU", Over(texts, [](const std::u16string& s) { return u_countChar32(s.data(), int32_t(s.size())); }));
#ifdef HAVE_QT
  check.Against("Qt", Over(texts, [](const std::u16string& s) {
                  return QStringView(s.data(), qsizetype(s.size())).isValidUtf16();
                }));
#endif
}

/// Registers walks that sum the code points.
void RegisterWalks(const Language& language, std::size_t size) {
  const auto& utf8 = *new std::vector<std::string>(TextsIn<char>(language, size));
  const auto& utf16 = *new std::vector<std::u16string>(TextsIn<char16_t>(language, size));
  Case walk8("Text", "CodePoints", language.name, size, "bytes");
  Case walk16("Text", "CodePoints", language.name, size, "16-bit units");
  walk8.Against("ours", Over(utf8, [](const std::string& s) {
                  long long sum = 0;
                  for (const char32_t c : mirel::CodePoints(s.data(), Size(s)))
                    sum += c;
                  return sum;
                }));
  walk8.Against("ICU", Over(utf8, [](const std::string& s) {
                  long long sum = 0;
                  EachByIcu(s, [&sum](char32_t c) { sum += c; });
                  return sum;
                }));
  walk8.Against("utfcpp, unchecked", Over(utf8, [](const std::string& s) {
                  long long sum = 0;
                  using Iterator = utf8::unchecked::iterator<const char*>;
                  for (Iterator i(s.data()), end(s.data() + s.size()); i != end; ++i)
                    sum += *i;
                  return sum;
                }));
  walk16.Against("ours", Over(utf16, [](const std::u16string& s) {
                   long long sum = 0;
                   for (const char32_t c : mirel::CodePoints(Units(s), Size(s)))
                     sum += c;
                   return sum;
                 }));
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wsign-conversion" // within the macro
  walk16.Against("ICU", Over(utf16, [](const std::u16string& s) {
                   long long sum = 0;
                   const auto end = static_cast<int32_t>(s.size());
                   uint32_t c = 0;
                   for (int32_t i = 0; i < end; sum += c)
                     U16_NEXT(s.data(), i, end, c);
                   return sum;
                 }));
#pragma GCC diagnostic pop
}

/// Calls the strict conversion again after each FF. @return how many units it gives, with one for each FF
ssize_t StrictAgain(mirel::string16& dst, const char* p, const char* end) {
  ssize_t units = 0;
  while (!mirel::Utf16FromUtf8(dst, p, end - p)) {
    units += dst.size() + 1;
    p = std::find(p, end, '\xFF') + 1;
  }
  return units + dst.size();
}

/// Inserts a malformed unit after about every ten units. @return how many
template <class Unit> ssize_t Spoil(std::basic_string<Unit>& text, Unit malformed) {
  ssize_t count = 0;
  for (std::size_t at = 10; at < text.size(); at += 11, ++count)
    text.insert(at = BoundaryNear(text, at), 1, malformed);
  return count;
}

/// Registers lossy conversions of well-formed text, or of the same text with an FF at about every tenth byte.
/// Our strict conversion always takes part on the well-formed text, and on malformed text too, called again
/// after each fault.
void RegisterLossy(const Language& language, std::size_t size, bool isMalformed) {
  const auto& wellFormed = *new std::vector<std::string>(TextsIn<char>(language, size));
  auto& texts = *new std::vector<std::string>(wellFormed);
  const ssize_t faults = isMalformed ? Spoil(texts[0], '\xFF') : 0;
  static auto& wide = *new mirel::string16;
  Case lossy("Lossy conversions",
             std::string(isMalformed ? "lossy, malformed" : "lossy, well-formed") + ", UTF-8 to UTF-16",
             language.name, size, "bytes");
  lossy.Against("ours", Over(texts, [](const std::string& s) {
                  mirel::Utf16FromUtf8Lossy(wide, s.data(), Size(s));
                  return wide.size();
                }));
  lossy.Against(isMalformed ? "our strict conversion, well-formed" : "our strict conversion",
                Over(wellFormed, [faults](const std::string& s) {
                  mirel::Utf16FromUtf8(wide, s.data(), Size(s));
                  return wide.size() + faults;
                }));
  if (isMalformed)
    lossy.Against("our strict conversion, again and again", Over(texts, [](const std::string& s) {
                    return StrictAgain(wide, s.data(), s.data() + s.size());
                  }));
  lossy.Against("ICU", Over(texts, [](const std::string& s) {
                  static auto& buffer = *new std::vector<char16_t>(kMaxUnits + 64);
                  int32_t n = 0;
                  UErrorCode error = U_ZERO_ERROR;
                  u_strFromUTF8WithSub(buffer.data(), kMaxUnits, &n, s.data(), int32_t(s.size()), 0xFFFD,
                                       nullptr, &error);
                  return n;
                }));
#ifdef HAVE_QT
  lossy.Against("Qt", Over(texts, [](const std::string& s) {
                  return QString::fromUtf8(s.data(), qsizetype(s.size())).size();
                }));
#endif
}

/// Registers lossy conversions from UTF-16 to UTF-8; malformed text has a low surrogate at about every tenth
/// unit.
void RegisterLossyBack(const Language& language, std::size_t size, bool isMalformed) {
  const auto& wellFormed = *new std::vector<std::u16string>(TextsIn<char16_t>(language, size));
  auto& texts = *new std::vector<std::u16string>(wellFormed);
  const ssize_t faults = isMalformed ? Spoil(texts[0], u'\xDC00') : 0;
  static auto& narrow = *new mirel::string8;
  Case lossy("Lossy conversions",
             std::string(isMalformed ? "lossy, malformed" : "lossy, well-formed") + ", UTF-16 to UTF-8",
             language.name, size, "16-bit units");
  lossy.Against("ours", Over(texts, [](const std::u16string& s) {
                  mirel::Utf8FromUtf16Lossy(narrow, Units(s), Size(s));
                  return narrow.size();
                }));
  lossy.Against(isMalformed ? "our strict conversion, well-formed" : "our strict conversion",
                Over(wellFormed, [faults](const std::u16string& s) {
                  mirel::Utf8FromUtf16(narrow, Units(s), Size(s));
                  return narrow.size() + faults * 3; // bytes of U+FFFD
                }));
  lossy.Against("ICU", Over(texts, [](const std::u16string& s) {
                  static auto& buffer = *new std::vector<char>(3 * kMaxUnits + 64);
                  int32_t n = 0;
                  UErrorCode error = U_ZERO_ERROR;
                  u_strToUTF8WithSub(buffer.data(), 3 * kMaxUnits, &n, s.data(), int32_t(s.size()), 0xFFFD,
                                     nullptr, &error);
                  return n;
                }));
}

} // namespace

void RegisterTexts() {
  for (const Language& language : Languages()) {
    for (const std::size_t size :
         {std::size_t(14), std::size_t(64), std::size_t(1000), std::size_t(1) << 16}) {
      RegisterChecks8(language, size);
      RegisterChecks16(language, size);
      RegisterWalks(language, size);
      RegisterLossy(language, size, false);
      RegisterLossyBack(language, size, false);
    }
    RegisterLossy(language, std::size_t(1) << 16, true);
    RegisterLossyBack(language, std::size_t(1) << 16, true);
  }
}
