#include "kolvane/source/VRKDefaultStringTranslator.h"

#include <boost/smart_ptr/make_shared.hpp>
#include <utility>

#include "kolvane/source/VRKStringTranslatorImpl.h"
#include "wrapper-framework/source/Exceptions.h"

namespace Varnel::LocalizableStrings {
namespace {

class WeakTranslator final : public StringTranslatorInterface {
 public:
  explicit WeakTranslator(boost::weak_ptr<StringTranslatorImpl> owner)
      : translator(std::move(owner)) {}

  void MakeDefault() override { LockTranslator(translator)->MakeDefault(); }

  void SetTranslations(const char* bytes, uint32_t byteCount) override {
    LockTranslator(translator)->SetTranslations(bytes, byteCount);
  }

  void SetTranslations(const uint16_t* units, uint32_t unitCount) override {
    LockTranslator(translator)->SetTranslations(units, unitCount);
  }

  void TranslateString(const char* key, uint32_t keyLength,
                       std::vector<uint16_t>& result) override {
    LockTranslator(translator)->TranslateString(key, keyLength, result);
  }

 private:
  boost::weak_ptr<StringTranslatorImpl> translator;
};

}  // namespace

boost::weak_ptr<StringTranslatorImpl> gDefaultStringTranslator;

boost::shared_ptr<StringTranslatorInterface> LockTranslator(
    const boost::weak_ptr<StringTranslatorImpl>& translator) {
  boost::shared_ptr<StringTranslatorInterface> live = translator.lock();
  if (live == nullptr) throw InvariantViolation();
  return live;
}

boost::shared_ptr<StringTranslatorInterface> GetDefaultStringTranslator(
    orvane::dictionary_t const&) {
  LockTranslator(gDefaultStringTranslator);
  return boost::make_shared<WeakTranslator>(gDefaultStringTranslator);
}

}  // namespace Varnel::LocalizableStrings
