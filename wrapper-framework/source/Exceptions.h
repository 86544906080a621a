// Errors, both ways: a result code of the kernel becomes an exception where the kernel was called,
// and an exception becomes a result code where the kernel called.
#pragma once

#include <cstdint>
#include <exception>

#include "VarnelKernel.h"

namespace Varnel {

class DictionaryRef;

// What knows the code that it becomes.
class ResultCodeException {
 public:
  virtual uint32_t GetResultCode() const noexcept = 0;
  virtual ~ResultCodeException() = default;
};

class Exception : public std::exception, public ResultCodeException {
 public:
  explicit Exception(uint32_t code) noexcept : resultCode(code) {}

  // Asks the other for its code, which a class derived from it may have changed.
  Exception(const Exception& other) noexcept;
  Exception& operator=(const Exception&) = default;

  const char* what() const noexcept override;
  uint32_t GetResultCode() const noexcept override { return resultCode; }

 private:
  uint32_t resultCode;
};

// A broken contract of an input, of a result that must exist, and of an internal state.

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

// An error that describes itself in the parameter dictionary of the message during which it was
// thrown.
class CustomErrorException {
 public:
  virtual void FillErrorInfo(DictionaryRef& errorInfo) const = 0;
  virtual ~CustomErrorException() = default;
};

// Throws an Exception, whatever the code.
[[noreturn]] void ThrowResultCode(uint32_t code);

inline void ThrowIfFailed(VRKResult result) {
  if (result != 0) ThrowResultCode(result);
}

// The code of the exception that is being handled; to be called in a catch clause only. A
// CustomErrorException is given the dictionary, unless that is null, to describe itself in; when
// that fails it counts for nothing.
uint32_t ResultCodeFromException(VRKDictionary errorInfo) noexcept;
uint32_t ResultCodeFromException(const DictionaryRef& errorInfo) noexcept;

}  // namespace Varnel
