// A case is one benchmark: one operation, done by this library and by other libraries, on the same data in
// the same run.

#pragma once

#include <cstddef>
#include <cstdio>
#include <cstdlib>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include <benchmark/benchmark.h>

#include <utils/xstring.h>

using mirel::char16;
using mirel::char8;
using mirel::ssize_t;

/// The work of one contender in a case: once, for its result, and in the timed loop.
struct Contender {
  std::function<long long()> once;
  std::function<void(benchmark::State&)> loop;
};

/// Makes a contender of its work, which returns what can be compared with the other contenders: an index, a
/// size or a checksum.
template <class Work> Contender Of(Work work) {
  return {[work] { return static_cast<long long>(work()); },
          [work](benchmark::State& state) {
            for (auto _ : state) {
              // The compiler takes some functions, memchr and strcspn among them, for pure: it would call
              // them once.
              benchmark::ClobberMemory();
              benchmark::DoNotOptimize(work());
            }
          }};
}

/// Makes a contender that does its work with each of the texts, which live as long as the program.
template <class Text, class Work> Contender Over(const std::vector<Text>& texts, Work work) {
  return Of([&texts, work] {
    long long sum = 0;
    for (const Text& text : texts)
      sum += static_cast<long long>(work(text));
    return sum;
  });
}

/// One benchmark and its contenders. Their results must agree, since only equal work can be compared.
class Case {
public:
  Case(const std::string& area, const std::string& operation, const std::string& data, std::size_t size,
       const std::string& unit)
      : m_name(area + ";" + operation + ";" + data + ";" + std::to_string(size) + ";" + unit),
        m_isLong(size >= std::size_t(1) << 19) {}

  Case& Against(const std::string& who, const Contender& contender) {
    const std::string name = m_name + ";" + who;
    auto run = [name, contender, expected = m_expected, checked = false](benchmark::State& state) mutable {
      if (!checked) {
        const long long result = contender.once();
        if (expected->value_or(result) != result) {
          std::fprintf(stderr, "%s: %lld, others %lld\n", name.c_str(), result, **expected);
          std::exit(1);
        }
        *expected = result;
        checked = true;
      }
      contender.loop(state);
    };
    auto* const registered = benchmark::RegisterBenchmark(name.c_str(), run);
    if (m_isLong)
      registered->Repetitions(9); // each takes milliseconds
    return *this;
  }
  template <class Work> Case& Against(const std::string& who, Work work) { return Against(who, Of(work)); }
  template <class Work> Case& Ours(Work work) { return Against("ours", work); }

private:
  std::string m_name;
  bool m_isLong;
  std::shared_ptr<std::optional<long long>> m_expected = std::make_shared<std::optional<long long>>();
};

/// The standard library's character type for a code unit, and the names of both.
template <class T> struct Width;
template <> struct Width<char8> {
  using Std = char;
  static constexpr const char* kUnit = "bytes";
  static constexpr const char* kArea = "Searches in bytes";
  static constexpr const char* kPeer = "std::string";
};
template <> struct Width<char16> {
  using Std = char16_t;
  static constexpr const char* kUnit = "16-bit units";
  static constexpr const char* kArea = "Searches in 16-bit units";
  static constexpr const char* kPeer = "std::u16string";
};

template <class T> using StdString = std::basic_string<typename Width<T>::Std>;

template <class T> StdString<T> StdOf(const std::string& text) { return {text.begin(), text.end()}; }

template <class T> mirel::basic_xstring<T> OurOf(const StdString<T>& text) {
  return {reinterpret_cast<const T*>(text.data()), static_cast<ssize_t>(text.size())};
}

void RegisterSearches();
void RegisterEdits();
void RegisterStandard();
void RegisterConversions();
void RegisterTexts();
