// Finds the call that had a bad argument: a handler for SIGABRT writes the call stack after the assertion's
// report.
//
// It writes lines such as "PROGRAM(+0x123f) [0x5646123f]". If PROGRAM was built with -g, the command
// `addr2line -Cfipe PROGRAM +0x123f` turns the address in parentheses into a function, a file and a line.

#include <csignal>
#include <cstdio>
#include <cstdlib>

#include <execinfo.h>
#include <sys/wait.h>
#include <unistd.h>

#include <utils/xstring.h>

using mirel::ssize_t;
using mirel::string8;

// When the handler returns, abort() ends the process as usual, with a core file if these are enabled.
void WriteCallStack(int) {
  void* frames[64];
  const int n = backtrace(frames, 64);
  for (int i = 0; i < n; ++i)
    frames[i] = static_cast<char*>(frames[i]) - 1; // the return address may be on another line or function
  backtrace_symbols_fd(frames, n, STDERR_FILENO);
}

void InstallHandler() {
  void* frame;
  backtrace(&frame, 1); // the first call loads a library, which a handler may not do
  std::signal(SIGABRT, WriteCallStack);
}

int PortOf(const string8& address) {
  return std::atoi(address.substr(address.find(':') + 1, 4).c_str()); // a bug: it may have fewer digits
}

// Returns what a process with the bug writes to standard error.
string8 Report() {
  int ends[2];
  if (pipe(ends) != 0)
    return {};
  if (fork() == 0) {
    dup2(ends[1], STDERR_FILENO);
    InstallHandler();
    _exit(PortOf("localhost:80"));
  }
  close(ends[1]);
  string8 report;
  char bytes[4096];
  for (ssize_t n; (n = read(ends[0], bytes, sizeof bytes)) > 0;)
    report.append(bytes, n);
  wait(nullptr);
  return report;
}

int main(int, char** argv) {
  const string8 report = Report(), frame = string8(argv[0]) + string8("(");
  const ssize_t assertion = report.find("Assertion"), abort = report.find("(abort+");
  std::printf("%s\n", report.substr(assertion, report.find('\n') - assertion).c_str());
  std::printf("the call stack %s\n",
              abort >= 0 && report.find(frame, abort) > abort ? "leads to the caller" : "is cut");
}

/* Prints:
Assertion `count == npos || (0 <= count && offset+count <= size())' failed.
the call stack leads to the caller
*/
