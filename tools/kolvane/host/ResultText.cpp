#include "tools/kolvane/host/ResultText.h"

#include <fmt/format.h>

#include "wrapper-framework/source/ResultCodes.h"
#include "wrapper-framework/source/VarnelKernel.h"

namespace {

struct NamedCode {
  uint32_t code;
  const char* name;
};

using namespace Varnel;

#define NAMED(name) \
  { name, #name }
constexpr NamedCode kNamedCodes[] = {
    NAMED(kVRKInvalidHandle),
    NAMED(kVRKInvalidArgument),
    NAMED(kVRKNotFound),
    NAMED(kVRKAlreadyExists),
    NAMED(kVRKNotRunning),
    NAMED(kVRKInUse),
    NAMED(kResultInputContractViolation),
    NAMED(kResultOutputContractViolation),
    NAMED(kResultInvariantViolation),
    NAMED(kResultHandlerNotInstalled),
    NAMED(kResultOutOfRange),
    NAMED(kResultOutOfMemory),
    NAMED(kResultOtherException),
    NAMED(kResultBadCast),
    NAMED(kResultNotHandled),
    NAMED(kResultCustomError),
    NAMED(kResultCannotCoerce),
};
#undef NAMED

}  // namespace

std::string ResultText(uint32_t code) {
  for (const NamedCode& each : kNamedCodes) {
    if (each.code == code) return fmt::format("result {} ({})", code, each.name);
  }
  return fmt::format("result {}", code);
}
