#include "Progress.h"

#include <algorithm>
#include <cstdio>

#include <unistd.h>

namespace transcode {

namespace {

using namespace std::chrono_literals;
constexpr auto kMoment = 500ms;
constexpr auto kInterval = 100ms;

/// A program in the background shares the terminal with others, and must not write over them.
bool IsInForeground() { return tcgetpgrp(STDERR_FILENO) == getpgrp(); }

/// Overwrites the line before; the width is that of the longest line.
void Print(const char* text) {
  std::fprintf(stderr, "\r%-30s\r%s", "", text);
  std::fflush(stderr);
}

} // namespace

Progress::Progress(bool isWanted, int64 total)
    : m_isWanted(isWanted), m_total(total), m_next(Clock::now() + kMoment) {}

Progress::~Progress() {
  if (m_isShown)
    Print("");
}

void Progress::Add(int64 bytes) {
  m_done += bytes;
  if (!m_isWanted)
    return;
  const Clock::time_point now = Clock::now();
  if (now < m_next || !IsInForeground())
    return;
  m_next = now + kInterval;
  m_isShown = true;
  char text[40];
  if (m_total > 0) { // a file may grow meanwhile
    const double part = static_cast<double>(m_done) / static_cast<double>(m_total);
    std::snprintf(text, sizeof(text), "transcode: %.0f %%", 100 * std::min(part, 1.0));
  } else {
    std::snprintf(text, sizeof(text), "transcode: %.1f MB", static_cast<double>(m_done) / 1e6);
  }
  Print(text);
}

} // namespace transcode
