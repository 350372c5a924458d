// Shows the progress of a long run on the terminal.

#pragma once

#include <chrono>

#include <utils/BasicTypes.h>

namespace transcode {

using mirel::int64;

/// A line on standard error, if that is the terminal that the program was started from. It appears once the
/// run takes longer than half a second, and is erased with the object, before anything else is printed.
class Progress {
public:
  /// The total is in bytes, 0 if it isn't known.
  Progress(bool isWanted, int64 total);
  ~Progress();
  Progress(const Progress&) = delete;
  Progress& operator=(const Progress&) = delete;

  /// Counts bytes that are done.
  void Add(int64 bytes);

private:
  typedef std::chrono::steady_clock Clock;

  const bool m_isWanted;
  const int64 m_total;
  int64 m_done = 0;
  bool m_isShown = false;
  Clock::time_point m_next; ///< when to show something again
};

} // namespace transcode
