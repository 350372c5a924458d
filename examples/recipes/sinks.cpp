// Sinks that an xostream writes to: a string, a C stream, and a POSIX file descriptor such as a socket's.

#include <cerrno>
#include <cstdio>
#include <system_error>
#include <thread>

#include <fcntl.h>
#include <poll.h>
#include <sys/socket.h>
#include <unistd.h>

#include <utils/Std.h>
#include <utils/xostream.h>

using mirel::ssize_t;
using mirel::string8;

// An exception of a sink passes through the stream's member that wrote.
void Check(bool good) {
  if (!good)
    throw std::system_error(errno, std::generic_category());
}

struct MemorySink : mirel::IOutputStream {
  void WriteStream(const void* address, ssize_t count) override {
    text.append(static_cast<const char*>(address), count);
  }
  void FlushStream() override {}

  string8 text;
};

struct FileSink : mirel::IOutputStream {
  explicit FileSink(FILE* f) : file(f) {}
  void WriteStream(const void* address, ssize_t count) override {
    Check(std::fwrite(address, static_cast<std::size_t>(count), 1, file) == 1);
  }
  void FlushStream() override { Check(std::fflush(file) == 0); }

  FILE* file;
};

// A descriptor may take fewer bytes, be busy or be interrupted. A socket without a reader also raises
// SIGPIPE, which a program that writes to sockets ignores.
struct DescriptorSink : mirel::IOutputStream {
  explicit DescriptorSink(int d) : descriptor(d) {}
  void WriteStream(const void* address, ssize_t count) override {
    for (auto* p = static_cast<const char*>(address); count > 0; ++writes) {
      const auto taken = write(descriptor, p, static_cast<std::size_t>(count));
      if (taken >= 0) {
        p += taken;
        count -= taken;
      } else if (errno == EAGAIN) {
        pollfd ready = {descriptor, POLLOUT, 0};
        poll(&ready, 1, -1);
      } else {
        Check(errno == EINTR);
      }
    }
  }
  void FlushStream() override {} // nothing is buffered

  int descriptor;
  int writes = 0; // only this example counts them
};

void WriteGreeting(mirel::IOutputStream& sink) {
  mirel::xostream os(sink);
  os << "width ";
  os.width(6);
  os.put(42);
  os.endl();
}

int main() {
  MemorySink memory;
  WriteGreeting(memory);
  std::printf("%s", memory.text.c_str());

  FileSink file(stdout);
  WriteGreeting(file);

  // Write more than a socket takes at once; another thread reads it.
  int ends[2];
  Check(socketpair(AF_UNIX, SOCK_STREAM, 0, ends) == 0);
  Check(fcntl(ends[0], F_SETFL, O_NONBLOCK) == 0);
  const string8 sent(4 << 20, 'x');
  string8 received;
  std::thread reader([&] {
    const auto readSome = [&](char* p, ssize_t n) {
      const auto got = read(ends[1], p, static_cast<std::size_t>(n));
      Check(got >= 0);
      return got;
    };
    while (mirel::FillFrom(received, 1 << 16, readSome) > 0)
      ;
  });
  DescriptorSink socket(ends[0]);
  mirel::xostream(socket).write(sent.data(), sent.size());
  close(ends[0]);
  reader.join();
  close(ends[1]);
  std::printf("%s, in %s\n", received == sent ? "the same" : "other bytes",
              socket.writes > 1 ? "pieces" : "one piece");
}

/* Prints:
width     42
width     42
the same, in pieces
*/
