#include "kolvane/source/VRKKolvaneCoercionImpl.h"

#include <string>
#include <vector>

#include "kolvane/api/wrapper-framework/VRKStringTranslatorProtocol.h"
#include "kolvane/source/VRKDefaultStringTranslator.h"
#include "wrapper-framework/source/Data.h"
#include "wrapper-framework/source/Exceptions.h"
#include "wrapper-framework/source/ReportedCheck.h"

namespace Varnel::Kolvanes {
namespace {

CheckSite gDataUTF8Site{.domain = "orvane.varnel.kolvanes",
                        .condition = "dataUTF8.Coerce(gTypeUTF8, dataUTF8)",
                        .sourceFile = "kolvane/source/VRKKolvaneCoercionImpl",
                        .line = 151,
                        .function = "Varnel::Kolvanes::CoercionImpl::HandleCoercionImpl"};

std::string KeyText(const DataRef& data) {
  const RawPayload payload = GetRawPayload(data);
  return WithTerminator({static_cast<const char*>(payload.bytes), payload.byteCount});
}

std::vector<uint16_t> Translation(const std::string& key) {
  std::vector<uint16_t> units;
  LocalizableStrings::LockTranslator(LocalizableStrings::gDefaultStringTranslator)
      ->TranslateString(key.data(), static_cast<uint32_t>(key.size()), units);
  return units;
}

}  // namespace

constinit StaticToken gTypeLocaleIndependentUTF8{kTypeLocaleIndependentUTF8};
constinit StaticToken gTypeUTF8{kTypeUTF8};
constinit StaticToken gTypeUTF16LE{kTypeUTF16LE};
constinit StaticToken gTypeUTF16BE{kTypeUTF16BE};

void ResetTypeTokens() noexcept {
  for (StaticToken* const type :
       {&gTypeLocaleIndependentUTF8, &gTypeUTF8, &gTypeUTF16LE, &gTypeUTF16BE}) {
    type->token = {};
  }
}

CoercionImpl::CoercionImpl() {
  for (StaticToken* const target : {&gTypeUTF8, &gTypeUTF16LE, &gTypeUTF16BE}) {
    const VRKToken toType = target->Get();
    Install(gTypeLocaleIndependentUTF8.Get(), toType);
  }
}

bool CoercionImpl::HandleCoercionImpl(const DataRef& source, VRKToken fromType, VRKToken toType,
                                      DataRef& result) {
  if (fromType != gTypeLocaleIndependentUTF8.Get()) throw InputContractViolation();
  DataRef dataUTF8 = source;
  const bool holdsKey = GetType(dataUTF8) == gTypeLocaleIndependentUTF8.Get();
  ReportedCheck(gDataUTF8Site,
                [&] { return holdsKey || dataUTF8.Coerce(gTypeUTF8.Get(), dataUTF8); });
  const std::vector<uint16_t> units = Translation(KeyText(dataUTF8));
  const DataRef translation = MakeUTF16LEData(units.data(), static_cast<uint32_t>(units.size()));
  return translation.Coerce(toType, result);
}

}  // namespace Varnel::Kolvanes
