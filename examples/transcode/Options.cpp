#include "Options.h"

#include <cstring>

#include <getopt.h>

namespace transcode {

const char kUsage[] = "Usage: transcode [--from ENC] [--to ENC] [-o OUT] [--report] [--replace | --check]\n  "
                      "               [--quiet] [FILE]\n";
const char kHelp[] =
    "Converts text from one encoding to another, of any length in little memory.\n"
    "\n"
    "  -f, --from ENC    encoding of the input: utf-8 (default), utf-16le, utf-16be or ascii\n"
    "  -t, --to ENC      encoding of the output: utf-8 (default), utf-16le or utf-16be\n"
    "  -o, --output OUT  write to the file OUT instead of standard output\n"
    "  -r, --report      print what is in the text instead of the text; with -o, both\n"
    "  -R, --replace     replace malformed text by U+FFFD, and say how much of it there was\n"
    "  -c, --check       write nothing: only say whether the input is well-formed\n"
    "  -q, --quiet       show no progress on the terminal\n"
    "  -h, --help        print this help\n"
    "  -V, --version     print the version\n"
    "\n"
    "Without FILE, or with - for FILE or OUT, the standard streams are used. A byte order mark\n"
    "is text like any other. When the input is malformed, the first fault and its place are named\n"
    "and the exit code is 1; 2 tells of wrong usage. A file OUT then stays as it was, but what\n"
    "goes to standard output or a device has been written up to the fault.\n";

namespace {

struct EncodingName {
  const char* name;
  Encoding encoding;
};
constexpr EncodingName kEncodings[] = {{"utf-8", Encoding::kUtf8},
                                       {"utf-16le", Encoding::kUtf16Le},
                                       {"utf-16be", Encoding::kUtf16Be},
                                       {"ascii", Encoding::kAscii}};

Encoding ParseEncoding(const char* text) {
  for (const EncodingName& e : kEncodings)
    if (strcasecmp(text, e.name) == 0)
      return e.encoding;
  throw UsageError(std::string("unknown encoding '") + text + "'");
}

} // namespace

const char* Name(Encoding encoding) { return kEncodings[static_cast<int>(encoding)].name; }

Options ParseOptions(int argc, char** argv) {
  static const option kOptions[] = {
      {"from", required_argument, nullptr, 'f'},   {"to", required_argument, nullptr, 't'},
      {"output", required_argument, nullptr, 'o'}, {"report", no_argument, nullptr, 'r'},
      {"replace", no_argument, nullptr, 'R'},      {"check", no_argument, nullptr, 'c'},
      {"quiet", no_argument, nullptr, 'q'},        {"help", no_argument, nullptr, 'h'},
      {"version", no_argument, nullptr, 'V'},      {nullptr, 0, nullptr, 0}};
  Options options;
  bool replace = false;
  for (int c; (c = getopt_long(argc, argv, "f:t:o:rRcqhV", kOptions, nullptr)) != -1;) {
    switch (c) {
    case 'f': options.from = ParseEncoding(optarg); break;
    case 't': options.to = ParseEncoding(optarg); break;
    case 'o':
      if (*optarg == '\0')
        throw UsageError("OUT has no name");
      options.output = optarg;
      break;
    case 'r': options.report = true; break;
    case 'R': replace = true; break;
    case 'c': options.mode = Mode::kCheck; break;
    case 'q': options.quiet = true; break;
    case 'h': options.help = true; break;
    case 'V': options.version = true; break;
    default: throw UsageError("");
    }
  }
  if (argc - optind > 1)
    throw UsageError("more than one FILE");
  if (options.to == Encoding::kAscii)
    throw UsageError("ascii is for input only: ASCII text is UTF-8 already");
  if (options.mode == Mode::kCheck && (replace || options.report || !options.output.empty()))
    throw UsageError("--check goes without --output, --report and --replace");
  if (replace)
    options.mode = Mode::kReplace;
  if (optind < argc)
    options.input = argv[optind];
  return options;
}

} // namespace transcode
