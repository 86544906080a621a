// Conversion of kernel data into values.
#pragma once

#include <cstddef>
#include <cstdint>

#include "wrapper-framework/source/KernelRefs.h"
#include "wrapper-framework/source/Values.h"

namespace Varnel {

// The maximum nesting of lists and dictionaries. Bounds the conversion of one that contains itself.
inline constexpr size_t kNestingLimit = 100'000;

// The maximum number of values in one conversion, and of bytes in all its byte strings. Shared data
// is copied at each use; these limits bound exponential expansion.
inline constexpr size_t kValueLimit = 1'000'000;
inline constexpr uint64_t kTextLimit = uint64_t{1} << 30;

// Data becomes the first of these that the kernel can coerce it to: a double, a bool, a byte
// string, the empty value, a name, an array, a dictionary. Nesting takes memory but no stack, and a
// conversion that fails releases every reference.
//
// Throws: std::domain_error if data can be coerced to none of them, std::length_error beyond the
// limits above, Exception for the kernel's failures.
orvane::value_t AsValue(const DataRef& source);
orvane::array_t AsArray(const ListRef& source);

// Takes the null dictionary for an empty one: kernels may pass null for no parameters.
orvane::dictionary_t AsDictionary(const DictionaryRef& source);

}  // namespace Varnel
