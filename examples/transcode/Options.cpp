#include "Options.h"

#include <optional>
#include <string_view>

#include <getopt.h>
#include <strings.h>

namespace transcode {

const char kUsage[] = "Usage: transcode [--from ENC] [--to ENC] [-o OUT] [--report] [--replace | -c]\n"
                      "                 [--bom HOW] [--line-endings ENDS] [--quiet] [FILE...]\n"
                      "       transcode --check [--from ENC] [--quiet] [FILE...]\n"
                      "       transcode --list | --help | --version\n";
const char kHelp[] = "Converts text of any length from one encoding to another, in little memory.\n"
                     "\n"
                     "  -f, --from ENC           encoding of the input, utf-8 by default\n"
                     "  -t, --to ENC             encoding of the output, utf-8 by default\n"
                     "  -l, --list               print the encodings, each with its other names\n"
                     "  -o, --output OUT         write to the file OUT instead of standard output\n"
                     "  -r, --report             print a report on the text instead of the text;\n"
                     "                           with -o, both\n"
                     "  -R, --replace            replace malformed text with U+FFFD, and characters\n"
                     "                           that the output's encoding lacks with ?; say how many\n"
                     "  -c, --drop               leave them out instead, and say how many\n"
                     "  -C, --check              write nothing, only check whether the input is\n"
                     "                           well-formed\n"
                     "      --bom HOW            keep, strip or add the byte order mark; by default\n"
                     "                           add it in utf-16 and utf-32 output, strip it if only\n"
                     "                           the input is one of these, and keep it otherwise\n"
                     "      --line-endings ENDS  end each line with lf or crlf\n"
                     "  -q, --quiet              show no progress on the terminal\n"
                     "  -h, --help               print this help\n"
                     "  -V, --version            print the version\n"
                     "\n"
                     "Without FILE, or with - for FILE or OUT, the standard streams are used. The\n"
                     "text of several files is joined. If the input is malformed, or has a character\n"
                     "that the output's encoding lacks, the program names the first fault and its\n"
                     "place and exits with 1; wrong usage exits with 2. A file OUT then stays as it\n"
                     "was, but standard output or a device has got the text up to the fault.\n";

namespace {

enum LongOnly { kBom = 256, kLineEndings };

constexpr option kOptions[] = {
    {"from", required_argument, nullptr, 'f'}, {"to", required_argument, nullptr, 't'},
    {"list", no_argument, nullptr, 'l'},       {"output", required_argument, nullptr, 'o'},
    {"report", no_argument, nullptr, 'r'},     {"replace", no_argument, nullptr, 'R'},
    {"drop", no_argument, nullptr, 'c'},       {"check", no_argument, nullptr, 'C'},
    {"bom", required_argument, nullptr, kBom}, {"line-endings", required_argument, nullptr, kLineEndings},
    {"quiet", no_argument, nullptr, 'q'},      {"help", no_argument, nullptr, 'h'},
    {"version", no_argument, nullptr, 'V'},    {nullptr, 0, nullptr, 0}};

/// The options as they are read, before it is checked whether they go together.
struct Parsed {
  Options options;
  bool replace = false;
  bool drop = false;
  bool check = false;
  const Encoding* to = nullptr; ///< as given by --to
  std::optional<Mark> mark;
};

const Encoding* ParseEncoding(const char* name) {
  if (const Encoding* const encoding = FindEncoding(name))
    return encoding;
  const std::string nearest = NearestNames(name);
  throw UsageError(
      std::string("unknown encoding '") + name + "'; " +
      (nearest.empty() ? "--list prints those that are known" : "did you mean " + nearest + "?"));
}

bool Is(const char* text, const char* word) { return strcasecmp(text, word) == 0; }

Mark ParseMark(const char* how) {
  if (Is(how, "keep"))
    return Mark::kKeep;
  if (Is(how, "strip"))
    return Mark::kStrip;
  if (Is(how, "add"))
    return Mark::kAdd;
  throw UsageError("--bom takes keep, strip or add, not '" + std::string(how) + "'");
}

LineEnds ParseLineEnds(const char* ends) {
  if (Is(ends, "lf"))
    return LineEnds::kLf;
  if (Is(ends, "crlf"))
    return LineEnds::kCrLf;
  throw UsageError("--line-endings takes lf or crlf, not '" + std::string(ends) + "'");
}

std::string ParseOutput(std::string_view name) {
  if (name.empty())
    throw UsageError("OUT has no name");
  return std::string(name);
}

void ParseOption(Parsed& parsed, int option) {
  Options& options = parsed.options;
  switch (option) {
  case 'f': options.from = ParseEncoding(optarg); break;
  case 't': parsed.to = ParseEncoding(optarg); break;
  case 'l': options.list = true; break;
  case 'o': options.output = ParseOutput(optarg); break;
  case 'r': options.report = true; break;
  case 'R': parsed.replace = true; break;
  case 'c': parsed.drop = true; break;
  case 'C': parsed.check = true; break;
  case kBom: parsed.mark = ParseMark(optarg); break;
  case kLineEndings: options.lineEnds = ParseLineEnds(optarg); break;
  case 'q': options.quiet = true; break;
  case 'h': options.help = true; break;
  case 'V': options.version = true; break;
  default: throw UsageError("");
  }
}

/// The default of --bom. The mark tells the byte order in utf-16 and utf-32; in other encodings it is text.
Mark UsualMark(const Encoding& from, const Encoding& to) {
  if (to.IsByMark())
    return Mark::kAdd;
  return from.IsByMark() ? Mark::kStrip : Mark::kKeep;
}

void Combine(Parsed& parsed) {
  Options& options = parsed.options;
  if (parsed.check && (parsed.replace || parsed.drop || options.report || !options.output.empty() ||
                       parsed.to != nullptr || parsed.mark || options.lineEnds != LineEnds::kKeep))
    throw UsageError("--check goes with --from and --quiet only");
  if (parsed.replace && parsed.drop)
    throw UsageError("--replace and --drop exclude each other");
  if (parsed.to != nullptr)
    options.to = parsed.to;
  if (parsed.mark == Mark::kAdd && !options.to->IsUnicode())
    throw UsageError(std::string(options.to->name) + " has no byte order mark to add");
  options.mark = parsed.mark.value_or(UsualMark(*options.from, *options.to));
  options.mode = parsed.check     ? Mode::kCheck
                 : parsed.replace ? Mode::kReplace
                 : parsed.drop    ? Mode::kDrop
                                  : Mode::kConvert;
  if (options.inputs.empty())
    options.inputs = {"-"};
}

} // namespace

Options ParseOptions(int argc, char** argv) {
  Parsed parsed;
  for (int option; (option = getopt_long(argc, argv, "f:t:lo:rRcCqhV", kOptions, nullptr)) != -1;)
    ParseOption(parsed, option);
  parsed.options.inputs.assign(argv + optind, argv + argc);
  Combine(parsed);
  return parsed.options;
}

} // namespace transcode
