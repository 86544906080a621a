#include "varnel-kernel/Coercions.h"

#include <algorithm>
#include <iterator>
#include <memory>
#include <utility>

namespace varnel_kernel {
namespace {

// Holds a reference to data while callbacks run that may release theirs.
class HeldData {
 public:
  HeldData(Values& valueStore, VRKData heldData) noexcept : values(valueStore), data(heldData) {
    values.Retain<Data>(data);
  }
  ~HeldData() { values.Release<Data>(data); }
  HeldData(const HeldData&) = delete;
  HeldData& operator=(const HeldData&) = delete;

 private:
  Values& values;
  VRKData data;
};

}  // namespace

Coercions::Coercions(HandleTable& handleTable, TokenTable& tokenTable, Values& valueStore,
                     ActiveCallback*& innermostCode)
    : handles(handleTable),
      tokens(tokenTable),
      values(valueStore),
      running(innermostCode),
      texts(tokenTable) {}

VRKResult Coercions::Coerce(VRKData data, VRKToken toType, VRKData& outData) {
  const Data* const source = handles.Find<Data>(data);
  if (source == nullptr || !tokens.Holds(toType)) return kVRKInvalidHandle;
  if (source->type != toType) return Convert(data, source->type, toType, outData);
  handles.Retain<Data>(data);
  outData = data;
  return kVRKNoError;
}

VRKResult Coercions::Convert(VRKData data, VRKToken fromType, VRKToken toType, VRKData& outData) {
  const HeldData held(values, data);
  uint64_t before = nextNumber;
  while (const Coercion* const coercion = LatestBefore(before, fromType, toType)) {
    before = coercion->number;
    const VRKResult result = CoerceThrough(coercion->callback, data, fromType, toType, outData);
    if (result != kVRKCannotCoerce) return result;
  }
  Data* const source = handles.Find<Data>(data);
  if (source == nullptr)
    return kVRKInvalidHandle;  // a callback released references that it did not own
  std::unique_ptr<Data> coerced = texts.Coerce(*source, toType);
  if (coerced == nullptr) return kVRKCannotCoerce;
  outData = handles.Add(std::move(coerced));
  return kVRKNoError;
}

const Coercion* Coercions::LatestBefore(uint64_t number, VRKToken fromType,
                                        VRKToken toType) const noexcept {
  const auto end = std::ranges::lower_bound(installed, number, {}, &Coercion::number);
  const auto latest = std::make_reverse_iterator(end);
  const auto found = std::find_if(latest, installed.rend(), [&](const Coercion& each) {
    return each.fromType == fromType && each.toType == toType;
  });
  return found == installed.rend() ? nullptr : &*found;
}

VRKResult Coercions::CoerceThrough(Callback<VRKDataCoercionCallback> callback, VRKData data,
                                   VRKToken fromType, VRKToken toType, VRKData& outData) {
  VRKData coerced{};
  const VRKResult result = CallOut(running, kVRKCallbackThrew, callback.function, data, fromType,
                                   toType, callback.context, &coerced);
  if (result != kVRKNoError) return result;
  if (handles.Find<Data>(coerced) == nullptr) return kVRKNoResult;
  outData = coerced;
  return kVRKNoError;
}

VRKResult Coercions::Install(VRKToken fromType, VRKToken toType,
                             Callback<VRKDataCoercionCallback> callback) {
  if (!tokens.Holds(fromType) || !tokens.Holds(toType)) return kVRKInvalidHandle;
  const bool exists = std::any_of(installed.begin(), installed.end(), [&](const Coercion& each) {
    return each.fromType == fromType && each.toType == toType && each.callback == callback;
  });
  if (exists) return kVRKAlreadyExists;
  installed.push_back({fromType, toType, callback, nextNumber});
  ++nextNumber;
  return kVRKNoError;
}

VRKResult Coercions::Remove(Callback<VRKDataCoercionCallback> callback) noexcept {
  const auto removed =
      std::erase_if(installed, [&](const Coercion& each) { return each.callback == callback; });
  return removed != 0 ? kVRKNoError : kVRKNotFound;
}

}  // namespace varnel_kernel
