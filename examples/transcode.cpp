// transcode: converts text files between UTF-8, UTF-16 and ASCII, and reports on them.
//
// Text goes through UTF-16 on its way: input is decoded to a string16, output encoded from it. What is
// malformed is found by the library's conversions, which keep the text before the fault.

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <new>
#include <stdexcept>
#include <string>

#include <fcntl.h>
#include <getopt.h>
#include <sys/stat.h>
#include <unistd.h>

#include <utils/xostream.h>
#include <utils/xstring.h>

using mirel::ssize_t;
using mirel::string16;
using mirel::string8;

namespace {

constexpr int kExitFailure = 1;
constexpr int kExitUsage = 2;

const char kUsage[] = "Usage: transcode [--from ENC] [--to ENC] [-o OUT] [--report] [FILE]\n";
const char kHelp[] =
    "Converts text from one encoding to another.\n"
    "\n"
    "  -f, --from ENC    encoding of the input: utf-8 (default), utf-16le, utf-16be or ascii\n"
    "  -t, --to ENC      encoding of the output: utf-8 (default), utf-16le or utf-16be\n"
    "  -o, --output OUT  write to the file OUT instead of standard output\n"
    "  -r, --report      print what is in the text instead of the text; with -o, both\n"
    "  -h, --help        print this help\n"
    "\n"
    "Without FILE, or with - for FILE or OUT, the standard streams are used. A byte order mark\n"
    "is text like any other. When the input is malformed, the place of the first fault is named,\n"
    "the exit code is 1, and OUT stays as it was; 2 tells of wrong usage.\n";

enum class Encoding { kUtf8, kUtf16Le, kUtf16Be, kAscii };

struct EncodingName {
  const char* name;
  Encoding encoding;
};
constexpr EncodingName kEncodings[] = {{"utf-8", Encoding::kUtf8},
                                       {"utf-16le", Encoding::kUtf16Le},
                                       {"utf-16be", Encoding::kUtf16Be},
                                       {"ascii", Encoding::kAscii}};

const char* Name(Encoding encoding) { return kEncodings[static_cast<int>(encoding)].name; }

struct UsageError : std::runtime_error {
  using std::runtime_error::runtime_error;
};

struct Options {
  Encoding from = Encoding::kUtf8;
  Encoding to = Encoding::kUtf8;
  std::string input = "-";
  std::string output; ///< empty when not given
  bool report = false;
  bool help = false;
};

Encoding ParseEncoding(const char* text) {
  for (const EncodingName& e : kEncodings)
    if (strcasecmp(text, e.name) == 0)
      return e.encoding;
  throw UsageError(std::string("unknown encoding '") + text + "'");
}

Options ParseOptions(int argc, char** argv) {
  static const option kOptions[] = {
      {"from", required_argument, nullptr, 'f'},   {"to", required_argument, nullptr, 't'},
      {"output", required_argument, nullptr, 'o'}, {"report", no_argument, nullptr, 'r'},
      {"help", no_argument, nullptr, 'h'},         {nullptr, 0, nullptr, 0}};
  Options options;
  for (int c; (c = getopt_long(argc, argv, "f:t:o:rh", kOptions, nullptr)) != -1;) {
    switch (c) {
    case 'f': options.from = ParseEncoding(optarg); break;
    case 't': options.to = ParseEncoding(optarg); break;
    case 'o': options.output = optarg; break;
    case 'r': options.report = true; break;
    case 'h': options.help = true; break;
    default: throw UsageError("");
    }
  }
  if (argc - optind > 1)
    throw UsageError("more than one FILE");
  if (options.to == Encoding::kAscii)
    throw UsageError("ascii is for input only: ASCII text is UTF-8 already");
  if (optind < argc)
    options.input = argv[optind];
  return options;
}

std::runtime_error SystemError(const std::string& what) {
  return std::runtime_error(what + ": " + std::strerror(errno));
}

/// A C stream that is closed at the end, unless it is one of the standard streams.
class File {
public:
  File(FILE* file, const std::string& name) : m_file(file), m_name(name) {
    if (!file)
      throw SystemError(name);
  }
  ~File() {
    if (m_file && m_file != stdin && m_file != stdout)
      std::fclose(m_file);
  }
  File(const File&) = delete;
  File& operator=(const File&) = delete;

  string8 ReadAll() {
    constexpr ssize_t kBlock = 1 << 16;
    string8 bytes;
    for (ssize_t got = kBlock; got == kBlock;) {
      const ssize_t size = bytes.size();
      bytes.resize(size + kBlock, 0);
      got = static_cast<ssize_t>(std::fread(bytes.data() + size, 1, kBlock, m_file));
      bytes.resize(size + got, 0);
    }
    if (std::ferror(m_file))
      throw SystemError(m_name);
    return bytes;
  }

  void WriteAll(const string8& bytes) {
    const auto size = static_cast<std::size_t>(bytes.size());
    if (std::fwrite(bytes.data(), 1, size, m_file) != size || std::fflush(m_file) != 0)
      throw SystemError(m_name);
  }

private:
  FILE* m_file;
  std::string m_name;
};

string8 ReadInput(const std::string& name) {
  if (name == "-")
    return File(stdin, "standard input").ReadAll();
  return File(std::fopen(name.c_str(), "rb"), name).ReadAll();
}

/// Writes a regular file under another name first, so that the old content is lost only to the whole new one.
void ReplaceFile(const std::string& name, const string8& bytes) {
  struct stat old, link;
  const bool exists = stat(name.c_str(), &old) == 0;
  const bool isDangling = !exists && lstat(name.c_str(), &link) == 0;
  if (isDangling || (exists && !S_ISREG(old.st_mode)))
    return File(std::fopen(name.c_str(), "wb"), name).WriteAll(bytes);

  std::string target = name;
  if (char* const resolved = exists ? realpath(name.c_str(), nullptr) : nullptr) {
    target = resolved; // a link stays a link
    std::free(resolved);
  }
  std::string temporary = target + ".XXXXXX";
  const int fd = mkstemp(temporary.data());
  if (fd == -1)
    throw SystemError(name);
  try {
    const mode_t mask = umask(0);
    umask(mask);
    fchmod(fd, exists ? old.st_mode & 07777 : 0666 & ~mask);
    File(fdopen(fd, "wb"), name).WriteAll(bytes);
    if (std::rename(temporary.c_str(), target.c_str()) != 0)
      throw SystemError(name);
  } catch (...) {
    unlink(temporary.c_str());
    throw;
  }
}

void WriteOutput(const std::string& name, const string8& bytes) {
  if (name.empty() || name == "-")
    File(stdout, "standard output").WriteAll(bytes);
  else
    ReplaceFile(name, bytes);
}

/// Input, decoded as far as it is well-formed.
struct Decoded {
  string16 text;
  ssize_t bytes = 0; ///< how many bytes of the input the text stands for
};

string8 Utf8Bytes(const string16& text) {
  string8 bytes;
  mirel::Utf8FromUtf16(bytes, text.data(), text.size());
  return bytes;
}

/// The bytes of each unit, in the order of the encoding.
string8 Utf16Bytes(const string16& text, Encoding encoding) {
  string8 bytes;
  bytes.reserve(2 * text.size());
  for (const mirel::char16 unit : text) {
    const char high = static_cast<char>(unit >> 8);
    const char low = static_cast<char>(unit & 0xFF);
    bytes.push_back(encoding == Encoding::kUtf16Be ? high : low);
    bytes.push_back(encoding == Encoding::kUtf16Be ? low : high);
  }
  return bytes;
}

/// The units of an even number of bytes, well-formed or not.
string16 Utf16Units(const string8& bytes, Encoding encoding) {
  string16 units;
  units.reserve(bytes.size() / 2);
  const int highAt = encoding == Encoding::kUtf16Be ? 0 : 1;
  for (const char* p = bytes.data(); bytes.data_end() - p >= 2; p += 2) {
    const auto high = static_cast<unsigned char>(p[highAt]);
    const auto low = static_cast<unsigned char>(p[1 - highAt]);
    units.push_back(static_cast<mirel::char16>(high << 8 | low));
  }
  return units;
}

string8 Encode(const string16& text, Encoding encoding) {
  return encoding == Encoding::kUtf8 ? Utf8Bytes(text) : Utf16Bytes(text, encoding);
}

Decoded Decode(const string8& bytes, Encoding encoding) {
  Decoded result;
  switch (encoding) {
  case Encoding::kUtf8: {
    const bool whole = mirel::Utf16FromUtf8(result.text, bytes.data(), bytes.size());
    result.bytes = whole ? bytes.size() : Utf8Bytes(result.text).size();
    break;
  }
  case Encoding::kUtf16Le:
  case Encoding::kUtf16Be: {
    const string16 units = Utf16Units(bytes, encoding);
    string8 wellFormed;
    mirel::Utf8FromUtf16(wellFormed, units.data(), units.size());
    mirel::Utf16FromUtf8(result.text, wellFormed.data(), wellFormed.size());
    result.bytes = 2 * result.text.size();
    break;
  }
  case Encoding::kAscii: {
    const auto isAscii = [&](ssize_t i) { return static_cast<unsigned char>(bytes[i]) < 0x80; };
    while (result.bytes < bytes.size() && isAscii(result.bytes))
      ++result.bytes;
    mirel::Utf16FromAscii(result.text, bytes.data(), result.bytes);
    break;
  }
  }
  return result;
}

/// What there is to tell of a text. A line ends with a newline; what follows the last one is a line too.
struct Statistics {
  ssize_t codePoints = 0;
  ssize_t asciiCodePoints = 0;
  ssize_t newlines = 0;
  ssize_t longestLine = 0; ///< in code points, without the newline
  ssize_t lastLine = 0;    ///< the same of what follows the last newline
};

Statistics Count(const string16& text) {
  Statistics s;
  for (const mirel::char16 unit : text) {
    const bool isTrailSurrogate = (unit & 0xFC00) == 0xDC00;
    if (isTrailSurrogate)
      continue;
    ++s.codePoints;
    s.asciiCodePoints += unit < 0x80;
    if (unit == '\n') {
      ++s.newlines;
      s.lastLine = 0;
    } else if (++s.lastLine > s.longestLine) {
      s.longestLine = s.lastLine;
    }
  }
  return s;
}

std::runtime_error Malformed(const Options& options, const Decoded& decoded) {
  const Statistics s = Count(decoded.text);
  return std::runtime_error(options.input + ": not well-formed " + Name(options.from) + " at byte " +
                            std::to_string(decoded.bytes) + " (line " + std::to_string(s.newlines + 1) +
                            ", column " + std::to_string(s.lastLine + 1) + ")");
}

/// A sink that keeps what it is given.
struct MemorySink : mirel::IOutputStream {
  void WriteStream(const void* address, ssize_t count) override {
    text.append(static_cast<const char*>(address), count);
  }
  void FlushStream() override {}
  string8 text;
};

string8 Report(const Options& options, const string8& bytes, const string16& text) {
  const Statistics s = Count(text);
  MemorySink sink;
  mirel::xostream os(sink);
  const auto row = [&os](const char* name, ssize_t value) {
    os << name;
    os.width(12);
    os.put(value);
    os.endl();
  };
  os << options.input.c_str() << ", " << Name(options.from) << ":";
  os.Indent(2);
  os.endl();
  row("bytes                 ", bytes.size());
  row("UTF-8 code units      ", Utf8Bytes(text).size());
  row("UTF-16 code units     ", text.size());
  row("code points           ", s.codePoints);
  row("lines                 ", s.newlines + (s.lastLine > 0));
  row("longest line          ", s.longestLine);
  os << "ASCII code points     ";
  os.width(12);
  os.precision(4);
  os.put(s.codePoints == 0
             ? 0.0
             : 100.0 * static_cast<double>(s.asciiCodePoints) / static_cast<double>(s.codePoints));
  os << " %";
  os.endl();
  const Encoding way = options.from == Encoding::kAscii ? Encoding::kUtf8 : options.from;
  os << "way back              " << (Encode(text, way)._Eq(bytes) ? "  same bytes" : " OTHER BYTES");
  os.Indent(0);
  os.endl();
  return sink.text;
}

void Run(const Options& options) {
  const string8 bytes = ReadInput(options.input);
  const Decoded decoded = Decode(bytes, options.from);
  if (decoded.bytes != bytes.size())
    throw Malformed(options, decoded);
  if (!options.report || !options.output.empty())
    WriteOutput(options.output, Encode(decoded.text, options.to));
  if (options.report)
    WriteOutput("-", Report(options, bytes, decoded.text));
}

} // namespace

int main(int argc, char** argv) {
  try {
    const Options options = ParseOptions(argc, argv);
    if (options.help) {
      std::printf("%s%s", kUsage, kHelp);
      return EXIT_SUCCESS;
    }
    Run(options);
    return EXIT_SUCCESS;
  } catch (const UsageError& e) {
    if (*e.what() != '\0') // otherwise the parser has said what is wrong
      std::fprintf(stderr, "transcode: %s\n", e.what());
    std::fprintf(stderr, "%sTry 'transcode --help'.\n", kUsage);
    return kExitUsage;
  } catch (const std::bad_alloc&) {
    std::fprintf(stderr, "transcode: not enough memory\n");
  } catch (const std::exception& e) {
    std::fprintf(stderr, "transcode: %s\n", e.what());
  }
  return kExitFailure;
}
