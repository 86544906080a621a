#include "tools/kolvane/host/KernelTrace.h"

#include <fmt/format.h>

#include <algorithm>
#include <cstdio>
#include <span>
#include <string_view>
#include <vector>

#include "tools/kolvane/cli/Diagnostics.h"
#include "tools/kolvane/host/ResultText.h"
#include "tools/kolvane/text/Unicode.h"

namespace {

std::span<const VRKHostTraceArgument> Arguments(const VRKHostTraceCall& call) {
  return {call.arguments, call.argumentCount};
}

// Only as much of the text is repaired as its excerpt may show.
std::string Quoted(std::string_view text) {
  constexpr size_t kEnough = 256;
  return '"' + Excerpt(ToUTF8(ToUTF16(text.substr(0, kEnough)))) + '"';
}

std::string TokenText(uint32_t token) {
  const char* const text = VRKTokenGetString(VRKToken{token});
  return text != nullptr ? Quoted(text) : fmt::format("token {:#x}", token);
}

std::string Text(std::string_view type, std::string_view bytes) {
  if (type.ends_with("utf8")) return ' ' + Quoted(bytes);
  if (!type.ends_with("utf16") && !type.ends_with("utf16le")) return {};
  constexpr size_t kEnough = 128;
  std::vector<uint16_t> units(std::min(bytes.size() / 2, kEnough));
  std::copy_n(bytes.begin(), units.size() * 2, reinterpret_cast<char*>(units.data()));
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

const char* KindOf(const VRKHostTraceArgument& handle) {
  switch (handle.kind) {
    case kVRKTraceObject:
      return "object";
    case kVRKTraceHandler:
      return "handler";
    case kVRKTraceData:
      return "data";
    case kVRKTraceList:
      return "list";
    case kVRKTraceDictionary:
      return "dictionary";
    default:
      return "handle";
  }
}

std::string Described(const VRKHostTraceArgument& argument) {
  const auto unlessNull = [](bool isNull, const auto& text) { return isNull ? "null" : text(); };
  switch (argument.kind) {
    case kVRKTraceNumber:
      return std::to_string(argument.number);
    case kVRKTracePointer:
      return argument.pointer == nullptr ? "null" : "*";
    case kVRKTraceText:
      return unlessNull(argument.pointer == nullptr,
                        [&] { return Quoted(static_cast<const char*>(argument.pointer)); });
    case kVRKTraceToken:
      return unlessNull(argument.number == 0, [&] { return TokenText(argument.number); });
    default:
      return unlessNull(argument.number == 0,
                        [&] { return fmt::format("{} {:#x}", KindOf(argument), argument.number); });
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
