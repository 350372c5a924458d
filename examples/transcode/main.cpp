// transcode: converts text files between UTF-8, UTF-16 and ASCII, and reports on them.

#include <cstdio>
#include <cstdlib>
#include <exception>
#include <new>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>

#include "Blocks.h"
#include "Files.h"
#include "Options.h"
#include "Progress.h"
#include "Statistics.h"

#include <utils/Version.h>

namespace transcode {

namespace {

constexpr int kExitFailure = 1;
constexpr int kExitUsage = 2;

void Print(std::string_view text) { Output("-").Write(text); }

/// Takes the whole input to the output, if there is one.
Statistics Convert(const Options& options, Input& input, Output* output) {
  Statistics statistics;
  Blocks blocks(input, options.from, options.mode);
  std::string firstFault;
  Progress progress(!options.quiet && !(output && output->IsTerminal()), input.BytesLeft());
  while (blocks.Next()) {
    if (output)
      output->Write(blocks.In(options.to));
    if (const auto& fault = blocks.FirstFault()) {
      const std::string place = statistics.PlaceIn(blocks, fault->offset);
      if (options.mode != Mode::kReplace)
        throw std::runtime_error(options.input + ": " + fault->reason + " at " + place);
      firstFault = place;
    }
    statistics.Advance(blocks, static_cast<ssize_t>(blocks.Bytes().size()));
    if (options.report)
      statistics.Examine(blocks);
    progress.Add(static_cast<ssize_t>(blocks.Bytes().size()));
  }
  statistics.SetReplacements(blocks.Replacements(), firstFault);
  return statistics;
}

void Run(const Options& options) {
  Input input(options.input);
  std::optional<Output> output;
  if (options.mode != Mode::kCheck && (!options.report || !options.output.empty())) {
    output.emplace(options.output.empty() ? "-" : options.output);
    if (output->IsFedBackTo(input))
      throw std::runtime_error(options.input + ": is the output too");
  }
  const Statistics statistics = Convert(options, input, output ? &*output : nullptr);
  if (output)
    output->Finish();
  if (const std::string replaced = statistics.Replaced(); !replaced.empty())
    std::fprintf(stderr, "transcode: %s: %s\n", options.input.c_str(), replaced.c_str());
  if (options.report) {
    const string8 report = statistics.Report(options.input + ", " + Name(options.from));
    Print({report.data(), static_cast<std::size_t>(report.size())});
  }
}

} // namespace

int Main(int argc, char** argv) {
  try {
    const Options options = ParseOptions(argc, argv);
    if (options.help)
      Print(std::string(kUsage) + kHelp);
    else if (options.version)
      Print("transcode (mirel) " MIREL_VERSION_STRING "\n");
    else
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

} // namespace transcode

int main(int argc, char** argv) { return transcode::Main(argc, argv); }
