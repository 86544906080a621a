#include "kolvane/api/wrapper-framework/VRKStringTranslatorHandler.h"

#include <boost/array.hpp>
#include <string>
#include <utility>
#include <vector>

#include "kolvane/api/wrapper-framework/VRKStringTranslatorProtocol.h"
#include "wrapper-framework/source/Data.h"
#include "wrapper-framework/source/DestructionScope.h"
#include "wrapper-framework/source/Exceptions.h"
#include "wrapper-framework/source/ReportedCheck.h"
#include "wrapper-framework/source/ResultCodes.h"
#include "wrapper-framework/source/Tokens.h"

namespace Varnel {
namespace {

// A token cache shared by all handlers, reset when the object of an owned handler dies.
struct HandlerTokens {
  StaticToken makeDefault{kMessageMakeDefault};
  StaticToken setTranslations{kMessageSetTranslations};
  StaticToken translateString{kMessageTranslateString};
  StaticToken messageResult{kParameterMessageResult};
  StaticToken translations{kParameterTranslations};
  StaticToken translationKey{kParameterTranslationKey};
  StaticToken typeLocaleIndependentUTF8{kTypeLocaleIndependentUTF8};
  StaticToken typeUTF8{kTypeUTF8};
  StaticToken typeUTF16{kTypeUTF16};
};

constinit HandlerTokens gTokens;

constexpr char kDomain[] = "orvane.varnel.localizable-strings.user-glue.string-translator-handler";
constexpr char kSourceFile[] = "kolvane/api/wrapper-framework/VRKStringTranslatorHandler";

CheckSite gTranslationsSite{.domain = kDomain,
                            .condition = "translations.Coerce(gTypeUTF16, translations)",
                            .sourceFile = kSourceFile,
                            .line = 210,
                            .function = "Varnel::StringTranslatorHandler::HandleSetTranslations"};

CheckSite gTranslationKeySite{.domain = kDomain,
                              .condition = "translationKey.Coerce(gTypeUTF8, translationKey)",
                              .sourceFile = kSourceFile,
                              .line = 236,
                              .function = "Varnel::StringTranslatorHandler::HandleTranslateString"};

std::string KeyText(DataRef& translationKey) {
  if (GetType(translationKey) != gTokens.typeLocaleIndependentUTF8.Get()) {
    ReportedCheck(gTranslationKeySite,
                  [&] { return translationKey.Coerce(gTokens.typeUTF8.Get(), translationKey); });
  }
  return WithTerminator(GetUTF8(translationKey));
}

}  // namespace

StringTranslatorHandler::StringTranslatorHandler(
    boost::shared_ptr<StringTranslatorInterface> servingTranslator)
    : MessageHandler({}, false), translator(std::move(servingTranslator)) {}

StringTranslatorHandler::~StringTranslatorHandler() {
  const DestructionScope destruction(this);
  translator.reset();
}

void StringTranslatorHandler::SetObject(VRKObject newObject) {
  MessageHandler::SetObject(newObject);
  boost::array<VRKToken, 3> messages{};
  messages.at(0) = gTokens.makeDefault.Get();
  messages.at(1) = gTokens.setTranslations.Get();
  messages.at(2) = gTokens.translateString.Get();
  AddMessages(messages.data(), static_cast<uint32_t>(messages.size()));
}

void StringTranslatorHandler::AttachAndOwn(VRKObject newObject) {
  SetObject(newObject);
  if (registration == VRKMessageHandler{}) ThrowResultCode(kResultHandlerNotInstalled);
  ownsItself = true;
}

void StringTranslatorHandler::ObjectDied() {
  if (!ownsItself) {
    MessageHandler::ObjectDied();
    return;
  }
  gTokens = {};
  DeleteSelf();
}

bool StringTranslatorHandler::HandleMessage(VRKObject, VRKToken message,
                                            const DictionaryRef& parameters) {
  if (message == gTokens.makeDefault.Get()) {
    translator->MakeDefault();
  } else if (message == gTokens.setTranslations.Get()) {
    HandleSetTranslations(parameters);
  } else if (message == gTokens.translateString.Get()) {
    HandleTranslateString(parameters);
  } else {
    return false;
  }
  return true;
}

void StringTranslatorHandler::HandleSetTranslations(const DictionaryRef& parameters) {
  DataRef translations = parameters.GetEntry(gTokens.translations.Get());
  ReportedCheck(gTranslationsSite,
                [&] { return translations.Coerce(gTokens.typeUTF16.Get(), translations); });
  std::vector<uint16_t> units;
  GetUTF16(translations, units);
  translator->SetTranslations(units.empty() ? nullptr : units.data(),
                              static_cast<uint32_t>(units.size()));
}

void StringTranslatorHandler::HandleTranslateString(const DictionaryRef& parameters) {
  DataRef translationKey = parameters.GetEntry(gTokens.translationKey.Get());
  const std::string key = KeyText(translationKey);
  std::vector<uint16_t> result;
  translator->TranslateString(key.data(), static_cast<uint32_t>(key.size()), result);
  const uint16_t* const units = result.empty() ? nullptr : result.data();
  const DataRef translation = MakeUTF16LEData(units, static_cast<uint32_t>(result.size()));
  parameters.SetEntry(gTokens.messageResult.Get(), translation);
}

}  // namespace Varnel
