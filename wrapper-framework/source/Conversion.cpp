#include "wrapper-framework/source/Conversion.h"

#include <algorithm>
#include <cstdint>
#include <deque>
#include <optional>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

#include "wrapper-framework/source/Data.h"
#include "wrapper-framework/source/Exceptions.h"
#include "wrapper-framework/source/Tokens.h"

namespace Varnel {
namespace {

// A list or dictionary in the course of its conversion, one datum after the other.
class Frame {
 public:
  explicit Frame(ListRef source) : items(std::move(source)) {}
  explicit Frame(DictionaryRef source)
      : dictionary(std::move(source)), items(dictionary.CreateKeyList()) {}

  // Retains the data that the list or dictionary was read from.
  void Hold(DataRef from, DataRef coercedFrom) noexcept {
    sourceData = std::move(from);
    coercedData = std::move(coercedFrom);
  }

  bool IsDictionary() const noexcept { return static_cast<bool>(dictionary); }

  // Moves to the next datum. Returns false at the end.
  bool Advance() {
    if (index >= items.GetSize()) return false;
    (IsDictionary() ? key : datum) = items.GetEntry(index++);
    if (!IsDictionary()) return true;
    keyToken = ExtractData<VRKToken>(key);
    datum = dictionary.GetEntry(keyToken);
    return true;
  }

  const DataRef& Datum() const noexcept { return datum; }

  // Stores the datum's value and releases the datum.
  void Accept(orvane::value_t value) {
    const orvane::name_t name = IsDictionary() ? TokenName(keyToken) : orvane::name_t();
    accepted.push_back({name, index, std::move(value)});
    datum.Reset();
    if (IsDictionary()) key.Reset();
  }

  orvane::array_t Array() {
    orvane::array_t array;
    for (Accepted& each : accepted) array.push_back(std::move(each.value));
    return array;
  }

  // Inserts in the order of the names, so that each pair is appended.
  orvane::dictionary_t Dictionary() {
    std::ranges::sort(accepted, {},
                      [](const Accepted& each) { return std::pair(each.name, each.place); });
    orvane::dictionary_t result;
    for (const Accepted& each : accepted) result.insert_or_assign(each.name, each.value);
    return result;
  }

 private:
  struct Accepted {
    orvane::name_t name;  // empty in a list
    uint32_t place;
    orvane::value_t value;
  };

  DataRef sourceData;
  DataRef coercedData;
  DictionaryRef dictionary;  // null for a list
  ListRef items;             // the list, or the dictionary's keys
  uint32_t index = 0;
  DataRef key;
  VRKToken keyToken{};
  DataRef datum;
  std::vector<Accepted> accepted;
};

// Converts a datum and everything nested in it, with an explicit stack of frames.
class Conversion {
 public:
  // Starts with a datum, or with a list or dictionary.
  void Begin(const DataRef& datum);
  template <class Ref>
  Frame& Enter(Ref listOrDictionary);

  orvane::value_t Run();

 private:
  void CountValue();
  std::string Counted(std::string text);

  std::deque<Frame> frames;                 // a stack that does not move its frames
  std::optional<orvane::value_t> finished;  // not yet accepted by the innermost frame
  size_t valueCount = 0;
  uint64_t textBytes = 0;
};

void Conversion::Begin(const DataRef& datum) {
  CountValue();
  DataRef source(datum);
  VRKToken type{};
  ThrowIfFailed(VRKDataGetData(source.Get(), nullptr, nullptr, &type));

  DataRef coerced;
  const auto becomes = [&source, &coerced](const char* typeText) {
    return source.Coerce(MakeToken(typeText), coerced);
  };
  if (becomes(kTypeDouble)) {
    finished.emplace(GetDouble(coerced));
  } else if (becomes(kTypeBool)) {
    finished.emplace(GetBool(coerced));
  } else if (becomes(kTypeUTF8)) {
    finished.emplace(Counted(GetUTF8(coerced)));
  } else if (becomes(kTypeNull)) {
    finished.emplace();
  } else if (becomes(kTypeToken)) {
    finished.emplace(TokenName(GetToken(coerced)));
  } else if (becomes(kTypeList)) {
    Frame& frame = Enter(GetList(coerced));
    frame.Hold(std::move(source), std::move(coerced));
  } else if (becomes(kTypeDictionary)) {
    Frame& frame = Enter(GetDictionary(coerced));
    frame.Hold(std::move(source), std::move(coerced));
  } else {
    throw std::domain_error("Attempt to convert unsupported data type in Varnel::AsValue");
  }
}

void Conversion::CountValue() {
  if (++valueCount > kValueLimit) {
    throw std::length_error("Lists and dictionaries hold too much in Varnel::AsValue");
  }
}

std::string Conversion::Counted(std::string text) {
  textBytes += text.size();
  if (textBytes > kTextLimit) throw std::length_error("Too much text in Varnel::AsValue");
  return text;
}

template <class Ref>
Frame& Conversion::Enter(Ref listOrDictionary) {
  if (frames.size() == kNestingLimit) {
    throw std::length_error("Lists and dictionaries are nested too deeply in Varnel::AsValue");
  }
  return frames.emplace_back(std::move(listOrDictionary));
}

orvane::value_t Conversion::Run() {
  while (!frames.empty()) {
    Frame& frame = frames.back();
    if (finished) frame.Accept(*std::exchange(finished, std::nullopt));
    if (frame.Advance()) {
      Begin(frame.Datum());
    } else {
      finished = frame.IsDictionary() ? orvane::value_t(frame.Dictionary())
                                      : orvane::value_t(frame.Array());
      frames.pop_back();
    }
  }
  return *std::move(finished);
}

}  // namespace

orvane::value_t AsValue(const DataRef& source) {
  Conversion conversion;
  conversion.Begin(source);
  return conversion.Run();
}

orvane::array_t AsArray(const ListRef& source) {
  Conversion conversion;
  conversion.Enter(source);
  return *conversion.Run().get_if<orvane::array_t>();
}

orvane::dictionary_t AsDictionary(const DictionaryRef& source) {
  if (!source) return {};
  Conversion conversion;
  conversion.Enter(source);
  return *conversion.Run().get_if<orvane::dictionary_t>();
}

}  // namespace Varnel
