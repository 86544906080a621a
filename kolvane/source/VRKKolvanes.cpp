#include "kolvane/source/VRKKolvanes.h"

#include <memory>
#include <utility>

#include "kolvane/api/wrapper-framework/VRKStringTranslatorClient.h"
#include "kolvane/api/wrapper-framework/VRKStringTranslatorFactory.h"
#include "kolvane/api/wrapper-framework/VRKStringTranslatorProtocol.h"
#include "kolvane/source/VRKDefaultStringTranslator.h"
#include "kolvane/source/VRKKolvaneCoercionImpl.h"
#include "kolvane/source/VRKStringTranslatorImpl.h"
#include "wrapper-framework/source/Boundary.h"
#include "wrapper-framework/source/Names.h"
#include "wrapper-framework/source/ResultCodes.h"

namespace {

using Varnel::InputContractViolation;
using Varnel::StringTranslatorFactory;
using Varnel::Kolvanes::CoercionImpl;

// Static initialisers: std::bad_alloc here aborts loading the library. NOLINTBEGIN(cert-err58-cpp)
const orvane::name_t gStringTranslatorClass(Varnel::kClassStringTranslator);
const orvane::name_t gDefaultStringTranslatorClass(Varnel::kClassDefaultStringTranslator);
// NOLINTEND(cert-err58-cpp)

// If the library is unloaded without termination, these unregister the classes, the default one
// first. The coercion stays installed then.
std::unique_ptr<StringTranslatorFactory> gStringTranslatorFactory;
std::unique_ptr<StringTranslatorFactory> gDefaultStringTranslatorFactory;
CoercionImpl* gKolvaneCoercion = nullptr;

void RequireZero(uint32_t reserved) {
  if (reserved != 0) throw InputContractViolation();
}

void RegisterTranslatorClasses() {
  using namespace Varnel::LocalizableStrings;
  gStringTranslatorFactory =
      std::make_unique<StringTranslatorFactory>(CreateStringTranslatorImpl, gStringTranslatorClass);
  const auto firstTranslator = Varnel::CreateStringTranslator();
  firstTranslator->MakeDefault();
  gDefaultStringTranslatorFactory = std::make_unique<StringTranslatorFactory>(
      GetDefaultStringTranslator, gDefaultStringTranslatorClass);
}

void UnregisterTranslatorClasses() noexcept {
  gStringTranslatorFactory.reset();
  gDefaultStringTranslatorFactory.reset();
}

void InitializeTranslatorClasses() {
  try {
    RegisterTranslatorClasses();
  } catch (...) {
    UnregisterTranslatorClasses();
    throw;
  }
}

void ReplaceCoercion(std::unique_ptr<CoercionImpl> replacement) noexcept {
  const std::unique_ptr<CoercionImpl> replaced(
      std::exchange(gKolvaneCoercion, replacement.release()));
}

void RemoveCoercion() noexcept {
  ReplaceCoercion(nullptr);
  Varnel::Kolvanes::ResetTypeTokens();
}

void InitializeCoercion() {
  try {
    ReplaceCoercion(std::make_unique<CoercionImpl>());
  } catch (...) {
    RemoveCoercion();
    throw;
  }
}

}  // namespace

VRKResult VRKKolvanesInitialize(uint32_t reserved) {
  return Varnel::AtBoundary({}, [=] {
    RequireZero(reserved);
    InitializeTranslatorClasses();
    InitializeCoercion();
    return Varnel::kResultNoError;
  });
}

VRKResult VRKKolvanesTerminate(uint32_t reserved) {
  return Varnel::AtBoundary({}, [=] {
    RequireZero(reserved);
    RemoveCoercion();
    UnregisterTranslatorClasses();
    return Varnel::kResultNoError;
  });
}

uint32_t VRKKolvanesVersion() {
  return 0x00010000;
}
