#include <fmt/format.h>

#include <algorithm>
#include <span>
#include <string>
#include <vector>

#include "kolvane/lib/BinaryParser.h"
#include "kolvane/lib/Converters.h"
#include "kolvane/lib/DictionaryReader.h"
#include "tools/kolvane/cli/CommandLine.h"
#include "tools/kolvane/cli/OutputFile.h"
#include "tools/kolvane/commands/Commands.h"
#include "tools/kolvane/commands/EncodingOption.h"
#include "tools/kolvane/dictionary/FileKind.h"
#include "tools/kolvane/dictionary/ImageFile.h"
#include "tools/kolvane/dictionary/MalformedText.h"
#include "tools/kolvane/text/UTF8.h"
#include "tools/kolvane/text/Unicode.h"

namespace {

using Units = std::span<const uint16_t>;

constexpr const char* kAbout =
    R"(Change the encoding of a text dictionary, and nothing else.

Examples:
  kolvane convert pl.txt -o pl-utf16.txt --to utf-16le
  kolvane convert es.txt -o - --to utf-8

Lines, their order, ends and spacing stay as they are. UTF-16 gets a byte-order mark, the other
encodings have none. A character that the target lacks, and input that is malformed, is named with its
line, and nothing is written. INPUT may be '-' for standard input, and OUT may be INPUT.)";

struct Request {
  std::string input;
  std::string output;
  TextEncoding target = TextEncoding::kUTF8;
  FileEncoding encoding = FileEncoding::kAuto;
};

void AddOptions(CommandLine& commandLine, Request& request) {
  commandLine.BeginGroup("Output");
  commandLine.AddValue(
      {.names = "-o,--output", .text = "Write to FILE", .value = "FILE", .isRequired = true},
      request.output);
  commandLine.AddChoice<TextEncoding>(
      {.names = "--to", .text = "The encoding to write", .value = "ENCODING", .isRequired = true},
      {{"utf-8", TextEncoding::kUTF8},
       {"utf-16le", TextEncoding::kUTF16LE},
       {"utf-16be", TextEncoding::kUTF16BE},
       {"code-page", TextEncoding::kCodePage}},
      request.target);
  commandLine.BeginGroup("Dictionaries");
  AddEncodingOption(commandLine, request.encoding);
}

// With its line end, which CR LF is one of.
size_t LengthOfLine(Units text) noexcept {
  const auto end = static_cast<size_t>(std::ranges::find_if(text, IsLineEnd) - text.begin());
  if (end == text.size()) return end;
  const bool isPair = text[end] == '\r' && end + 1 < text.size() && text[end + 1] == '\n';
  return end + (isPair ? 2 : 1);
}

// `name:line:column` of what follows the text.
std::string PlaceBehind(Units text, const std::string& name) {
  size_t line = 1;
  for (size_t length = LengthOfLine(text); length != 0 && IsLineEnd(text[length - 1]);
       length = LengthOfLine(text)) {
    text = text.subspan(length);
    ++line;
  }
  return fmt::format("{}:{}:{}", name, line, 1 + CodePointCount(text));
}

// Throws Failure for what is no text, or malformed.
std::vector<uint16_t> Decoded(const ImageFile& file) {
  const std::string name = Printable(file.name);
  if (tovali_private::HasBinaryMagic(file.bytes)) {
    throw Failure(name +
                  ": a binary dictionary has no encoding to change; 'kolvane dump' prints it");
  }
  if (KindOf(file) == FileKind::kUTF16WithoutMark) RequireDictionary(file);
  if (const auto malformed = MalformedText(file)) throw Failure(*malformed);
  if (!file.utf8.empty()) return ToUTF16(WithoutUTF8Mark(file.utf8));
  const TextEncoding source = tovali_private::EncodingFromBOM(file.bytes);
  if (source == TextEncoding::kCodePage) {
    return FromMultiByte(file.bytes, tovali_private::kDefaultSelector);
  }
  std::vector<uint16_t> units =
      DecodedUTF16(std::string_view(file.bytes).substr(2), source == TextEncoding::kUTF16BE);
  if (file.bytes.size() % 2 != 0) {
    throw Failure(fmt::format("{}: byte {} is half a character", PlaceBehind(units, name),
                              file.bytes.size() - 1));
  }
  return units;
}

// Text without a byte-order mark must not begin with what marks something else.
void RefuseMisreading(const std::string& name, std::string_view text, TextEncoding target) {
  if (target == TextEncoding::kUTF16LE || target == TextEncoding::kUTF16BE) return;
  const bool isUTF16 =
      tovali_private::EncodingFromBOM(text) != TextEncoding::kCodePage || LooksLikeUTF16(text);
  if (!isUTF16 && !tovali_private::HasBinaryMagic(text)) return;
  throw Failure(
      fmt::format("{}:1:1: nothing was written, for without a byte-order mark the text "
                  "would be taken for {}",
                  Printable(name), isUTF16 ? "UTF-16" : "a binary dictionary"));
}

std::string BytesOf(Units units, bool isBigEndian) {
  std::string bytes;
  bytes.reserve(units.size_bytes());
  for (const uint16_t unit : units) {
    const char low = static_cast<char>(unit & 0xFF);
    const char high = static_cast<char>(unit >> 8);
    bytes += isBigEndian ? high : low;
    bytes += isBigEndian ? low : high;
  }
  return bytes;
}

// One line after the other in the target's encoding; says which cannot be.
class Encoder {
 public:
  Encoder(const std::string& fileName, TextEncoding targetEncoding)
      : name(Printable(fileName)), target(targetEncoding), text(UTF16Mark(targetEncoding)) {}

  void Append(Units line) {
    ++lineNumber;
    if (target == TextEncoding::kUTF16LE || target == TextEncoding::kUTF16BE) {
      text += BytesOf(line, target == TextEncoding::kUTF16BE);
      return;
    }
    const int* const selector = tovali_private::SelectorFor(target);
    const std::string encoded = ToMultiByte(line, selector);
    const std::vector<uint16_t> back = FromMultiByte(encoded, selector);
    if (std::ranges::equal(back, line)) {
      text += encoded;
    } else {
      ReportLoss(line, back);
    }
  }

  size_t LossCount() const noexcept { return losses; }
  const std::string& Text() const noexcept { return text; }

 private:
  static constexpr size_t kMostReports = 20;

  void ReportLoss(Units line, Units back) {
    if (++losses > kMostReports) return;
    const auto at = static_cast<size_t>(std::ranges::mismatch(line, back).in1 - line.begin());
    Say(fmt::format("{}:{}:{}: {} has no place in {}", name, lineNumber,
                    1 + CodePointCount(line.first(at)), CodePointText(CodePointAt(line, at)),
                    target == TextEncoding::kUTF8 ? "UTF-8" : "the code page"));
  }

  std::string name;
  TextEncoding target;
  std::string text;
  size_t lineNumber = 0;
  size_t losses = 0;
};

ExitStatus Convert(const Request& request) {
  const ImageFile file = ReadImageFile(request.input, request.encoding);
  const std::vector<uint16_t> units = Decoded(file);
  Encoder encoder(file.name, request.target);
  for (Units rest(units); !rest.empty();) {
    const size_t length = LengthOfLine(rest);
    encoder.Append(rest.first(length));
    rest = rest.subspan(length);
  }
  if (encoder.LossCount() != 0) {
    throw Failure(fmt::format(
        "nothing was written, for {} cannot be converted",
        encoder.LossCount() == 1 ? "a line" : fmt::format("{} lines", encoder.LossCount())));
  }
  RefuseMisreading(file.name, encoder.Text(), request.target);
  WriteFile(request.output, encoder.Text());
  return ExitStatus::kDone;
}

}  // namespace

ExitStatus RunConvert(int argc, const char* const* argv) {
  Request request;
  CommandLine commandLine("kolvane convert", "INPUT -o OUT --to ENCODING", kAbout);
  AddOptions(commandLine, request);
  request.input = OneFile(commandLine.Parse(argc, argv));
  return Convert(request);
}
