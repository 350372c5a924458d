// Searches and comparisons, in English-like text of lower-case words.
#include "Cases.h"

#include <random>

#ifdef HAVE_QT
#include <QByteArray>
#include <QString>
#endif

namespace {

constexpr std::size_t kNpos = std::string::npos;

/// Words of the letters of English at about their frequencies; q stands alone about once in 1,000 units.
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

template <class T> struct Texts {
  explicit Texts(const std::string& text) : ours(OurOf<T>(text)), theirs(StdOf<T>(text)) {}
  mirel::basic_xstring<T> ours;
  StdString<T> theirs;
};

/// One search for one thing by both.
template <class T, class Ours, class Theirs>
auto Pair(const std::string& work, const std::string& data, std::size_t size, Ours ours, Theirs theirs) {
  return Case(CaseName(work, data, static_cast<ssize_t>(size), Width<T>::kBits), ours)
      .Against(Width<T>::kPeer, theirs);
}

template <class T> void RegisterSearchesIn(std::size_t size) {
  // The cases live as long as the program, and so do their texts.
  const auto& text = *new Texts<T>(Words(size));
  const auto& equal = *new Texts<T>(Words(size));
  const auto search = [&, size](const std::string& work, const std::string& data, const std::string& what,
                                const Texts<T>& in, auto ours, auto theirs) {
    const auto& pattern = *new Texts<T>(what);
    return Pair<T>(
        work, data, size, [&in, &pattern, ours] { return ours(in.ours, pattern.ours); },
        [&in, &pattern, theirs] { return static_cast<ssize_t>(theirs(in.theirs, pattern.theirs)); });
  };
  const auto find = [](auto& s, auto& p) { return s.find(p); };
  const auto rfind = [](auto& s, auto& p) { return s.rfind(p); };
  const auto firstOf = [](auto& s, auto& p) { return s.find_first_of(p.data(), 0, p.size()); };
  const auto lastOf = [](auto& s, auto& p) {
    return s.find_last_of(p.data(), decltype(p.size())(-1), p.size());
  };
  const auto firstNotOf = [](auto& s, auto& p) { return s.find_first_not_of(p.data(), 0, p.size()); };
  const auto lastNotOf = [](auto& s, auto& p) {
    return s.find_last_not_of(p.data(), decltype(p.size())(-1), p.size());
  };
  const auto findUnit = [](auto& s, auto& p) { return s.find(p[0]); };
  const auto rfindUnit = [](auto& s, auto& p) { return s.rfind(p[0]); };

  auto forward = search("find(c)", "absent", "Z", text, findUnit, findUnit);
  search("rfind(c)", "absent", "Z", text, rfindUnit, rfindUnit);
  auto frequent = search("find(run)", "first letter frequent, absent", "ethnologist", text, find, find);
  auto rare = search("find(run)", "first letter rare, absent", "quaternary", text, find, find);
  search("rfind(run)", "first letter frequent, absent", "ethnologist", text, rfind, rfind);
  search("rfind(run)", "first letter rare, absent", "quaternary", text, rfind, rfind);
#ifdef HAVE_QT
  if constexpr (sizeof(T) == 2) {
    const auto& qt = *new QString(reinterpret_cast<const QChar*>(text.theirs.data()), qsizetype(size));
    forward.Against("QString", [&qt] { return qt.indexOf(u'Z'); });
    frequent.Against("QString", [&qt] { return qt.indexOf(u"ethnologist"); });
    rare.Against("QString", [&qt] { return qt.indexOf(u"quaternary"); });
  } else {
    const auto& qt = *new QByteArray(text.theirs.data(), qsizetype(size));
    forward.Against("QByteArray", [&qt] { return qt.indexOf('Z'); });
    frequent.Against("QByteArray", [&qt] { return qt.indexOf("ethnologist"); });
    rare.Against("QByteArray", [&qt] { return qt.indexOf("quaternary"); });
  }
#endif
  if (size >= 200) {
    const auto& endsWithRun = *new Texts<T>(Words(size - 11) + "ethnologist");
    search("find(run)", "first letter frequent, at the end", "ethnologist", endsWithRun, find, find);
  }
  for (const char* set : {"ZX", "ZXJQKWVY"}) {
    const std::string data = "set of " + std::to_string(std::string(set).size()) + ", absent";
    search("find_first_of", data, set, text, firstOf, firstOf);
    search("find_last_of", data, set, text, lastOf, lastOf);
  }
  const auto& members = *new Texts<T>([&] {
    std::string all = Words(size); // only of the 18 units of the set
    for (char& c : all)
      if (std::string("fgypbvkq").find(c) != kNpos)
        c = 'e';
    return all;
  }());
  const char* const set18 = "zxetaoinshrdlcumw ";
  search("find_first_not_of", "set of 18, all members", set18, members, firstNotOf, firstNotOf);
  search("find_last_not_of", "set of 18, all members", set18, members, lastNotOf, lastNotOf);

  Pair<T>(
      "compare", "equal", size, [&] { return text.ours.compare(equal.ours); },
      [&] { return text.theirs.compare(equal.theirs); });
  Pair<T>(
      "_Eq", "equal", size, [&] { return text.ours._Eq(equal.ours); },
      [&] { return text.theirs == equal.theirs; });
  Pair<T>(
      "[]", "all elements", size,
      [&] {
        unsigned sum = 0;
        for (ssize_t i = 0; i < text.ours.size(); ++i)
          sum += static_cast<unsigned>(text.ours[i]);
        return sum;
      },
      [&] {
        unsigned sum = 0;
        for (std::size_t i = 0; i < text.theirs.size(); ++i)
          sum += static_cast<unsigned>(text.theirs[i]);
        return sum;
      });
}

} // namespace

void RegisterSearches() {
  for (const std::size_t size :
       {std::size_t(12), std::size_t(200), std::size_t(1) << 16, std::size_t(4) << 20}) {
    RegisterSearchesIn<char8>(size);
    RegisterSearchesIn<char16>(size);
  }
}
