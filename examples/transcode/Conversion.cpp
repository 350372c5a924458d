#include "Conversion.h"

#include <cstdio>
#include <optional>
#include <stdexcept>

#include "Progress.h"
#include "Statistics.h"

namespace transcode {

namespace {

std::optional<Output> OpenOutput(const Options& options) {
  if (options.mode == Mode::kCheck || (options.report && options.output.empty()))
    return {};
  return std::optional<Output>(std::in_place, options.output.empty() ? "-" : options.output);
}

/// Returns a description: "U+20AC, which ascii lacks,".
std::string Describe(const Unmappable& unmappable, const Encoding& to) {
  char name[16];
  std::snprintf(name, sizeof(name), "U+%04lX", static_cast<unsigned long>(unmappable.codePoint));
  return std::string(name) + ", which " + to.name + " lacks,";
}

class Conversion {
public:
  explicit Conversion(const Options& options)
      : m_options(options), m_output(OpenOutput(options)),
        m_outgoing(*options.to, options.mark, options.lineEnds, options.mode),
        m_progress(!options.quiet && !(m_output && m_output->IsTerminal()), BytesLeft(options.inputs)) {}

  Result Run();

private:
  /// The file that is being converted.
  struct File {
    const std::string& name;
    Statistics statistics = {};
    std::string firstFault = {};      ///< where the first malformed sequence is
    std::string firstUnmappable = {}; ///< where the first code point is that the output's encoding lacks
  };

  void Take(const std::string& name);
  void TakeBlock(Blocks& blocks, File& file);
  std::string ContinueAfter(const File& file, const std::string& what, const std::string& place);
  void Tell(const File& file, int64 count, const std::string& singular, const std::string& plural,
            const std::string& first);

  const Options& m_options;
  std::optional<Output> m_output;
  Outgoing m_outgoing;
  Progress m_progress;
  Result m_result;
};

Result Conversion::Run() {
  for (const std::string& name : m_options.inputs) {
    try {
      Take(name);
    } catch (const std::runtime_error& e) {
      if (m_options.mode != Mode::kCheck)
        throw;
      m_result.isWell = false;
      m_result.messages += std::string("transcode: ") + e.what() + "\n";
    }
  }
  if (m_output)
    m_output->Finish();
  return m_result;
}

void Conversion::Take(const std::string& name) {
  Input input(name);
  File file = {input.Name()};
  if (m_output && m_output->IsFedBackTo(input))
    throw std::runtime_error(file.name + ": is the output too");
  const char16 replacement = m_output && !m_options.to->IsUnicode() ? '?' : 0xFFFD;
  Blocks blocks(input, *m_options.from, m_options.mode, replacement);
  m_outgoing.BeginFile();
  while (blocks.Next())
    TakeBlock(blocks, file);
  if (m_output)
    m_output->Write(m_outgoing.EndFile());
  Tell(file, blocks.Faults(), "malformed sequence", "malformed sequences", file.firstFault);
  const std::string lacks = std::string(" that ") + m_options.to->name + " lacks";
  Tell(file, m_outgoing.UnmappableCount(), "character" + lacks, "characters" + lacks, file.firstUnmappable);
  if (m_options.report)
    m_result.reports += BytesOf(file.statistics.Report(file.name + ", " + m_options.from->name));
}

void Conversion::TakeBlock(Blocks& blocks, File& file) {
  if (m_output) {
    m_output->Write(m_outgoing.Encode(blocks));
    if (const auto& unmappable = m_outgoing.FirstUnmappable())
      file.firstUnmappable =
          ContinueAfter(file, Describe(*unmappable, *m_options.to),
                        file.statistics.PlaceIn(blocks, blocks.OffsetOf(unmappable->index)));
  }
  if (const auto& fault = blocks.FirstFault())
    file.firstFault = ContinueAfter(file, fault->reason, file.statistics.PlaceIn(blocks, fault->offset));
  const ssize_t size = static_cast<ssize_t>(blocks.Bytes().size());
  file.statistics.Advance(blocks, size);
  if (m_options.report)
    file.statistics.Examine(blocks);
  m_progress.Add(size);
}

/// Returns the place of a fault that is replaced or dropped; any other fault ends the program there.
std::string Conversion::ContinueAfter(const File& file, const std::string& what, const std::string& place) {
  if (m_options.mode == Mode::kReplace || m_options.mode == Mode::kDrop)
    return place;
  if (m_output)
    m_output->Write(m_outgoing.EndFile());
  throw std::runtime_error(file.name + ": " + what + " at " + place);
}

/// Reports how many faults have been replaced or dropped, and where the first was: "2 malformed sequences
/// replaced, the first at byte 3 (line 1, column 4)".
void Conversion::Tell(const File& file, int64 count, const std::string& singular, const std::string& plural,
                      const std::string& first) {
  if (count == 0)
    return;
  m_result.messages += "transcode: " + file.name + ": " + std::to_string(count) + " " +
                       (count == 1 ? singular : plural) +
                       (m_options.mode == Mode::kDrop ? " dropped" : " replaced") +
                       (count == 1 ? ", at " : ", the first at ") + first + "\n";
}

} // namespace

Result Convert(const Options& options) { return Conversion(options).Run(); }

} // namespace transcode
