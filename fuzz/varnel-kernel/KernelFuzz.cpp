// A walk over the kernel's operations, from within callbacks too, beside a model that says of each
// what it returns, what it changes and whom it calls.
#include <cstddef>
#include <cstring>

#include "CheckedCalls.h"

namespace {

void* ContextOf(uintptr_t context) {
  return reinterpret_cast<void*>(context);
}
std::string BytesOf(Handle handle) {
  return {reinterpret_cast<const char*>(&handle), sizeof handle};
}

class Walk : private CheckedCalls {
 public:
  explicit Walk(Choices& decisions) : CheckedCalls(decisions) {
    Start();
    for (uint32_t number = 0; number < kKnownTexts.size(); ++number) {
      VRKToken token{};
      Require(VRKTokenCreate(kKnownTexts[number], 0, &token) == kVRKNoError, "a text has a token");
      AddToken(number, uint32_t(token));
    }
  }
  void Go() {
    while (!choices.AtEnd()) Step();
    End();
  }

 private:
  Argument PickMessage() { return PickToken(0, 3); }
  Argument PickKey() { return PickToken(1, 3); }
  Argument PickType() { return PickToken(3, OneIn(2) ? kKnownTexts.size() - 3 : 2); }
  uintptr_t PickContext() { return 1 + Below(3); }
  template <class Callback>
  Needed<Callback> Mostly(Callback callback) {
    return {OneIn(32) ? nullptr : callback};
  }

  // Objects

  void CreateObject() {
    Creation it{PickToken(1, 2), Pick(Kind::kDictionary, true)};
    it.objectClass.mayBeNull = true;
    if (OneIn(2)) it.objectClass.handle = 0;
    const auto begin = [&] {
      const auto factories = KernelModel::Serving(model.factories, it.objectClass, 0);
      if (!factories.empty()) it.factory = factories.back().context;
      return it.objectClass.handle == 0 || it.factory != 0 ? kVRKNoError : kVRKNotFound;
    };
    const auto finish = [&] { return model.ReleaseValue(it.temporary), it.result; };
    auto out = MakeOut<VRKObject>();
    const Call call{"VRKObjectCreate", begin, &it, finish};
    if (!Run(call, VRKObjectCreate, it.objectClass, it.parameters, out)) return;
    Require(it.isCalled == (it.factory != 0), "a factory is called");
    if (!it.isCalled) model.Add(Kind::kObject, uint32_t(out.value));
    Require(!it.isCalled || out.value == VRKObject{it.stored}, "and makes the object");
  }
  static VRKResult VRK_CALL OnCreate(VRKToken objectClass, VRKDictionary parameters, void* context,
                                     VRKObject* out) {
    auto& creation = Serving<Creation>();
    Require(!std::exchange(creation.isCalled, true), "one factory is called");
    Require(ContextOf(creation.factory) == context, "the one that was registered last");
    Require(objectClass == VRKToken{creation.objectClass}, "for the class");
    return Returned(Self().Create(creation, uint32_t(parameters), *out));
  }
  // Where there are no parameters a factory gets an empty dictionary, for the time being.
  VRKResult Create(Creation& creation, Handle parameters, VRKObject& out) {
    const Handle given = creation.parameters;
    Require(given == 0 || given == parameters, "with the parameters");
    if (given == 0) model.Add(Kind::kDictionary, creation.temporary = parameters);
    Reenter();
    out = Pick(Kind::kObject);
    creation.stored = uint32_t(out);
    const VRKResult answer = Answer(kVRKNoError);
    const bool isMade = model.Is(Kind::kObject, creation.stored);
    creation.result = answer == kVRKNoError && !isMade ? kVRKNoResult : answer;
    return answer;
  }

  void DeliverMessage() {
    const Argument object = Pick(Kind::kObject), message = PickMessage();
    const Argument parameters = Pick(Kind::kDictionary, true);
    Delivery it{object, message, parameters};
    const auto begin = [&] { return model.BeginDelivery(it), kVRKNoError; };
    const Call call{"VRKObjectDeliverMessage", begin, &it, [&] { return model.Finish(it); }};
    Run(call, VRKObjectDeliverMessage, object, message, parameters, 1u);
  }
  void ReleaseObject(Argument object) {
    Delivery it{object};
    const auto begin = [&] {
      if (it.object != 0) model.BeginRelease(it);
      return kVRKNoError;
    };
    const auto finish = [&] { return it.object != 0 ? model.Finish(it) : kVRKNoError; };
    Run({"VRKObjectRelease", begin, &it, finish}, VRKObjectRelease, object);
  }
  static VRKResult VRK_CALL OnMessage(VRKObject receiver, VRKToken message,
                                      VRKDictionary parameters, void* context) {
    auto& delivery = Serving<Delivery>();
    const Handle handler = Self().model.Next(delivery);
    Require(handler != 0, "a handler is left");
    Require(ContextOf(Self().model.At(handler).context) == context, "and it is its turn");
    Require(receiver == VRKObject{delivery.object} && message == VRKToken{delivery.message} &&
                parameters == VRKDictionary{delivery.parameters},
            "to get the message");
    Self().calls.back()->arguments.push_back({Kind::kHandler, handler});
    Self().Reenter();
    const VRKResult answer = Self().Answer(Self().OneIn(4) ? kVRKNoError : kVRKNotHandled);
    Self().model.HaveTold(handler, delivery, answer);
    return Returned(answer);
  }

  void InstallHandler() {
    const Argument object = Pick(Kind::kObject);
    const uintptr_t context = nextNumber++;
    const auto begin = [&] { return model.At(object).isDying ? kVRKInvalidHandle : kVRKNoError; };
    auto out = MakeOut<VRKMessageHandler>();
    if (!Run({"VRKMessageHandlerInstall", begin}, VRKMessageHandlerInstall, object, 0u,
             Mostly(OnMessage), ContextOf(context), 0u, 0u, out)) {
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
    Call call{"VRKMessageHandlerAddMessages"};
    for (uint32_t left = Below(4); left != 0; --left) call.arguments.push_back(PickMessage());
    const std::vector<VRKToken> messages(call.arguments.begin(), call.arguments.end());
    const auto count = static_cast<uint32_t>(messages.size());
    const VRKToken* const given = OneIn(32) ? nullptr : messages.data();
    call.lacksPointer = given == nullptr && count != 0;
    if (!Run(call, VRKMessageHandlerAddMessages, handler, given, count)) return;
    for (const VRKToken each : messages) model.At(handler).messages.insert(uint32_t(each));
  }
  void RemoveHandler() {
    const Argument handler = Pick(Kind::kHandler);
    Argument object = Pick(Kind::kObject);
    if (IsGood(handler) && !OneIn(8)) object.handle = model.At(handler).object;
    const auto begin = [&] {
      return model.At(handler).object == object.handle ? kVRKNoError : kVRKInvalidHandle;
    };
    const Call call{"VRKMessageHandlerRemove", begin};
    if (Run(call, VRKMessageHandlerRemove, handler, object)) model.EndHandler(handler);
  }

  // Factories and coercions

  template <class... Given>
  void Register(Registrations& all, const Registration& added, const char* operation,
                Given... given) {
    const auto begin = [&] {
      const auto same = [&](const Registration& each) { return each.context == added.context; };
      const Registrations serving = KernelModel::Serving(all, added.from, added.to);
      const bool exists = std::any_of(serving.begin(), serving.end(), same);
      return exists ? kVRKAlreadyExists : kVRKNoError;
    };
    if (Run({operation, begin}, given..., ContextOf(added.context))) all.push_back(added);
  }
  template <class... Given>
  void Unregister(Registrations& all, uintptr_t context, const char* operation, Given... given) {
    const auto isIts = [&](const Registration& each) { return each.context == context; };
    const auto begin = [&] {
      return std::any_of(all.begin(), all.end(), isIts) ? kVRKNoError : kVRKNotFound;
    };
    if (Run({operation, begin}, given...)) std::erase_if(all, isIts);
  }
  void RegisterFactory() {
    const Argument objectClass = PickToken(1, 2);
    Register(model.factories, {objectClass, 0, PickContext(), nextNumber++},
             "VRKObjectFactoryRegister", VRKObjectFactoryRegister, objectClass, 0u,
             Mostly(OnCreate));
  }
  void UnregisterFactory(uintptr_t context) {
    Unregister(model.factories, context, "VRKObjectFactoryUnregister", VRKObjectFactoryUnregister,
               0u, OnCreate, ContextOf(context));
  }
  void InstallCoercion() {
    const Argument from = PickType(), to = PickType();
    Register(model.coercions, {from, to, PickContext(), nextNumber++},
             "VRKDataCoercionHandlerInstall", VRKDataCoercionHandlerInstall, from, to, 0u,
             Mostly(OnCoerce));
  }
  void RemoveCoercion(uintptr_t context) {
    Unregister(model.coercions, context, "VRKDataCoercionHandlerRemove",
               VRKDataCoercionHandlerRemove, OnCoerce, ContextOf(context), 0u, 0u);
  }

  // Tokens

  void CreateToken(uint32_t number) {
    const std::string text = TextOf(number);
    const Needed<const char*> given{OneIn(64) ? nullptr : text.c_str()};
    auto out = MakeOut<VRKToken>();
    if (!Run({"VRKTokenCreate"}, VRKTokenCreate, given, 0u, out)) return;
    AddToken(number, uint32_t(out.value));
  }
  void GetTokenString() {
    const Argument token = PickToken(0, kKnownTexts.size());
    const char* const text = VRKTokenGetString(token);
    if (model.isRunning) CheckTokenString(token, text);
    Require(model.isRunning || text == nullptr, "without a kernel there are no texts");
  }

  // Data

  Argument PickPayload(Kind kind) { return kind == Kind::kToken ? PickMessage() : Pick(kind); }
  void AddData(Handle handle, Handle type, const std::string& bytes) {
    Item& data = model.Add(Kind::kData, handle);
    data.type = type;
    data.bytes = bytes;
    const Kind kind = PayloadKindOf(type);
    if (kind != Kind::kList && kind != Kind::kDictionary) return;
    std::memcpy(&data.entries.emplace_back(), bytes.data(), sizeof(Handle));
    model.Retain(data.entries[0]);
  }
  void CreateData() {
    const Argument type = PickType();
    const Kind kind = IsGood(type) ? PayloadKindOf(type) : Kind::kData;
    std::string bytes(Below(40), static_cast<char>('a' + Below(26)));
    Call call{"VRKDataCreate"};
    if (kind != Kind::kData) {
      const Argument named = PickPayload(kind);
      bytes = BytesOf(named);
      if (OneIn(16)) bytes.resize(Below(9));
      call.lacksPointer = bytes.size() != sizeof(Handle);
      if (!call.lacksPointer) call.arguments = {named};
    }
    const void* const given = OneIn(32) ? nullptr : bytes.data();
    const auto count = static_cast<uint32_t>(bytes.size());
    call.lacksPointer |= given == nullptr && count != 0;
    auto out = MakeOut<VRKData>();
    if (!Run(call, VRKDataCreate, type, given, count, 0u, out)) return;
    AddData(uint32_t(out.value), type, bytes);
  }
  void CreateHandleData() {
    const uint32_t which = Below(3);
    const Handle type = TokenOf(5 + which);
    const Argument named = PickPayload(PayloadKindOf(type));
    auto out = MakeOut<VRKData>();
    const bool isMade = which == 0   ? Run({}, VRKHostTokenDataCreate, named, out)
                        : which == 1 ? Run({}, VRKHostListDataCreate, named, out)
                                     : Run({}, VRKHostDictionaryDataCreate, named, out);
    if (!isMade) return;
    AddData(uint32_t(out.value), type, BytesOf(named));
    if (named.kind != Kind::kToken && OneIn(2)) Release(named);
  }
  void GetData(Argument data) {
    Out<const void*> bytes{!OneIn(8), false};
    Out<uint32_t> count{!OneIn(8), false};
    Out<VRKToken> type{!OneIn(8), false};
    if (!Run({"VRKDataGetData"}, VRKDataGetData, data, bytes, count, type)) return;
    const Item& item = model.At(data);
    Require(!count.isGiven || count.value == item.bytes.size(), "data has its size");
    Require(!type.isGiven || type.value == VRKToken{item.type}, "and its type");
    if (!bytes.isGiven) return;
    Require((bytes.value == nullptr) == item.bytes.empty(), "no bytes are null");
    const auto* const kept = static_cast<const char*>(bytes.value);
    Require(std::equal(item.bytes.begin(), item.bytes.end(), kept), "it has its bytes");
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

  void CoerceData() {
    Conversion it{Pick(Kind::kData), PickType()};
    for (const Registration& each : model.coercions) {
      if (IsGood(it.data) && model.At(it.data).type == each.from && OneIn(2))
        it.to.handle = each.to;
    }
    auto out = MakeOut<VRKData>();
    const Call call{"VRKDataCoerce", [&] { return Begin(it); }, &it, [&] { return Finish(it); }};
    if (!Run(call, VRKDataCoerce, it.data, it.to, out)) return;
    const auto coerced = uint32_t(out.value);
    const bool isSame = it.source.type == it.to.handle;
    Require(it.result != kVRKNoError || coerced == it.stored, "the handler's data");
    if (it.result == kVRKNoError) return;
    if (isSame && coerced == it.data.handle) return model.Retain(coerced);
    AddData(coerced, it.to, isSame ? it.source.bytes : Read(coerced));
    GetData({Kind::kData, coerced});
  }
  // The source is held while handlers are asked.
  VRKResult Begin(Conversion& conversion) {
    conversion.source = model.At(conversion.data);
    if (conversion.source.type == conversion.to.handle) return kVRKNoError;
    conversion.left = KernelModel::Serving(model.coercions, conversion.source.type, conversion.to);
    model.Retain(conversion.data);
    return kVRKNoError;
  }
  VRKResult Finish(Conversion& conversion) {
    if (conversion.source.type == conversion.to.handle) return kVRKNoError;
    const bool isThere = IsGood(conversion.data);
    model.ReleaseValue(conversion.data);
    if (conversion.result != kVRKCannotCoerce) return conversion.result;
    Require(model.TakeNext(conversion.left) == 0, "every handler is asked");
    const bool areTexts = IsText(conversion.source.type) && IsText(conversion.to);
    return !isThere ? kVRKInvalidHandle : areTexts ? kVRKNoError : kVRKCannotCoerce;
  }
  static VRKResult VRK_CALL OnCoerce(VRKData source, VRKToken fromType, VRKToken toType,
                                     void* context, VRKData* out) {
    auto& conversion = Serving<Conversion>();
    const uintptr_t next = Self().model.TakeNext(conversion.left);
    Require(next != 0 && ContextOf(next) == context, "it is the handler's turn");
    Require(source == VRKData{conversion.data} && fromType == VRKToken{conversion.source.type} &&
                toType == VRKToken{conversion.to},
            "to coerce the data");
    Self().Reenter();
    *out = Self().Pick(Kind::kData);
    conversion.stored = uint32_t(*out);
    const VRKResult answer = Self().Answer(Self().OneIn(2) ? kVRKNoError : kVRKCannotCoerce);
    const bool isMade = Self().model.Is(Kind::kData, conversion.stored);
    conversion.result = answer == kVRKNoError && !isMade ? kVRKNoResult : answer;
    return Returned(answer);
  }

  // Lists and dictionaries

  void CreateDictionary() {
    auto out = MakeOut<VRKDictionary>();
    if (!Run({"VRKDictionaryCreate"}, VRKDictionaryCreate, 0u, out)) return;
    model.Add(Kind::kDictionary, uint32_t(out.value));
  }
  void CreateList() {
    auto out = MakeOut<VRKList>();
    if (Run({}, VRKHostListCreate, out)) model.Add(Kind::kList, uint32_t(out.value));
  }
  void SetDictionaryEntry() {
    const Argument dictionary = Pick(Kind::kDictionary), key = PickKey(), data = Pick(Kind::kData);
    if (!Run({"VRKDictionarySetEntry"}, VRKDictionarySetEntry, dictionary, key, data)) return;
    model.Retain(data);
    model.ReleaseValue(std::exchange(model.At(dictionary).byKey[key], data));
  }
  void GetDictionaryEntry(Argument dictionary, Argument key) {
    const auto begin = [&] {
      return model.At(dictionary).byKey.contains(key) ? kVRKNoError : kVRKNotFound;
    };
    auto out = MakeOut<VRKData>();
    const Call call{"VRKDictionaryGetEntry", begin};
    if (!Run(call, VRKDictionaryGetEntry, dictionary, key, out)) return;
    Require(out.value == VRKData{model.At(dictionary).byKey.at(key)}, "the entry of the key");
  }
  void Append() {
    const Argument list = Pick(Kind::kList), data = Pick(Kind::kData);
    if (!Run({}, VRKHostListAppend, list, data)) return;
    model.Retain(data);
    model.At(list).entries.push_back(data);
    if (OneIn(2)) Release(data);
  }
  void GetListSize(Argument list) {
    auto out = MakeOut<uint32_t>();
    if (!Run({"VRKListGetSize"}, VRKListGetSize, list, out)) return;
    Require(out.value == model.At(list).entries.size(), "a list's size");
  }
  void GetListEntry(Argument list, uint32_t index) {
    const auto begin = [&] {
      return index < model.At(list).entries.size() ? kVRKNoError : kVRKNotFound;
    };
    auto out = MakeOut<VRKData>();
    if (!Run({"VRKListGetEntry", begin}, VRKListGetEntry, list, index, out)) return;
    Require(out.value == VRKData{model.At(list).entries[index]}, "the entry at the index");
  }
  void CreateKeyList() {
    const Argument dictionary = Pick(Kind::kDictionary);
    auto out = MakeOut<VRKList>();
    if (!Run({"VRKDictionaryCreateKeyList"}, VRKDictionaryCreateKeyList, dictionary, out)) return;
    ReadKeys(out.value, model.At(dictionary).byKey);
  }
  void ReadKeys(VRKList keys, std::map<Handle, Handle> expected) {
    std::vector<Handle>& entries = model.Add(Kind::kList, uint32_t(keys)).entries;
    const bool was = std::exchange(isReading, true);
    VRKData key{};
    while (VRKListGetEntry(keys, static_cast<uint32_t>(entries.size()), &key) == kVRKNoError) {
      entries.push_back(uint32_t(key));
      const std::string bytes = Read(entries.back());
      AddData(entries.back(), TokenOf(5), bytes);
      const auto isListed = [&](const auto& each) { return BytesOf(each.first) == bytes; };
      Require(std::erase_if(expected, isListed) == 1, "a key is listed, once");
    }
    isReading = was;
    Require(expected.empty(), "each key is listed");
  }

  template <class Function>
  void Retain(const char* operation, Kind kind, Function retain) {
    const Argument counted = Pick(kind, true);
    if (Run({operation}, retain, counted) && counted.handle != 0) model.Retain(counted);
  }
  template <class Function>
  void ReleaseValue(const char* operation, Argument value, Function release) {
    if (Run({operation}, release, value)) model.ReleaseValue(value);
  }
  void RetainSome() {
    Retain("VRKObjectRetain", Kind::kObject, VRKObjectRetain);
    Retain("VRKDataRetain", Kind::kData, VRKDataRetain);
    Retain("VRKListRetain", Kind::kList, VRKListRetain);
    Retain("VRKDictionaryRetain", Kind::kDictionary, VRKDictionaryRetain);
  }
  void Release(Argument counted) {
    counted.mayBeNull = true;
    const Kind kind = counted.kind;
    if (kind == Kind::kObject) return ReleaseObject(counted);
    if (kind == Kind::kData) return ReleaseValue("VRKDataRelease", counted, VRKDataRelease);
    if (kind == Kind::kList) return ReleaseValue("VRKListRelease", counted, VRKListRelease);
    ReleaseValue("VRKDictionaryRelease", counted, VRKDictionaryRelease);
  }

  // The rest

  void AllocateMemory() {
    const uint32_t count = Below(100);
    auto out = MakeOut<void*>();
    if (!Run({"VRKMemoryAllocate"}, VRKMemoryAllocate, count, 0u, out)) return;
    Require(uintptr_t(out.value) % alignof(std::max_align_t) == 0, "a block is aligned");
    std::memset(out.value, 1, count);
    Require(model.blocks.insert(out.value).second, "and new");
  }
  // No block is deallocated twice, which a trace hook might do.
  void DeallocateMemory() {
    const bool isGiven = !model.blocks.empty() && !isDeallocating && !OneIn(8);
    void* const block = isGiven ? *model.blocks.begin() : nullptr;
    Call call{"VRKMemoryDeallocate"};
    call.needsKernel = false;
    const bool was = std::exchange(isDeallocating, true);
    if (Run(call, VRKMemoryDeallocate, block)) model.blocks.erase(block);
    isDeallocating = was;
  }

  // The kernel's own reporter is silent where the flag is set.
  void ReportError() {
    uint32_t once = OneIn(2) ? 1 : 0;
    Report it{Below(1000), &once};
    const auto begin = [&] {
      it.isDue = reporter != 0;
      if (!it.isDue) once = 1;
      return kVRKNoError;
    };
    uint32_t answer = 0;
    Run({"VRKRuntimeError", begin, &it}, [&] {
      const auto& codes = calls.back()->codes;
      answer = VRKRuntimeError(2, "domain,", "expression,", 0, "file,", it.line, "function", &once);
      return codes.empty() ? kVRKNoError : *codes.begin();
    });
    Require(!it.isDue && answer == it.answer, "the reporter answers");
  }
  static uint32_t VRK_CALL OnError(uint32_t severity, const char* domain, const char* expression,
                                   const char* file, uint32_t line, const char* function,
                                   uint32_t* onceFlag, void* context) {
    auto& report = Serving<Report>();
    Require(std::exchange(report.isDue, false), "one reporter is called");
    Require(ContextOf(Self().reporter) == context, "the one that is set");
    Require(severity == 2 && line == report.line && onceFlag == report.onceFlag, "with the check");
    const std::string texts = std::string{domain} + expression + file + function;
    Require(texts == "domain,expression,file,function", "and its texts");
    Self().Reenter();
    const VRKResult answer = Self().Answer(kVRKNoError);
    report.answer = kLibrariesShareRuntime && answer == kVRKCallbackThrew ? 0 : answer;
    return Returned(answer);
  }

  void SetTraceHook(uintptr_t context) {
    const VRKHostTraceHook set = context != 0 ? OnTrace : nullptr;
    if (Run({}, VRKHostSetTraceHook, set, ContextOf(context))) hook = context;
  }
  void SetReporter(uintptr_t context) {
    const VRKHostErrorReporter set = context != 0 ? OnError : nullptr;
    if (Run({}, VRKHostSetErrorReporter, set, ContextOf(context))) reporter = context;
  }
  void Start() {
    Call call{nullptr, [&] { return model.isRunning ? kVRKAlreadyExists : kVRKNoError; }};
    call.needsKernel = false;
    if (Run(call, VRKHostStart)) model.isRunning = true;
  }
  void ShutDown() {
    const auto begin = [&] { return depth != 0 ? kVRKInUse : kVRKNoError; };
    VRKHostLiveCounts counts = model.Counts();
    if (!Run({nullptr, begin}, VRKHostShutDown, OneIn(4) ? nullptr : &counts)) return;
    RequireCounts(counts);
    model.ShutDown();
    hook = 0;
    reporter = 0;
  }
  void RequireCounts(const VRKHostLiveCounts& counts) const {
    const VRKHostLiveCounts expected = model.Counts();
    Require(std::memcmp(&counts, &expected, sizeof counts) == 0, "so much is alive");
  }
  void GetCounts() {
    VRKHostLiveCounts counts{};
    const Needed<VRKHostLiveCounts*> given{OneIn(64) ? nullptr : &counts};
    if (Run({}, VRKHostGetLiveCounts, given)) RequireCounts(counts);
  }

  // Steps that take what there is

  void AddToAny() { AddMessages(Pick(Kind::kHandler)); }
  void UnregisterAnyFactory() { UnregisterFactory(PickContext()); }
  void RemoveAnyCoercion() { RemoveCoercion(PickContext()); }
  void CreateAnyToken() { CreateToken(Below(kTexts)); }
  void GetAnyData() { GetData(Pick(Kind::kData)); }
  void GetAnyEntry() { GetDictionaryEntry(Pick(Kind::kDictionary), PickKey()); }
  void GetAnySize() { GetListSize(Pick(Kind::kList)); }
  void GetAnyListEntry() { GetListEntry(Pick(Kind::kList), Below(4)); }
  void ReleaseAny() {
    const Argument counted = Pick(kCounted[Below(4)]);
    Release(counted);
    if (OneIn(4)) Release(counted);
  }
  void SetAnyHook() { SetTraceHook(Below(3)); }
  void SetAnyReporter() { SetReporter(Below(3)); }
  void EndOrStart() { OneIn(4) ? ShutDown() : Start(); }

  void Step() override {
    static constexpr void (Walk::*kSteps[])() = {&Walk::EndOrStart,
                                                 &Walk::CreateObject,
                                                 &Walk::CreateObject,
                                                 &Walk::CreateObject,
                                                 &Walk::DeliverMessage,
                                                 &Walk::DeliverMessage,
                                                 &Walk::DeliverMessage,
                                                 &Walk::InstallHandler,
                                                 &Walk::InstallHandler,
                                                 &Walk::InstallHandler,
                                                 &Walk::AddToAny,
                                                 &Walk::RemoveHandler,
                                                 &Walk::RegisterFactory,
                                                 &Walk::UnregisterAnyFactory,
                                                 &Walk::InstallCoercion,
                                                 &Walk::InstallCoercion,
                                                 &Walk::RemoveAnyCoercion,
                                                 &Walk::CreateAnyToken,
                                                 &Walk::GetTokenString,
                                                 &Walk::CreateData,
                                                 &Walk::CreateData,
                                                 &Walk::CreateHandleData,
                                                 &Walk::GetAnyData,
                                                 &Walk::CoerceData,
                                                 &Walk::CoerceData,
                                                 &Walk::CreateDictionary,
                                                 &Walk::SetDictionaryEntry,
                                                 &Walk::GetAnyEntry,
                                                 &Walk::CreateKeyList,
                                                 &Walk::CreateList,
                                                 &Walk::Append,
                                                 &Walk::GetAnySize,
                                                 &Walk::GetAnyListEntry,
                                                 &Walk::RetainSome,
                                                 &Walk::ReleaseAny,
                                                 &Walk::ReleaseAny,
                                                 &Walk::ReleaseAny,
                                                 &Walk::AllocateMemory,
                                                 &Walk::DeallocateMemory,
                                                 &Walk::ReportError,
                                                 &Walk::SetAnyHook,
                                                 &Walk::SetAnyReporter};
    const bool mayBeAny = model.isRunning || OneIn(4);
    if (kLibrariesShareRuntime && OneIn(8)) failAt = 1 + Below(6);
    (this->*kSteps[mayBeAny ? Below(std::size(kSteps)) : 0])();
    failAt = 0;
    GetCounts();
  }

  // Everything is as the model has it, and goes.
  void End() {
    if (!model.isRunning) Start();
    SetTraceHook(0);
    SetReporter(0);
    for (const auto& [handle, item] : model.live) Check(handle, item);
    for (uintptr_t context = 1; context <= 3; ++context) {
      UnregisterFactory(context);
      RemoveCoercion(context);
    }
    while (!model.blocks.empty()) DeallocateMemory();
    while (!model.live.empty()) {
      const auto isCounted = [](const auto& each) { return each.second.kind != Kind::kHandler; };
      const auto next = std::find_if(model.live.begin(), model.live.end(), isCounted);
      Release({next->second.kind, next->first});
    }
    GetCounts();
    ShutDown();
  }
  void Check(Handle handle, const Item& item) {
    if (item.kind == Kind::kData) GetData({item.kind, handle});
    if (item.kind == Kind::kList) GetListSize({item.kind, handle});
    for (uint32_t index = 0; item.kind == Kind::kList && index < item.entries.size(); ++index) {
      GetListEntry({item.kind, handle}, index);
    }
    for (uint32_t number = 1; item.kind == Kind::kDictionary && number < 4; ++number) {
      GetDictionaryEntry({item.kind, handle}, {Kind::kToken, TokenOf(number)});
    }
  }

  static Walk& Self() { return static_cast<Walk&>(*current); }
  static constexpr Kind kCounted[] = {Kind::kObject, Kind::kData, Kind::kList, Kind::kDictionary};
  uint32_t nextNumber = 1;  // of a registration
  uintptr_t reporter = 0;   // its context; 0 for none
  bool isDeallocating = false;
};

}  // namespace

int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  Choices choices(data, size);
  Walk(choices).Go();
  return 0;
}
