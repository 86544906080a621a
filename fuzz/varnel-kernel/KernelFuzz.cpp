// A walk over the kernel's operations, from within callbacks too, beside a model that says of each
// what it returns, what it changes and whom it calls.
#include <cstddef>
#include <cstring>

#include "fuzz/varnel-kernel/CheckedCalls.h"

namespace {

void* ContextOf(uintptr_t context) {
  return reinterpret_cast<void*>(context);
}
template <class... Given>
Told MakeTold(void* context, Given... given) {
  return {uintptr_t(context), {uintptr_t(given)...}};
}
std::string BytesOf(Handle handle) {
  return {reinterpret_cast<const char*>(&handle), sizeof handle};
}

class Walk : private CheckedCalls {
 public:
  explicit Walk(Choices& decisions) : CheckedCalls(decisions) {
    Start();
    for (uint32_t number = 0; number < kTexts.size(); ++number) {
      Require(CreateToken(number, {kTexts[number]}, {true}), "a text has a token");
    }
  }
  void Go() {
    while (!choices.AtEnd()) Step();
    End();
  }

 private:
  Argument PickMessage() { return PickToken(0, 3); }
  Argument PickKey() { return PickToken(1, 3); }
  Argument PickType() { return PickToken(3, OneIn(2) ? kTexts.size() - 3 : 2); }
  uintptr_t PickContext() { return 1 + Below(3); }

  // Objects

  void CreateObject() {
    Argument objectClass = PickToken(1, 2);
    objectClass.mayBeNull = true;
    if (OneIn(2)) objectClass.handle = 0;
    const Argument parameters = Pick(Kind::kDictionary, true);
    uintptr_t factory = 0;  // its context; 0 for none
    Handle given = parameters;
    Call call;
    call.begin = [&] {
      const std::vector<Key> factories = model.Serving(Kind::kFactory, objectClass, 0);
      if (!factories.empty()) factory = model.At(factories.back()).context;
      return objectClass.handle == 0 || factory != 0 ? kVRKNoError : kVRKNotFound;
    };
    // Where there are no parameters a factory gets an empty dictionary, for the time being.
    call.next = [&](const Told& told) -> Told {
      if (given == 0) model.Add(Kind::kDictionary, given = uint32_t(told.values[1]));
      return {std::exchange(factory, 0), {objectClass, given}};
    };
    call.finish = [&] {
      if (parameters.handle == 0) model.ReleaseValue(given);
      return call.answer;
    };
    auto out = MakeOut<VRKObject>();
    if (!Run(call, OPERATION(VRKObjectCreate), objectClass, parameters, out)) return;
    Require(factory == 0, "a factory is called");
    Require(call.made == 0 || out.value == VRKObject{call.made}, "and makes the object");
    if (call.made == 0) model.Add(Kind::kObject, uint32_t(out.value));
  }
  static VRKResult VRK_CALL OnCreate(VRKToken objectClass, VRKDictionary parameters, void* context,
                                     VRKObject* out) {
    return Serve(MakeTold(context, objectClass, parameters), Kind::kObject, out);
  }

  void DeliverMessage() {
    const Argument object = Pick(Kind::kObject), message = PickMessage();
    const Argument parameters = Pick(Kind::kDictionary, true);
    Delivery it{object, message, parameters};
    Call call;
    call.answer = kVRKNotHandled;
    call.begin = [&] { return model.BeginDelivery(it), kVRKNoError; };
    Deliver(call, it, OPERATION(VRKObjectDeliverMessage), object, message, parameters, 1u);
  }
  void ReleaseObject(Argument object) {
    Delivery it{object};
    Call call;
    call.begin = [&] {
      if (it.object != 0) model.ReleaseObject(it);
      return kVRKNoError;
    };
    Deliver(call, it, OPERATION(VRKObjectRelease), object);
  }
  template <class... Given>
  void Deliver(Call& call, Delivery& it, Given... given) {
    call.next = [&](const Told&) -> Told {
      const Key handler = model.Next(it, call.answer);
      Require(handler != 0, "a handler is left");
      call.arguments.push_back({Kind::kHandler, uint32_t(handler)});
      return {model.At(handler).context, {it.object, it.message, it.parameters}};
    };
    call.finish = [&] { return model.Finish(it, call.answer); };
    Run(call, given...);
  }
  static VRKResult VRK_CALL OnMessage(VRKObject receiver, VRKToken message,
                                      VRKDictionary parameters, void* context) {
    return Serve(MakeTold(context, receiver, message, parameters));
  }

  void InstallHandler() {
    const Argument object = Pick(Kind::kObject);
    const uintptr_t context = nextContext++;
    Call call{[&] { return model.At(object).isDying ? kVRKInvalidHandle : kVRKNoError; }};
    auto out = MakeOut<VRKMessageHandler>();
    if (!Run(call, OPERATION(VRKMessageHandlerInstall), object, 0u, Mostly(OnMessage),
             ContextOf(context), 0u, 0u, out)) {
      return;
    }
    const Argument handler{Kind::kHandler, uint32_t(out.value)};
    Item& item = model.Add(Kind::kHandler, handler);
    item.object = object;
    item.context = context;
    model.At(object).handlers.push_back(handler);
    if (!OneIn(4)) AddMessages(handler);
  }
  void AddMessages(Argument handler) {
    Call call;
    for (uint32_t left = Below(4); left != 0; --left) call.arguments.push_back(PickMessage());
    const std::vector<VRKToken> messages(call.arguments.begin(), call.arguments.end());
    const auto count = static_cast<uint32_t>(messages.size());
    const VRKToken* const given = OneIn(32) ? nullptr : messages.data();
    call.lacksPointer = given == nullptr && count != 0;
    if (!Run(call, OPERATION(VRKMessageHandlerAddMessages), handler, given, count)) return;
    for (const VRKToken each : messages) model.At(handler).messages.insert(uint32_t(each));
  }
  void RemoveHandler() {
    const Argument handler = Pick(Kind::kHandler);
    Argument object = Pick(Kind::kObject);
    if (IsGood(handler) && !OneIn(8)) object.handle = model.At(handler).object;
    const auto isIts = [&] { return model.At(handler).object == object.handle; };
    Call call{[&] { return isIts() ? kVRKNoError : kVRKInvalidHandle; }};
    const bool isDone = Run(call, OPERATION(VRKMessageHandlerRemove), handler, object);
    if (isDone) model.live.erase(handler.handle);
  }

  // Factories and coercions

  void Register(Kind kind) {
    const bool isFactory = kind == Kind::kFactory;
    const Argument type = isFactory ? PickToken(1, 2) : PickType(), toType = PickType();
    const Handle to = isFactory ? 0 : toType.handle;
    const uintptr_t context = PickContext();
    void* const given = ContextOf(context);
    Call call{[&] {
      const std::vector<Key> serving = model.Serving(kind, type, to);
      const auto isSame = [&](Key each) { return model.At(each).context == context; };
      const bool exists = std::any_of(serving.begin(), serving.end(), isSame);
      return exists ? kVRKAlreadyExists : kVRKNoError;
    }};
    const bool isDone = isFactory ? Run(call, OPERATION(VRKObjectFactoryRegister), type, 0u,
                                        Mostly(OnCreate), given)
                                  : Run(call, OPERATION(VRKDataCoercionHandlerInstall), type,
                                        toType, 0u, Mostly(OnCoerce), given);
    if (isDone) model.Register(kind, type, to, context);
  }
  void Unregister(Kind kind, uintptr_t context) {
    const auto isIts = [&](const auto& each) {
      return each.second.kind == kind && each.second.context == context;
    };
    Call call{[&] {
      const bool exists = std::any_of(model.live.begin(), model.live.end(), isIts);
      return exists ? kVRKNoError : kVRKNotFound;
    }};
    void* const given = ContextOf(context);
    const bool isDone =
        kind == Kind::kFactory
            ? Run(call, OPERATION(VRKObjectFactoryUnregister), 0u, OnCreate, given)
            : Run(call, OPERATION(VRKDataCoercionHandlerRemove), OnCoerce, given, 0u, 0u);
    if (isDone) std::erase_if(model.live, isIts);
  }

  // Tokens

  bool CreateToken(uint32_t number, Needed<const char*> text, Out<VRKToken> out) {
    const bool isMade = Run(OPERATION(VRKTokenCreate), text, 0u, out);
    if (isMade) HaveToken(number, uint32_t(out.value));
    return isMade;
  }
  void CreateAnyToken() {
    const uint32_t number = Below(kTexts.size());
    CreateToken(number, Mostly(kTexts[number]), MakeOut<VRKToken>());
  }
  void GetTokenString() {
    const Argument token = PickToken(0, kTexts.size());
    if (model.isRunning) return CheckTokenString(token);
    Require(VRKTokenGetString(token) == nullptr, "without a kernel there are no texts");
  }

  // Data

  void AddData(Handle handle, Handle type, const std::string& bytes) {
    Item& data = model.Add(Kind::kData, handle);
    data.type = type;
    data.bytes = bytes;
    const Kind kind = PayloadKindOf(type);
    if (kind != Kind::kList && kind != Kind::kDictionary) return;
    std::memcpy(&data.entries[0], bytes.data(), sizeof(Handle));
    model.Retain(data.entries[0]);
  }
  void CreateData() {
    const Argument type = OneIn(2) ? PickToken(5, 3) : PickType();
    const Kind kind = PayloadKindOf(type);
    const Argument named = kind == Kind::kToken ? PickMessage() : Pick(kind);
    std::string bytes(Below(40), static_cast<char>('a' + Below(26)));
    if (kind != Kind::kData) bytes = BytesOf(named);
    if (kind != Kind::kData && OneIn(16)) bytes.resize(Below(9));
    const bool isNamed = kind != Kind::kData && bytes.size() == sizeof(Handle);
    const void* const given = OneIn(32) ? nullptr : bytes.data();
    const auto count = static_cast<uint32_t>(bytes.size());
    auto out = MakeOut<VRKData>();
    Call call;
    call.lacksPointer = (given == nullptr && count != 0) || (kind != Kind::kData && !isNamed);
    if (isNamed) call.arguments = {named};
    const bool isMade =
        !isNamed || OneIn(2)   ? Run(call, OPERATION(VRKDataCreate), type, given, count, 0u, out)
        : kind == Kind::kToken ? Run(OPERATION(VRKHostTokenDataCreate), named, out)
        : kind == Kind::kList  ? Run(OPERATION(VRKHostListDataCreate), named, out)
                               : Run(OPERATION(VRKHostDictionaryDataCreate), named, out);
    if (isMade) AddData(uint32_t(out.value), type, bytes);
    if (isMade && isNamed && kind != Kind::kToken && OneIn(2)) Release(named);
  }
  // The bytes of data that the kernel has made, unseen by the trace.
  std::string Read(Handle data) {
    const bool was = std::exchange(isReading, true);
    const void* bytes = nullptr;
    uint32_t count = 0;
    Require(VRKDataGetData(VRKData{data}, &bytes, &count, nullptr) == kVRKNoError, "it is data");
    isReading = was;
    return {static_cast<const char*>(bytes), count};
  }

  // The source is held while handlers are asked.
  void CoerceData() {
    const Argument data = Pick(Kind::kData), toType = PickType();
    Item source;
    std::vector<Key> left;
    Call call{[&] {
      source = model.At(data);
      if (source.type != toType.handle) model.Retain(data);
      left = model.Serving(Kind::kCoercion, source.type, toType);
      return kVRKNoError;
    }};
    call.answer = kVRKCannotCoerce;
    call.next = [&](const Told&) -> Told {
      const Key next = model.TakeCoercion(left);
      Require(next != 0 && source.type != toType.handle, "a handler is left");
      return {model.At(next).context, {data, source.type, toType}};
    };
    call.finish = [&]() -> VRKResult {
      if (source.type == toType.handle) return kVRKNoError;
      const bool isThere = IsGood(data);
      model.ReleaseValue(data);
      if (call.answer != kVRKCannotCoerce) return call.answer;
      Require(model.TakeCoercion(left) == 0, "every handler is asked");
      const bool areTexts = IsText(source.type) && IsText(toType);
      return !isThere ? kVRKInvalidHandle : areTexts ? kVRKNoError : kVRKCannotCoerce;
    };
    auto out = MakeOut<VRKData>();
    if (!Run(call, OPERATION(VRKDataCoerce), data, toType, out)) return;
    const auto coerced = uint32_t(out.value);
    const bool isSame = source.type == toType.handle;
    if (isSame && coerced == data.handle) return model.Retain(coerced);
    if (isSame || call.answer != kVRKNoError)
      AddData(coerced, toType, isSame ? source.bytes : Read(coerced));
    else
      Require(coerced == call.made, "the handler's data");
  }
  static VRKResult VRK_CALL OnCoerce(VRKData source, VRKToken type, VRKToken toType, void* context,
                                     VRKData* out) {
    return Serve(MakeTold(context, source, type, toType), Kind::kData, out);
  }

  // Lists and dictionaries

  void CreateDictionary() {
    auto out = MakeOut<VRKDictionary>();
    if (!Run(OPERATION(VRKDictionaryCreate), 0u, out)) return;
    model.Add(Kind::kDictionary, uint32_t(out.value));
  }
  void CreateList() {
    auto out = MakeOut<VRKList>();
    if (Run(OPERATION(VRKHostListCreate), out)) model.Add(Kind::kList, uint32_t(out.value));
  }
  void SetEntry() {
    const Argument dictionary = Pick(Kind::kDictionary), key = PickKey(), data = Pick(Kind::kData);
    if (!Run(OPERATION(VRKDictionarySetEntry), dictionary, key, data)) return;
    model.Retain(data);
    model.ReleaseValue(std::exchange(model.At(dictionary).entries[key], data));
  }
  void Append() {
    const Argument list = Pick(Kind::kList), data = Pick(Kind::kData);
    if (!Run(OPERATION(VRKHostListAppend), list, data)) return;
    model.Retain(data);
    std::map<Handle, Handle>& entries = model.At(list).entries;
    entries[uint32_t(entries.size())] = data;
    if (OneIn(2)) Release(data);
  }
  void CreateKeyList() {
    const Argument dictionary = Pick(Kind::kDictionary);
    auto out = MakeOut<VRKList>();
    if (!Run(OPERATION(VRKDictionaryCreateKeyList), dictionary, out)) return;
    std::map<Handle, Handle> expected = model.At(dictionary).entries;
    std::map<Handle, Handle>& entries = model.Add(Kind::kList, uint32_t(out.value)).entries;
    const bool was = std::exchange(isReading, true);
    VRKData key{};
    for (uint32_t next = 0; VRKListGetEntry(out.value, next, &key) == kVRKNoError; ++next) {
      entries[next] = uint32_t(key);
      const std::string bytes = Read(uint32_t(key));
      AddData(uint32_t(key), TokenOf(5), bytes);
      const auto isListed = [&](const auto& each) { return BytesOf(each.first) == bytes; };
      Require(std::erase_if(expected, isListed) == 1, "a key is listed, once");
    }
    isReading = was;
    Require(expected.empty(), "each key is listed");
  }

  // What can be read of data, lists and dictionaries

  void GetData(Argument data) {
    Out<const void*> bytes{!OneIn(8), false};
    Out<uint32_t> count{!OneIn(8), false};
    Out<VRKToken> type{!OneIn(8), false};
    if (!Run(OPERATION(VRKDataGetData), data, bytes, count, type)) return;
    const Item& item = model.At(data);
    Require(!count.isGiven || count.value == item.bytes.size(), "data has its size");
    Require(!type.isGiven || type.value == VRKToken{item.type}, "and its type");
    if (!bytes.isGiven) return;
    Require((bytes.value == nullptr) == item.bytes.empty(), "no bytes are null");
    const auto* const kept = static_cast<const char*>(bytes.value);
    Require(std::equal(item.bytes.begin(), item.bytes.end(), kept), "it has its bytes");
  }
  void GetEntry(Argument value, Handle at) {
    const auto isThere = [&] { return model.At(value).entries.contains(at); };
    Call call{[&] { return isThere() ? kVRKNoError : kVRKNotFound; }};
    const Argument key{Kind::kToken, at};
    auto out = MakeOut<VRKData>();
    const bool isDone = value.kind == Kind::kList
                            ? Run(call, OPERATION(VRKListGetEntry), value, at, out)
                            : Run(call, OPERATION(VRKDictionaryGetEntry), value, key, out);
    if (isDone) Require(out.value == VRKData{model.At(value).entries.at(at)}, "its entry");
  }
  void Read(Argument value) {
    if (value.kind == Kind::kData) GetData(value);
    if (value.kind == Kind::kDictionary) GetEntry(value, PickKey());
    if (value.kind != Kind::kList) return;
    GetEntry(value, Below(4));
    auto size = MakeOut<uint32_t>();
    const bool isDone = Run(OPERATION(VRKListGetSize), value, size);
    if (isDone) Require(size.value == model.At(value).entries.size(), "its size");
  }

  // The rest

  void Retain(Argument counted) {
    counted.mayBeNull = true;
    const Kind kind = counted.kind;
    const bool isDone = kind == Kind::kObject ? Run(OPERATION(VRKObjectRetain), counted)
                        : kind == Kind::kData ? Run(OPERATION(VRKDataRetain), counted)
                        : kind == Kind::kList ? Run(OPERATION(VRKListRetain), counted)
                                              : Run(OPERATION(VRKDictionaryRetain), counted);
    if (isDone) model.Retain(counted);
  }
  void Release(Argument counted) {
    counted.mayBeNull = true;
    const Kind kind = counted.kind;
    if (kind == Kind::kObject) return ReleaseObject(counted);
    const bool isDone = kind == Kind::kData   ? Run(OPERATION(VRKDataRelease), counted)
                        : kind == Kind::kList ? Run(OPERATION(VRKListRelease), counted)
                                              : Run(OPERATION(VRKDictionaryRelease), counted);
    if (isDone) model.ReleaseValue(counted);
  }

  void AllocateMemory() {
    const uint32_t count = Below(100);
    auto out = MakeOut<void*>();
    if (!Run(OPERATION(VRKMemoryAllocate), count, 0u, out)) return;
    Require(uintptr_t(out.value) % alignof(std::max_align_t) == 0, "a block is aligned");
    std::memset(out.value, 1, count);
    Require(model.blocks.insert(out.value).second, "and new");
  }
  // No block is deallocated twice, which a trace hook might do.
  void DeallocateMemory() {
    const bool isGiven = !model.blocks.empty() && !isDeallocating && !OneIn(8);
    void* const block = isGiven ? *model.blocks.begin() : nullptr;
    Call call;
    call.needsKernel = false;
    const bool was = std::exchange(isDeallocating, true);
    if (Run(call, OPERATION(VRKMemoryDeallocate), block)) model.blocks.erase(block);
    isDeallocating = was;
  }

  // The kernel's own reporter is silent where the flag is set.
  void ReportError() {
    const uint32_t line = Below(1000);
    uint32_t once = OneIn(2) ? 1 : 0, answer = 0;
    uintptr_t due = 0;
    Call call;
    call.begin = [&] {
      due = reporter;
      if (due == 0) once = 1;
      return kVRKNoError;
    };
    call.next = [&](const Told&) {
      return MakeTold(ContextOf(std::exchange(due, 0)), 2, kTexts[0], kTexts[1], kTexts[2], line,
                      kTexts[3], &once);
    };
    Run(call, "VRKRuntimeError", [&] {
      answer = VRKRuntimeError(2, kTexts[0], kTexts[1], 0, kTexts[2], line, kTexts[3], &once);
      return call.refusals.empty() ? kVRKNoError : call.refusals[0];
    });
    const bool threw = kLibrariesShareRuntime && call.answer == kVRKCallbackThrew;
    Require(due == 0 && answer == (threw ? 0 : call.answer), "the reporter answers");
  }
  static uint32_t VRK_CALL OnError(uint32_t severity, const char* domain, const char* expression,
                                   const char* file, uint32_t line, const char* function,
                                   uint32_t* onceFlag, void* context) {
    return Serve(MakeTold(context, severity, domain, expression, file, line, function, onceFlag));
  }

  void SetTraceHook(uintptr_t context) {
    const VRKHostTraceHook set = context != 0 ? OnTrace : nullptr;
    if (Run(OPERATION(VRKHostSetTraceHook), set, ContextOf(context))) hook = context;
  }
  void SetReporter(uintptr_t context) {
    const VRKHostErrorReporter set = context != 0 ? OnError : nullptr;
    if (Run(OPERATION(VRKHostSetErrorReporter), set, ContextOf(context))) reporter = context;
  }
  void Start() {
    Call call{[&] { return model.isRunning ? kVRKAlreadyExists : kVRKNoError; }};
    call.needsKernel = false;
    if (Run(call, OPERATION(VRKHostStart))) model.isRunning = true;
  }
  void ShutDown() {
    Call call{[&] { return depth != 0 ? kVRKInUse : kVRKNoError; }};
    VRKHostLiveCounts counts{};
    const bool isAsked = !OneIn(4);
    if (!Run(call, OPERATION(VRKHostShutDown), isAsked ? &counts : nullptr)) return;
    if (isAsked) model.CheckCounts(counts);
    model.isRunning = false;
    model.live.clear();
    hook = 0;
    reporter = 0;
  }
  void GetCounts() {
    VRKHostLiveCounts counts{};
    if (Run(OPERATION(VRKHostGetLiveCounts), Mostly(&counts))) model.CheckCounts(counts);
  }

  // Steps that take what there is

  Argument PickCounted() {
    constexpr Kind kCounted[] = {Kind::kObject, Kind::kData, Kind::kList, Kind::kDictionary};
    return Pick(kCounted[Below(4)]);
  }
  void RegisterFactory() { Register(Kind::kFactory); }
  void InstallCoercion() { Register(Kind::kCoercion); }
  void AddToAny() { AddMessages(Pick(Kind::kHandler)); }
  void UnregisterAny() { Unregister(Kind::kFactory, PickContext()); }
  void RemoveAny() { Unregister(Kind::kCoercion, PickContext()); }
  void ReadAny() { Read(PickCounted()); }
  void RetainAny() { Retain(PickCounted()); }
  void ReleaseAny() {
    const Argument counted = PickCounted();
    Release(counted);
    if (OneIn(4)) Release(counted);
  }
  void SetAnyHook() { SetTraceHook(Below(3)); }
  void SetAnyReporter() { SetReporter(Below(3)); }
  void EndOrStart() { OneIn(4) ? ShutDown() : Start(); }

  void Step() override {
    static constexpr std::pair<uint32_t, void (Walk::*)()> kSteps[] = {
        {1, &Walk::EndOrStart},       {3, &Walk::CreateObject},   {3, &Walk::DeliverMessage},
        {3, &Walk::InstallHandler},   {1, &Walk::AddToAny},       {1, &Walk::RemoveHandler},
        {1, &Walk::RegisterFactory},  {1, &Walk::UnregisterAny},  {2, &Walk::InstallCoercion},
        {1, &Walk::RemoveAny},        {1, &Walk::CreateAnyToken}, {1, &Walk::GetTokenString},
        {3, &Walk::CreateData},       {2, &Walk::ReadAny},        {2, &Walk::CoerceData},
        {1, &Walk::CreateDictionary}, {1, &Walk::SetEntry},       {1, &Walk::CreateKeyList},
        {1, &Walk::CreateList},       {1, &Walk::Append},         {2, &Walk::RetainAny},
        {3, &Walk::ReleaseAny},       {1, &Walk::AllocateMemory}, {1, &Walk::DeallocateMemory},
        {1, &Walk::ReportError},      {1, &Walk::SetAnyHook},     {1, &Walk::SetAnyReporter},
        {1, &Walk::GetCounts}};
    static constexpr uint32_t kWeights = [] {
      uint32_t sum = 0;
      for (const auto& step : kSteps) sum += step.first;
      return sum;
    }();
    const bool mayBeAny = model.isRunning || OneIn(4);
    if (kLibrariesShareRuntime && OneIn(8)) failAt = 1 + Below(6);
    uint32_t passed = mayBeAny ? Below(kWeights) : 0;
    const auto* step = kSteps;
    while (passed >= step->first) passed -= (step++)->first;
    (this->*step->second)();
    failAt = 0;
  }

  // Everything is as the model has it, and goes.
  void End() {
    if (!model.isRunning) Start();
    SetTraceHook(0);
    SetReporter(0);
    for (const auto& [key, item] : model.live) {
      const Argument value{item.kind, uint32_t(key)};
      Read(value);
      for (const auto& [at, entry] : item.entries) {
        if (item.kind != Kind::kData) GetEntry(value, at);
      }
    }
    for (uintptr_t context = 1; context <= 3; ++context) {
      Unregister(Kind::kFactory, context);
      Unregister(Kind::kCoercion, context);
    }
    while (!model.blocks.empty()) DeallocateMemory();
    const auto isCounted = [](const auto& each) { return each.second.kind != Kind::kHandler; };
    while (!model.live.empty()) {
      const auto next = std::find_if(model.live.begin(), model.live.end(), isCounted);
      Release({next->second.kind, uint32_t(next->first)});
    }
    ShutDown();
  }

  uintptr_t nextContext = 1;  // of a handler
  uintptr_t reporter = 0;     // its context; 0 for none
  bool isDeallocating = false;
};

}  // namespace

int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  Choices choices(data, size);
  Walk(choices).Go();
  return 0;
}
