// The files that are read and written, without anything in between: what is converted comes in blocks
// already.

#pragma once

#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include <utils/BasicTypes.h>

namespace transcode {

using mirel::int64;
using mirel::ssize_t;

/// Fills the places of standard streams that were closed when the program started: another file would get
/// them, and be taken for the stream. Using one is an error.
void HoldClosedStreams();

/// The error that errno tells of, about the file of that name.
std::runtime_error SystemError(const std::string& name);

/// A file that is read, or standard input for the name "-".
class Input {
public:
  explicit Input(const std::string& name);
  ~Input();
  Input(const Input&) = delete;
  Input& operator=(const Input&) = delete;

  /// Reads up to n bytes, as many as there are at once. @return 0 at the end
  ssize_t Read(char* p, ssize_t n);
  const std::string& Name() const { return m_name; } ///< for messages
  int Descriptor() const { return m_fd; }

private:
  std::string m_name;
  int m_fd;
};

/// The bytes that are left to read of the files of these names, or 0 where they can't be told.
int64 BytesLeft(const std::vector<std::string>& names);

/// A file that is written, or standard output for the name "-".
///
/// A regular file is written under another name first, and takes its own only when it is finished and on the
/// disk: until then what was there is left alone. A link to one stays a link, and the mode stays as it was.
class Output {
public:
  explicit Output(const std::string& name);
  ~Output();
  Output(const Output&) = delete;
  Output& operator=(const Output&) = delete;

  void Write(std::string_view bytes);
  void Finish();
  bool IsTerminal() const;
  /// Whether what is written could be read again from the input.
  bool IsFedBackTo(const Input& input) const;

private:
  void OpenTemporary(unsigned mode);

  std::string m_name;
  std::string m_target;    ///< what the file is called in the end; empty where it is written in place
  std::string m_temporary; ///< what it is called until then
  int m_fd;
};

} // namespace transcode
