// transcode: converts text files between UTF-8, UTF-16, UTF-32, Latin-1 and ASCII, and reports on them.

#include <cstdio>
#include <cstdlib>
#include <exception>
#include <new>
#include <string>
#include <string_view>

#include "Conversion.h"
#include "Encodings.h"
#include "Files.h"
#include "Options.h"

#include <utils/Version.h>

namespace transcode {

namespace {

constexpr int kExitFailure = 1;
constexpr int kExitUsage = 2;

void Print(std::string_view text) { Output("-").Write(text); }

/// Does what the options ask for. @return whether all is well
bool Run(const Options& options) {
  if (options.help) {
    Print(std::string(kUsage) + kHelp);
  } else if (options.version) {
    Print("transcode (mirel) " MIREL_VERSION_STRING "\n");
  } else if (options.list) {
    Print(ListEncodings());
  } else {
    const Result result = Convert(options);
    std::fputs(result.messages.c_str(), stderr);
    Print(result.reports);
    return result.isWell;
  }
  return true;
}

} // namespace

int Main(int argc, char** argv) {
  static char name[] = "transcode"; // the parser's messages begin with it instead of a path
  if (argc > 0)
    argv[0] = name;
  HoldClosedStreams();
  try {
    return Run(ParseOptions(argc, argv)) ? EXIT_SUCCESS : kExitFailure;
  } catch (const UsageError& e) {
    if (*e.what() != '\0') // otherwise the parser has said what is wrong
      std::fprintf(stderr, "transcode: %s\n", e.what());
    std::fprintf(stderr, "Try 'transcode --help'.\n");
    return kExitUsage;
  } catch (const std::bad_alloc&) {
    std::fprintf(stderr, "transcode: not enough memory\n");
  } catch (const std::exception& e) {
    std::fprintf(stderr, "transcode: %s\n", e.what());
  }
  return kExitFailure;
}

} // namespace transcode

int main(int argc, char** argv) { return transcode::Main(argc, argv); }
