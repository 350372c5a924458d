#include "Files.h"

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <iterator>
#include <system_error>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace transcode {

namespace {

/// The temporary file that the signal handler removes, or null.
std::atomic<const char*> unfinished{nullptr};
static_assert(std::atomic<const char*>::is_always_lock_free, "a signal handler needs a lock-free atomic");

extern "C" void RemoveUnfinished(int signal) {
  if (const char* const name = unfinished)
    unlink(name);
  raise(signal); // SA_RESETHAND has restored its default action
}

/// Returns whether the default action of a signal doesn't end the process; it may stop it.
bool IsHarmless(int signal) {
  constexpr int kHarmless[] = {SIGCHLD, SIGCONT, SIGTSTP, SIGTTIN, SIGTTOU, SIGURG, SIGWINCH};
  return std::find(std::begin(kHarmless), std::end(kHarmless), signal) != std::end(kHarmless);
}

void RemoveWhenInterrupted(const char* name) {
  unfinished = name;
  for (int signal = 1; signal <= SIGRTMAX; ++signal) {
    struct sigaction action = {};
    if (IsHarmless(signal) || sigaction(signal, nullptr, &action) != 0 || action.sa_handler != SIG_DFL)
      continue; // harmless, reserved by the C library, or ignored as the parent process wants
    action.sa_handler = RemoveUnfinished;
    action.sa_flags = static_cast<int>(SA_RESETHAND);
    sigaction(signal, &action, nullptr);
  }
}

/// Blocks signals, so that none arrives between the creation of a file and the note to remove it.
class SignalBlocker {
public:
  SignalBlocker() {
    sigset_t all;
    sigfillset(&all);
    sigprocmask(SIG_SETMASK, &all, &m_before);
  }
  ~SignalBlocker() { sigprocmask(SIG_SETMASK, &m_before, nullptr); }
  SignalBlocker(const SignalBlocker&) = delete;
  SignalBlocker& operator=(const SignalBlocker&) = delete;

private:
  sigset_t m_before;
};

/// Returns what a link, or a chain of links, leads to. That need not exist.
std::string FollowLinks(const std::string& name) {
  namespace fs = std::filesystem;
  constexpr int kMaxLinks = 40;
  fs::path path = name;
  std::error_code error;
  for (int i = 0; i < kMaxLinks && is_symlink(symlink_status(path, error)); ++i)
    path = path.parent_path() / read_symlink(path, error);
  return path;
}

} // namespace

void HoldClosedStreams() {
  for (const int fd : {STDIN_FILENO, STDOUT_FILENO, STDERR_FILENO})
    if (fcntl(fd, F_GETFD) == -1) // open() returns the lowest free descriptor
      open("/dev/null", fd == STDIN_FILENO ? O_WRONLY : O_RDONLY);
}

std::runtime_error SystemError(const std::string& name) {
  return std::runtime_error(name + ": " + std::strerror(errno));
}

Input::Input(const std::string& name)
    : m_name(name == "-" ? "standard input" : name),
      m_fd(name == "-" ? STDIN_FILENO : open(name.c_str(), O_RDONLY)) {
  if (m_fd == -1)
    throw SystemError(m_name);
}

Input::~Input() {
  if (m_fd != STDIN_FILENO)
    close(m_fd);
}

ssize_t Input::Read(char* p, ssize_t n) {
  for (;;) {
    const ssize_t count = read(m_fd, p, static_cast<std::size_t>(n));
    if (count >= 0)
      return count;
    if (errno != EINTR)
      throw SystemError(m_name);
  }
}

int64 BytesLeft(const std::vector<std::string>& names) {
  int64 left = 0;
  for (const std::string& name : names) {
    struct stat status;
    if ((name == "-" ? fstat(STDIN_FILENO, &status) : stat(name.c_str(), &status)) != 0 ||
        !S_ISREG(status.st_mode))
      return 0;
    left += status.st_size - (name == "-" ? lseek(STDIN_FILENO, 0, SEEK_CUR) : 0);
  }
  return left;
}

Output::Output(const std::string& name) : m_name(name), m_fd(STDOUT_FILENO) {
  if (name == "-") {
    m_name = "standard output";
    return;
  }
  struct stat old;
  const bool exists = stat(name.c_str(), &old) == 0;
  if (!exists && errno != ENOENT)
    throw SystemError(name);
  if (exists && !S_ISREG(old.st_mode)) {
    m_fd = open(name.c_str(), O_WRONLY | O_TRUNC);
    if (m_fd == -1)
      throw SystemError(name);
    return;
  }
  if (exists && faccessat(AT_FDCWD, name.c_str(), W_OK, AT_EACCESS) != 0)
    throw SystemError(name); // rename() needs no permission for the file that it replaces
  m_target = FollowLinks(name);
  const mode_t mask = umask(0);
  umask(mask);
  OpenTemporary(exists ? old.st_mode & 07777 : 0666 & ~mask);
}

/// The temporary name is short, so that the target may have a name of any length that is allowed.
void Output::OpenTemporary(unsigned mode) {
  m_temporary = std::filesystem::path(m_target).replace_filename(".transcode-XXXXXX");
  const SignalBlocker blocker;
  m_fd = mkstemp(m_temporary.data());
  if (m_fd == -1)
    throw SystemError(m_name);
  RemoveWhenInterrupted(m_temporary.c_str());
  fchmod(m_fd, static_cast<mode_t>(mode));
}

Output::~Output() {
  if (m_fd != STDOUT_FILENO && m_fd != -1)
    close(m_fd);
  if (!m_temporary.empty()) {
    unlink(m_temporary.c_str());
    unfinished = nullptr;
  }
}

void Output::Write(std::string_view bytes) {
  while (!bytes.empty()) {
    const ssize_t count = write(m_fd, bytes.data(), bytes.size());
    if (count >= 0)
      bytes.remove_prefix(static_cast<std::size_t>(count));
    else if (errno != EINTR)
      throw SystemError(m_name);
  }
}

void Output::Finish() {
  if (m_target.empty())
    return;
  // Without fsync(), a machine that fails soon may come up with the new name and no text.
  if (fsync(m_fd) != 0 && errno != EINVAL) // EINVAL: the file system doesn't support it
    throw SystemError(m_name);
  const int fd = m_fd;
  m_fd = -1;
  if (close(fd) != 0 || std::rename(m_temporary.c_str(), m_target.c_str()) != 0)
    throw SystemError(m_name);
  unfinished = nullptr;
  m_temporary.clear();
}

bool Output::IsTerminal() const { return isatty(m_fd) == 1; }

bool Output::IsFedBackTo(const Input& input) const {
  struct stat in, out;
  return fstat(input.Descriptor(), &in) == 0 && fstat(m_fd, &out) == 0 && S_ISREG(out.st_mode) &&
         in.st_dev == out.st_dev && in.st_ino == out.st_ino;
}

} // namespace transcode
