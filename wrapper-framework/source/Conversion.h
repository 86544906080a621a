// Kernel data as values.
#pragma once

#include <cstddef>
#include <cstdint>

#include "Holders.h"
#include "Values.h"

namespace Varnel {

// How many lists and dictionaries may be nested in each other. More, as when one contains itself,
// are a std::length_error.
inline constexpr size_t kNestingLimit = 100'000;

// How many values one conversion makes, and how many bytes its byte strings hold in all. What is
// held in several places is made for each of them, so that few data can stand for any number of
// values. More are a std::length_error.
inline constexpr size_t kValueLimit = 1'000'000;
inline constexpr uint64_t kTextLimit = uint64_t{1} << 30;

// The kernel's coercions decide what becomes of data: it becomes the first of a double, a bool, a
// byte string, the empty value, a name, an array or a dictionary that it can be coerced to. Data
// that cannot be coerced to any of these throws std::domain_error; so does what is nested in it.
// Nesting takes memory but no stack. Whatever is thrown, no reference stays behind.
orvane::value_t AsValue(const DataRef& source);
orvane::array_t AsArray(const ListRef& source);

// The null dictionary, which a kernel may pass where there are no parameters, is an empty one.
orvane::dictionary_t AsDictionary(const DictionaryRef& source);

}  // namespace Varnel
