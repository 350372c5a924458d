// A case is one piece of work that we and others do on the same data in the same run.

#pragma once

#include <cstdio>
#include <cstdlib>
#include <string>

#include <benchmark/benchmark.h>

#include <utils/xstring.h>

using mirel::char16;
using mirel::char8;
using mirel::ssize_t;

/// Registers what one party does in a case. The work returns what can be compared between the parties (an
/// index, a size, a checksum), and they must agree: only equal work can be set against each other.
template <class Work> class Case {
public:
  Case(const std::string& name, Work ours) : m_name(name), m_expected(ours()) { Register("ours", ours); }

  template <class Peer> Case& Against(const std::string& peer, Peer work) {
    if (static_cast<long long>(work()) != static_cast<long long>(m_expected)) {
      std::fprintf(stderr, "%s: %s gives another result\n", m_name.c_str(), peer.c_str());
      std::exit(1);
    }
    Register(peer, work);
    return *this;
  }

private:
  template <class W> void Register(const std::string& who, W work) {
    benchmark::RegisterBenchmark((m_name + ";" + who).c_str(), [work](benchmark::State& state) {
      for (auto _ : state)
        benchmark::DoNotOptimize(work());
    });
  }

  std::string m_name;
  decltype(std::declval<Work>()()) m_expected;
};

/// The standard library's character for a code unit, and the names of the types.
template <class T> struct Width;
template <> struct Width<char8> {
  using Std = char;
  static constexpr const char* kBits = "8-bit";
  static constexpr const char* kPeer = "std::string";
};
template <> struct Width<char16> {
  using Std = char16_t;
  static constexpr const char* kBits = "16-bit";
  static constexpr const char* kPeer = "std::u16string";
};

template <class T> using StdString = std::basic_string<typename Width<T>::Std>;

template <class T> StdString<T> StdOf(const std::string& text) { return {text.begin(), text.end()}; }

template <class T> mirel::basic_xstring<T> OurOf(const std::string& text) {
  mirel::basic_xstring<T> result;
  result.assign(text.begin(), text.end());
  return result;
}

inline std::string CaseName(const std::string& work, const std::string& data, ssize_t size,
                            const char* bits) {
  return work + ";" + data + ";" + std::to_string(size) + ";" + bits;
}

void RegisterSearches();
void RegisterEdits();
void RegisterConversions();
