#include "kolvane/api/wrapper-framework/VRKStringTranslatorClient.h"

#include "kolvane/api/wrapper-framework/VRKStringTranslatorProtocol.h"
#include "wrapper-framework/source/Data.h"
#include "wrapper-framework/source/Tokens.h"

namespace Varnel {
namespace {

DictionaryRef NoParameters() {
  DictionaryRef parameters;
  parameters.Create();
  return parameters;
}

void Put(const DictionaryRef& parameters, const char* name, const DataRef& data) {
  parameters.SetEntry(MakeToken(name), data);
}

void Send(const ObjectRef& object, const char* message, const DictionaryRef& parameters) {
  DeliverMessage(object.Get(), MakeToken(message), parameters, false);
}

}  // namespace

void StringTranslatorClient::MakeDefault() {
  Send(object, kMessageMakeDefault, NoParameters());
}

void StringTranslatorClient::SetTranslations(const char* bytes, uint32_t byteCount) {
  const DictionaryRef parameters = NoParameters();
  Put(parameters, kParameterTranslations, MakeUTF8Data(bytes, byteCount));
  Send(object, kMessageSetTranslations, parameters);
}

void StringTranslatorClient::SetTranslations(const uint16_t* units, uint32_t unitCount) {
  const DictionaryRef parameters = NoParameters();
  Put(parameters, kParameterTranslations, MakeUTF16Data(units, unitCount));
  Send(object, kMessageSetTranslations, parameters);
}

void StringTranslatorClient::TranslateString(const char* key, uint32_t keyLength,
                                             std::vector<uint16_t>& result) {
  const DictionaryRef parameters = NoParameters();
  Put(parameters, kParameterTranslationKey, MakeUTF8Data(key, keyLength));
  Send(object, kMessageTranslateString, parameters);
  GetUTF16LE(parameters.GetEntry(MakeToken(kParameterMessageResult)), result);
}

boost::shared_ptr<StringTranslatorInterface> CreateStringTranslator() {
  StringTranslatorClient client;
  ObjectRef object;
  object.Create(MakeToken(kClassStringTranslator), {});
  client.SetObject(object);
  return boost::shared_ptr<StringTranslatorInterface>(new StringTranslatorClient(client));
}

}  // namespace Varnel
