// Searches and comparisons, in lower-case text that resembles English, and in similar text of other scripts.
#include "Library.h"
#include "Simdutf.h"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <random>

#ifdef HAVE_QT
#include <QByteArray>
#include <QString>
#endif

namespace {

/// Returns words in which the letters have about their frequency in English; q occurs about once in 1,000
/// units.
std::string Words(std::size_t size) {
  static const std::string kLetters =
      "eeeeeeeeeeeetttttttttaaaaaaaaooooooooiiiiiiinnnnnnnsssssshhhhhhrrrrrrddddllllcccuuu"
      "mmmwwffggyyppbbvk               ";
  std::mt19937 random(7);
  std::string text;
  while (text.size() < size)
    text += random() % 1000 == 0 ? 'q' : kLetters[random() % kLetters.size()];
  return text;
}

/// Keeps a text as long as the program runs, as the cases do.
template <class T> const StdString<T>& Kept(const StdString<T>& text) { return *new StdString<T>(text); }
template <class T> const StdString<T>& KeptOf(const std::string& text) { return Kept<T>(StdOf<T>(text)); }

/// Turns a pointer into an index, and null into -1.
template <class Unit> long long IndexOf(const std::basic_string<Unit>& text, const void* at) {
  return at ? static_cast<const Unit*>(at) - text.data() : -1;
}

/// Turns a size into an index, and the whole size into -1.
long long IndexOf(const std::string& text, std::size_t size) {
  return size == text.size() ? -1 : static_cast<long long>(size);
}

template <class T>
Contender OurSearch(const Library& library, Op op, const StdString<T>& text, const StdString<T>& needle) {
  if constexpr (sizeof(T) == 1)
    return library.search8(op, text, needle);
  else
    return library.search16(op, text, needle);
}

/// Registers a search with ours and the standard string as contenders, and with the earlier version if the
/// text is short or withEarlierVersion.
template <class T>
Case Search(Op op, const std::string& operation, const std::string& data, const StdString<T>& text,
            const StdString<T>& needle, bool withEarlierVersion = false) {
  Case search(Width<T>::kArea, operation, data, text.size(), Width<T>::kUnit);
  AddLibrary(search, withEarlierVersion || text.size() <= 64,
             [&](const Library& library) { return OurSearch<T>(library, op, text, needle); });
  return search.Against(Width<T>::kPeer, Searching(op, text, needle));
}

/// Registers searches for a unit that isn't in the text.
template <class T> void RegisterUnit(const StdString<T>& text) {
  const auto& unit = KeptOf<T>("Z");
  Case find = Search<T>(Op::kFindUnit, "find(c)", "absent", text, unit);
  Case rfind = Search<T>(Op::kRfindUnit, "rfind(c)", "absent", text, unit);
  if constexpr (sizeof(T) == 1) {
    find.Against("memchr", [&] { return IndexOf(text, std::memchr(text.data(), 'Z', text.size())); });
    rfind.Against("memrchr", [&] { return IndexOf(text, ::memrchr(text.data(), 'Z', text.size())); });
  }
#ifdef HAVE_SIMDUTF
  if constexpr (sizeof(T) == 2)
    for (const SimdutfContender& contender : Simdutf())
      find.Against(contender.first, [&text, kernels = contender.second] {
        const char16_t* const end = text.data() + text.size();
        const char16_t* const at = kernels->find(text.data(), end, u'Z');
        return IndexOf(text, at == end ? nullptr : at);
      });
#endif
#ifdef HAVE_QT
  if constexpr (sizeof(T) == 1) {
    const auto& qt = *new QByteArray(text.data(), qsizetype(text.size()));
    find.Against("QByteArray", [&qt] { return qt.indexOf('Z'); });
  } else {
    const auto& qt = *new QString(reinterpret_cast<const QChar*>(text.data()), qsizetype(text.size()));
    find.Against("QString", [&qt] { return qt.indexOf(u'Z'); });
  }
#endif
}

template <class T>
void RegisterNeedle(const StdString<T>& text, const std::string& ascii, const char* first) {
  const std::string data = std::to_string(ascii.size()) + " units, first one " + first;
  const auto& needle = KeptOf<T>(ascii);
  Case find = Search<T>(Op::kFind, "find(needle)", data + ", absent", text, needle);
  Search<T>(Op::kRfind, "rfind(needle)", data + ", absent", text, needle);
  if constexpr (sizeof(T) == 1)
    find.Against("memmem", [&] {
      return IndexOf(text, ::memmem(text.data(), text.size(), needle.data(), needle.size()));
    });
  if (ascii.size() != 12)
    return;
#ifdef HAVE_QT
  if constexpr (sizeof(T) == 1) {
    const auto& qt = *new QByteArray(text.data(), qsizetype(text.size()));
    find.Against("QByteArray", [&] { return qt.indexOf(needle.c_str()); });
  } else {
    const auto& qt = *new QString(reinterpret_cast<const QChar*>(text.data()), qsizetype(text.size()));
    find.Against("QString", [&] { return qt.indexOf(QStringView(needle.data(), qsizetype(needle.size()))); });
  }
#endif
  StdString<T> end = text;
  std::copy(needle.begin(), needle.end(), end.end() - 12);
  Search<T>(Op::kFind, "find(needle)", data + ", at the end", Kept<T>(end), needle);
}

/// Registers searches for a set whose members aren't in the text; in both directions if the set is ASCII.
template <class T>
void RegisterSet(const StdString<T>& text, const StdString<T>& set, const std::string& members) {
  const std::string data = "set of " + std::to_string(set.size()) + members + ", absent";
  const auto& kept = Kept<T>(set);
  const bool withEarlierVersion = sizeof(T) == 2 && set.size() == 40;
  Case first = Search<T>(Op::kFirstOf, "find_first_of", data, text, kept, withEarlierVersion);
  if constexpr (sizeof(T) == 1)
    first.Against("strcspn", [&] { return IndexOf(text, std::strcspn(text.c_str(), kept.c_str())); });
  if (members.empty())
    Search<T>(Op::kLastOf, "find_last_of", data, text, kept, withEarlierVersion);
}

template <class T> void RegisterComplement(const StdString<T>& text, const StdString<T>& set) {
  const std::string data = "set of " + std::to_string(set.size()) + ", all members";
  Case first = Search<T>(Op::kFirstNotOf, "find_first_not_of", data, text, set);
  if constexpr (sizeof(T) == 1)
    first.Against("strspn", [&] { return IndexOf(text, std::strspn(text.c_str(), set.c_str())); });
  Search<T>(Op::kLastNotOf, "find_last_not_of", data, text, set);
}

template <class T> void RegisterComparisons(const StdString<T>& text) {
  const auto& other = Kept<T>(text);
  const auto& ours = *new mirel::basic_xstring<T>(OurOf<T>(text));
  const auto& ourOther = *new mirel::basic_xstring<T>(ours);
  const auto pair = [&](const char* operation, const char* data, auto ourWork, auto theirWork) {
    Case(Width<T>::kArea, operation, data, text.size(), Width<T>::kUnit)
        .Ours(ourWork)
        .Against(Width<T>::kPeer, theirWork);
  };
  pair(
      "compare", "equal", [&] { return ours.compare(ourOther); }, [&] { return text.compare(other); });
  pair(
      "_Eq", "equal", [&] { return ours._Eq(ourOther); }, [&] { return text == other; });
  pair(
      "[]", "all elements",
      [&] {
        unsigned sum = 0;
        for (ssize_t i = 0; i < ours.size(); ++i)
          sum += static_cast<unsigned>(ours[i]);
        return sum;
      },
      [&] {
        unsigned sum = 0;
        for (std::size_t i = 0; i < text.size(); ++i)
          sum += static_cast<unsigned>(text[i]);
        return sum;
      });
}

const std::string& Set40() {
  static const std::string kSet = "0123456789ABCDEFGHIJKLMNOPQRSTUVWXYZ.,;:";
  return kSet;
}

template <class T> void RegisterSearchesIn(std::size_t size) {
  const auto& text = KeptOf<T>(Words(size));
  RegisterUnit<T>(text);
  RegisterNeedle<T>(text, "ejt", "frequent");
  RegisterNeedle<T>(text, "qjt", "rare");
  if (size >= 64) {
    RegisterNeedle<T>(text, "ethnologists", "frequent");
    RegisterNeedle<T>(text, "quaternaries", "rare");
    RegisterNeedle<T>(text, "ethnologists in the north tell old tales", "frequent");
    RegisterNeedle<T>(text, "quaternaries in the north hold old tales", "rare");
  }
  for (const char* set : {"ZX", "ZXJW", "ZXJQKWVY"})
    RegisterSet<T>(text, StdOf<T>(set), "");
  RegisterSet<T>(text, StdOf<T>(Set40()), "");

  std::string members = Words(size);
  for (char& c : members) // leaves only members of the set of 18
    if (std::strchr("fgypbvkq", c))
      c = 'e';
  RegisterComplement<T>(KeptOf<T>(members), KeptOf<T>("zxetaoinshrdlcumw "));
  std::string printable = "\n";
  for (char c = ' '; c <= '~'; ++c)
    printable += c;
  RegisterComplement<T>(text, KeptOf<T>(printable));
  RegisterComparisons<T>(text);
}

/// Registers sets of one script and of several, in texts of the same scripts.
void RegisterScripts(std::size_t size) {
  std::u16string cyrillic, mixed;
  int word = 0;
  for (const char c : Words(size)) {
    const auto offset = static_cast<char16_t>(c - 'a');
    cyrillic += c == ' ' ? u' ' : char16_t(u'\u0430' + offset);
    const char16_t scripts[] = {u'a', u'\u03B1', u'\u0430', u'\u4E00'}; // each word in the next one
    mixed += c == ' ' ? u' ' : char16_t(scripts[word % 4] + offset);
    word += c == ' ';
  }
  const auto& cyrillicText = Kept<char16>(cyrillic);
  const auto& mixedText = Kept<char16>(mixed);
  for (const int count : {4, 40}) {
    std::u16string ofOne, ofAll;
    for (int i = 0; i < count; ++i) {
      ofOne += char16_t(u'\u0460' + i);
      const char16_t scripts[] = {u'A', u'\u0391', u'\u0460', u'\u5000'};
      ofAll += char16_t(scripts[i % 4] + i / 4);
    }
    RegisterSet<char16>(cyrillicText, ofOne, " of Cyrillic");
    RegisterSet<char16>(mixedText, ofAll, " of four scripts");
  }
}

/// Registers searches in which every fifth unit is a member of the set: whatever a search prepares must be
/// worth it within five units.
template <class T> void RegisterSplitting(std::size_t size) {
  for (const std::string set : {" ,.;", " ,.;:!?()-\n\t"}) {
    std::string words;
    for (std::size_t i = 0; i < size; ++i)
      words += i % 5 == 4 ? set[i / 5 % set.size()] : 'a';
    const auto& text = KeptOf<T>(words);
    const auto& kept = KeptOf<T>(set);
    const std::string data = "set of " + std::to_string(set.size()) + ", a hit at every fifth unit";
    Case split = Search<T>(Op::kSplit, "splitting", data, text, kept, true);
    if constexpr (sizeof(T) == 1)
      split.Against("strcspn", [&] {
        long long hits = 0;
        for (const char* at = text.c_str(); *(at += std::strcspn(at, kept.c_str())) != '\0'; ++at)
          ++hits;
        return hits;
      });
  }
}

/// Registers searches that take the product of two sizes if each place is compared anew.
void RegisterWorstCases() {
  const auto& text = Kept<char8>(std::string(1 << 20, 'a'));
  const std::string many((1 << 18) - 2, 'a');
  const auto& forward = Kept<char8>(many + "ba");
  const auto& backward = Kept<char8>("ab" + many);
  const std::string data = "needle of 256 Ki units, all but one as in the haystack";
  Case("Worst cases", "find(needle)", data, text.size(), "bytes")
      .Against("ours", kOurs.search8(Op::kFind, text, forward))
      .Against("memmem", [&] {
        return IndexOf(text, ::memmem(text.data(), text.size(), forward.data(), forward.size()));
      });
  Case("Worst cases", "rfind(needle)", data, text.size(), "bytes")
      .Against("ours", kOurs.search8(Op::kRfind, text, backward))
      .Against("our find", kOurs.search8(Op::kFind, text, forward));

  // The members are even units, the haystack has odd ones.
  std::mt19937 random(13);
  std::u16string set, odd;
  for (int i = 0; i < 10000; ++i)
    set += char16_t(0x4E00 + 2 * i);
  std::shuffle(set.begin(), set.end(), random);
  while (odd.size() < std::size_t(1) << 19)
    odd += char16_t(0x4E01 + 2 * (random() % 10000));
  const auto& haystack = Kept<char16>(odd);
  const auto& members = Kept<char16>(set);
  Case("Worst cases", "find_first_of", "set of 10,000, absent", haystack.size(), "16-bit units")
      .Against("ours", kOurs.search16(Op::kFirstOf, haystack, members))
      .Against("a bitmap loop", [&]() -> long long {
        std::uint8_t bits[1 << 13] = {};
        for (const char16_t unit : members)
          bits[unit >> 3] = static_cast<std::uint8_t>(bits[unit >> 3] | 1 << (unit & 7));
        for (std::size_t i = 0; i < haystack.size(); ++i)
          if ((bits[haystack[i] >> 3] >> (haystack[i] & 7) & 1) != 0)
            return static_cast<long long>(i);
        return -1;
      });
}

} // namespace

void RegisterSearches() {
  for (const std::size_t size :
       {std::size_t(12), std::size_t(64), std::size_t(1000), std::size_t(1) << 16, std::size_t(4) << 20}) {
    RegisterSearchesIn<char8>(size);
    RegisterSearchesIn<char16>(size);
    RegisterScripts(size);
    if (size <= std::size_t(1) << 16) {
      RegisterSplitting<char8>(size);
      RegisterSplitting<char16>(size);
    }
  }
  RegisterWorstCases();
}
