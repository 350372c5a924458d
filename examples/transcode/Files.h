// The files that are read and written. They have no buffers, since the text is converted in blocks.

#pragma once

#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include <utils/BasicTypes.h>

namespace transcode {

using mirel::int64;
using mirel::ssize_t;

/// Opens /dev/null for each standard stream that was closed when the program started. Otherwise another file
/// would get its descriptor and be taken for the stream. To read or write such a stream is an error.
void HoldClosedStreams();

/// Makes an error of errno for the file of that name.
std::runtime_error SystemError(const std::string& name);

/// A file that is read, or standard input for the name "-".
class Input {
public:
  explicit Input(const std::string& name);
  ~Input();
  Input(const Input&) = delete;
  Input& operator=(const Input&) = delete;

  /// Reads up to n bytes, as many as are available at once. @return 0 at the end
  ssize_t Read(char* p, ssize_t n);
  const std::string& Name() const { return m_name; } ///< for messages
  int Descriptor() const { return m_fd; }

private:
  std::string m_name;
  int m_fd;
};

/// Returns the number of bytes that are left to read in these files, or 0 if it isn't known.
int64 BytesLeft(const std::vector<std::string>& names);

/// A file that is written, or standard output for the name "-".
///
/// A regular file is written under a temporary name, and renamed when it is complete and on the disk; until
/// then an old file is left alone. A symbolic link stays a link, and the mode stays as it was.
class Output {
public:
  explicit Output(const std::string& name);
  ~Output();
  Output(const Output&) = delete;
  Output& operator=(const Output&) = delete;

  void Write(std::string_view bytes);
  void Finish();
  bool IsTerminal() const;
  /// Returns whether the output is the file of the input, and would be read again.
  bool IsFedBackTo(const Input& input) const;

private:
  void OpenTemporary(unsigned mode);

  std::string m_name;
  std::string m_target;    ///< the final name; empty if the file is written in place
  std::string m_temporary; ///< the name until then
  int m_fd;
};

} // namespace transcode
