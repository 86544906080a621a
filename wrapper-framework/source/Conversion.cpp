#include "Conversion.h"

#include <algorithm>
#include <cstdint>
#include <memory>
#include <optional>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

#include "Data.h"
#include "Exceptions.h"
#include "Tokens.h"

namespace Varnel {
namespace {

// A list or dictionary whose data are being converted one after the other.
class Frame {
 public:
  Frame() = default;
  Frame(const Frame&) = delete;
  Frame& operator=(const Frame&) = delete;
  virtual ~Frame() = default;

  // Goes on to the next datum, if there is one.
  virtual bool Advance() = 0;
  virtual const DataRef& Datum() const = 0;

  // Puts the datum's value where it belongs, and lets go of the datum.
  virtual void Accept(orvane::value_t value) = 0;

  virtual orvane::value_t Result() = 0;

  // Holds on to the data that the list or dictionary came out of.
  void Hold(DataRef from, DataRef coercedFrom) noexcept {
    sourceData = std::move(from);
    coercedData = std::move(coercedFrom);
  }

 private:
  DataRef sourceData;
  DataRef coercedData;
};

class ListFrame final : public Frame {
 public:
  explicit ListFrame(ListRef source) : list(std::move(source)) {}

  bool Advance() override {
    if (index >= list.GetSize()) return false;
    entry = list.GetEntry(index++);
    return true;
  }

  const DataRef& Datum() const override { return entry; }

  void Accept(orvane::value_t value) override {
    array.push_back(std::move(value));
    entry.Reset();
  }

  orvane::value_t Result() override { return orvane::value_t(array); }

 private:
  ListRef list;
  orvane::array_t array;
  uint32_t index = 0;
  DataRef entry;
};

class DictionaryFrame final : public Frame {
 public:
  explicit DictionaryFrame(DictionaryRef source)
      : dictionary(std::move(source)), keys(dictionary.CreateKeyList()) {}

  bool Advance() override {
    if (index >= keys.GetSize()) return false;
    key = keys.GetEntry(index++);
    keyToken = ExtractData<VRKToken>(key);
    entry = dictionary.GetEntry(keyToken);
    return true;
  }

  const DataRef& Datum() const override { return entry; }

  void Accept(orvane::value_t value) override {
    accepted.push_back({TokenName(keyToken), index, std::move(value)});
    entry.Reset();
    key.Reset();
  }

  // Puts each value at the result's end, where it need not make room for it.
  orvane::value_t Result() override {
    std::ranges::sort(accepted, {},
                      [](const Accepted& each) { return std::pair(each.name, each.place); });
    orvane::dictionary_t result;
    for (const Accepted& each : accepted) result.insert_or_assign(each.name, each.value);
    return orvane::value_t(result);
  }

 private:
  struct Accepted {
    orvane::name_t name;
    uint32_t place;
    orvane::value_t value;
  };

  DictionaryRef dictionary;
  ListRef keys;
  std::vector<Accepted> accepted;
  uint32_t index = 0;
  DataRef key;
  VRKToken keyToken{};
  DataRef entry;
};

// Converts one thing and all that is nested in it, by a stack of frames.
class Conversion {
 public:
  // Begins with data, or with a list or dictionary itself.
  void Begin(const DataRef& datum);
  void Enter(std::unique_ptr<Frame> frame);

  orvane::value_t Run();

 private:
  void CountValue();
  std::string Counted(std::string text);

  std::vector<std::unique_ptr<Frame>> frames;
  std::optional<orvane::value_t> finished;  // what the innermost frame has to accept
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
    Enter(std::make_unique<ListFrame>(GetList(coerced)));
    frames.back()->Hold(std::move(source), std::move(coerced));
  } else if (becomes(kTypeDictionary)) {
    Enter(std::make_unique<DictionaryFrame>(GetDictionary(coerced)));
    frames.back()->Hold(std::move(source), std::move(coerced));
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

void Conversion::Enter(std::unique_ptr<Frame> frame) {
  if (frames.size() == kNestingLimit) {
    throw std::length_error("Lists and dictionaries are nested too deeply in Varnel::AsValue");
  }
  frames.push_back(std::move(frame));
}

orvane::value_t Conversion::Run() {
  while (!frames.empty()) {
    Frame& frame = *frames.back();
    if (finished) frame.Accept(*std::exchange(finished, std::nullopt));
    if (frame.Advance()) {
      Begin(frame.Datum());
    } else {
      finished = frame.Result();
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
  conversion.Enter(std::make_unique<ListFrame>(source));
  return *conversion.Run().get_if<orvane::array_t>();
}

orvane::dictionary_t AsDictionary(const DictionaryRef& source) {
  if (!source) return {};
  Conversion conversion;
  conversion.Enter(std::make_unique<DictionaryFrame>(source));
  return *conversion.Run().get_if<orvane::dictionary_t>();
}

}  // namespace Varnel
