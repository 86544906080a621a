#include "KernelTrace.h"

#include <fmt/format.h>

#include <algorithm>
#include <cstdio>
#include <span>
#include <string_view>
#include <vector>

#include "Messages.h"
#include "ResultText.h"
#include "Text.h"

namespace {

std::span<const VRKHostTraceArgument> Arguments(const VRKHostTraceCall& call) {
  return {call.arguments, call.argumentCount};
}

// The beginning of a text, cut between two characters.
std::string Quoted(std::string_view text) {
  constexpr size_t kGlimpse = 60;
  const auto isInside = [](char byte) { return (static_cast<unsigned char>(byte) & 0xC0) == 0x80; };
  size_t size = std::min(text.size(), kGlimpse);
  while (size > 0 && size < text.size() && isInside(text[size])) --size;
  return fmt::format("\"{}\"{}", Printable(text.substr(0, size)), size < text.size() ? "..." : "");
}

std::string TokenText(uint32_t token) {
  const char* const text = VRKTokenGetString(VRKToken{token});
  return text != nullptr ? Quoted(text) : fmt::format("token {:#x}", token);
}

// Enough of the bytes of a text for a glimpse of it.
std::string Text(std::string_view type, std::string_view bytes) {
  constexpr size_t kEnough = 256;
  const std::string_view begin = bytes.substr(0, kEnough);
  if (type.ends_with("utf8")) return ' ' + Quoted(ToUTF8(ToUTF16(begin)));
  if (!type.ends_with("utf16") && !type.ends_with("utf16le")) return {};
  std::vector<uint16_t> units(begin.size() / 2);
  std::copy_n(begin.begin(), units.size() * 2, reinterpret_cast<char*>(units.data()));
  return ' ' + Quoted(ToUTF8(units));
}

// What the data is and, if it is text that can be shown, how it begins.
std::string Glimpse(uint32_t data) {
  const void* bytes = nullptr;
  uint32_t byteCount = 0;
  VRKToken type{};
  if (VRKDataGetData(VRKData{data}, &bytes, &byteCount, &type) != kVRKNoError) return {};
  const char* const name = VRKTokenGetString(type);
  const std::string_view payload(static_cast<const char*>(bytes), byteCount);
  return fmt::format(" ({}, {} bytes{})", name, byteCount, Text(name, payload));
}

std::string Described(const VRKHostTraceArgument& argument) {
  const char* const kinds[] = {"", "", "", "object", "handler", "", "data", "list", "dictionary"};
  switch (argument.kind) {
    case kVRKTraceNumber:
      return std::to_string(argument.number);
    case kVRKTraceText:
      return argument.pointer != nullptr ? Quoted(static_cast<const char*>(argument.pointer))
                                         : "null";
    case kVRKTracePointer:
      return argument.pointer != nullptr ? "*" : "null";
    case kVRKTraceToken:
      return argument.number != 0 ? TokenText(argument.number) : "null";
    default:
      return argument.number != 0 ? fmt::format("{} {:#x}", kinds[argument.kind], argument.number)
                                  : "null";
  }
}

// Holders give up the nothing that they hold all the time.
bool DoesNothing(const VRKHostTraceCall& call) {
  const std::string_view operation = call.operation;
  return (operation.ends_with("Retain") || operation.ends_with("Release")) &&
         call.arguments[0].number == 0;
}

std::string Inputs(const VRKHostTraceCall& call) {
  std::string text;
  for (const VRKHostTraceArgument& argument : Arguments(call)) {
    if (argument.isOut != 0) continue;
    text += (text.empty() ? "" : ", ") + Described(argument);
  }
  return text;
}

// Outs that nobody asked for have no address.
std::string Outputs(const VRKHostTraceCall& call) {
  std::string text;
  for (const VRKHostTraceArgument& argument : Arguments(call)) {
    if (argument.isOut == 0 || argument.pointer == nullptr) continue;
    text += (text.empty() ? " -> " : ", ") + Described(argument);
    if (argument.kind == kVRKTraceData) text += Glimpse(argument.number);
  }
  return text;
}

}  // namespace

KernelTrace::KernelTrace() {
  VRKHostSetTraceHook(&Hook, this);
}

KernelTrace::~KernelTrace() {
  VRKHostSetTraceHook(nullptr, nullptr);
}

// Without memory, a line is lost.
VRKResult KernelTrace::Hook(const VRKHostTraceCall* call, void* context) {
  try {
    if (DoesNothing(*call)) return kVRKNoError;
    KernelTrace& trace = *static_cast<KernelTrace*>(context);
    call->isFinished == 0 ? trace.Enter(*call) : trace.Leave(*call);
  } catch (...) {
  }
  return kVRKNoError;
}

void KernelTrace::Enter(const VRKHostTraceCall& call) {
  if (isOpen) {
    line += " {";
    Print();
  }
  line = fmt::format("{:{}}{}({})", "", call.depth * 2, call.operation, Inputs(call));
  isOpen = true;
}

void KernelTrace::Leave(const VRKHostTraceCall& call) {
  if (!isOpen) line = fmt::format("{:{}}}}", "", call.depth * 2);
  line += call.result == kVRKNoError ? Outputs(call) : " -> " + ResultText(call.result);
  Print();
  isOpen = false;
}

void KernelTrace::Print() {
  line += '\n';
  static_cast<void>(std::fwrite(line.data(), 1, line.size(), stderr));
}
