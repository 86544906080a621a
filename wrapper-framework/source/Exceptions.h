// Conversion between the kernel's result codes and exceptions, in both directions.
#pragma once

#include <cstdint>
#include <exception>

#include "wrapper-framework/source/VarnelKernel.h"

namespace Varnel {

class DictionaryRef;

// An exception that carries its result code.
class ResultCodeException {
 public:
  virtual uint32_t GetResultCode() const noexcept = 0;
  virtual ~ResultCodeException() = default;
};

class Exception : public std::exception, public ResultCodeException {
 public:
  explicit Exception(uint32_t code) noexcept : resultCode(code) {}

  // Copies the result of the other's GetResultCode, which derived classes override.
  Exception(const Exception& other) noexcept;
  Exception& operator=(const Exception&) = default;

  const char* what() const noexcept override;
  uint32_t GetResultCode() const noexcept override { return resultCode; }

 private:
  uint32_t resultCode;
};

// Violated contracts of an input (code 13), of a result that must exist (14), and of internal state
// (15).

class InputContractViolation : public Exception {
 public:
  InputContractViolation() noexcept;
  const char* what() const noexcept override;
};

class OutputContractViolation : public Exception {
 public:
  OutputContractViolation() noexcept;
  const char* what() const noexcept override;
};

class InvariantViolation : public Exception {
 public:
  InvariantViolation() noexcept;
  const char* what() const noexcept override;
};

// An exception that writes its details into the parameter dictionary of the message whose handler
// throws it.
class CustomErrorException {
 public:
  virtual void FillErrorInfo(DictionaryRef& errorInfo) const = 0;
  virtual ~CustomErrorException() = default;
};

// Throws an Exception, never a derived class.
[[noreturn]] void ThrowResultCode(uint32_t code);

inline void ThrowIfFailed(VRKResult result) {
  if (result != 0) ThrowResultCode(result);
}

// Returns the code of the exception that is being handled. A CustomErrorException first fills
// `errorInfo`, unless it is null; an exception from that is ignored. Requires: called in a catch
// clause.
uint32_t ResultCodeFromException(VRKDictionary errorInfo) noexcept;
uint32_t ResultCodeFromException(const DictionaryRef& errorInfo) noexcept;

}  // namespace Varnel
