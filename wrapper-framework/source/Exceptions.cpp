#include "wrapper-framework/source/Exceptions.h"

#include <new>
#include <stdexcept>
#include <typeinfo>

#include "wrapper-framework/source/KernelRefs.h"
#include "wrapper-framework/source/ResultCodes.h"

namespace Varnel {
namespace {

void Describe(const CustomErrorException& error, VRKDictionary errorInfo) noexcept {
  if (errorInfo == VRKDictionary{}) return;
  try {
    DictionaryRef held(errorInfo);
    error.FillErrorInfo(held);
  } catch (...) {  // the original error is reported
  }
}

}  // namespace

Exception::Exception(const Exception& other) noexcept
    : std::exception(other), ResultCodeException(other), resultCode(other.GetResultCode()) {}

const char* Exception::what() const noexcept {
  return "varnel.kernel.wrapperframework.exception";
}

InputContractViolation::InputContractViolation() noexcept
    : Exception(kResultInputContractViolation) {}

const char* InputContractViolation::what() const noexcept {
  return "An input contract violation has occured!";
}

OutputContractViolation::OutputContractViolation() noexcept
    : Exception(kResultOutputContractViolation) {}

const char* OutputContractViolation::what() const noexcept {
  return "An output contract violation has occured!";
}

InvariantViolation::InvariantViolation() noexcept : Exception(kResultInvariantViolation) {}

const char* InvariantViolation::what() const noexcept {
  return "An invariant violation has occured!";
}

void ThrowResultCode(uint32_t code) {
  throw Exception(code);
}

// The first clause that matches decides. Three clauses stand before std::out_of_range for
// exceptions that also derive from it.
uint32_t ResultCodeFromException(VRKDictionary errorInfo) noexcept {
  try {
    throw;
  } catch (const CustomErrorException& error) {
    Describe(error, errorInfo);
    return kResultCustomError;
  } catch (const ResultCodeException& error) {
    return error.GetResultCode();
  } catch (const std::bad_cast&) {
    return kResultBadCast;
  } catch (const std::bad_alloc&) {
    return kResultOutOfMemory;
  } catch (const std::domain_error&) {
    return kResultOtherException;
  } catch (const std::invalid_argument&) {
    return kResultOtherException;
  } catch (const std::length_error&) {
    return kResultOtherException;
  } catch (const std::out_of_range&) {
    return kResultOutOfRange;
  } catch (...) {
    return kResultOtherException;
  }
}

uint32_t ResultCodeFromException(const DictionaryRef& errorInfo) noexcept {
  return ResultCodeFromException(errorInfo.Get());
}

}  // namespace Varnel
