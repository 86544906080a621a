#include "VRKDefaultStringTranslator.h"

#include <boost/smart_ptr/make_shared.hpp>
#include <utility>

#include "Exceptions.h"
#include "VRKStringTranslatorImpl.h"

namespace Varnel::LocalizableStrings {
namespace {

class BorrowedTranslator final : public StringTranslatorInterface {
 public:
  explicit BorrowedTranslator(boost::weak_ptr<StringTranslatorImpl> owner)
      : translator(std::move(owner)) {}

  void MakeDefault() override { LiveTranslator(translator)->MakeDefault(); }

  void SetTranslations(const char* bytes, uint32_t byteCount) override {
    LiveTranslator(translator)->SetTranslations(bytes, byteCount);
  }

  void SetTranslations(const uint16_t* units, uint32_t unitCount) override {
    LiveTranslator(translator)->SetTranslations(units, unitCount);
  }

  void TranslateString(const char* key, uint32_t keyLength,
                       std::vector<uint16_t>& result) override {
    LiveTranslator(translator)->TranslateString(key, keyLength, result);
  }

 private:
  boost::weak_ptr<StringTranslatorImpl> translator;
};

}  // namespace

boost::weak_ptr<StringTranslatorImpl> gDefaultStringTranslator;

boost::shared_ptr<StringTranslatorInterface> LiveTranslator(
    const boost::weak_ptr<StringTranslatorImpl>& translator) {
  boost::shared_ptr<StringTranslatorInterface> live = translator.lock();
  if (live == nullptr) throw InvariantViolation();
  return live;
}

boost::shared_ptr<StringTranslatorInterface> GetDefaultStringTranslator(
    orvane::dictionary_t const&) {
  LiveTranslator(gDefaultStringTranslator);
  return boost::make_shared<BorrowedTranslator>(gDefaultStringTranslator);
}

}  // namespace Varnel::LocalizableStrings
