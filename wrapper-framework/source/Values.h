// Values: structured data as C++ objects, independent of any kernel.
//
// Nothing here is synchronised, not even between unrelated values: counts and the queue of deferred
// destruction are plain process-wide state. Nesting takes no stack. Throws: std::bad_alloc only.
#pragma once

#include <concepts>
#include <cstdint>
#include <memory>
#include <span>
#include <string>
#include <utility>
#include <vector>

#include "wrapper-framework/source/Names.h"

namespace orvane {

class array_t;
class dictionary_t;

// Nothing. All empty values are equal.
struct empty_t {
  friend bool operator==(empty_t, empty_t) noexcept { return true; }
};

// The types that a value can hold. A std::string holds bytes.
template <class T>
concept held_type = std::same_as<T, empty_t> || std::same_as<T, double> || std::same_as<T, bool> ||
    std::same_as<T, std::string> || std::same_as<T, name_t> || std::same_as<T, array_t> ||
    std::same_as<T, dictionary_t>;

enum class type_t : uint8_t { empty, number, truth, bytes, name, array, dictionary };

// Holds one object of one of the held types, on the heap.
class value_t {
 public:
  class implementation_t;

  value_t();  // holds empty_t

  template <held_type T>
  explicit value_t(T held);

  value_t(const value_t& other);
  value_t(value_t&& other) noexcept;  // leaves the other holding empty_t
  ~value_t();

  // Assigns in place if both hold the same type. Otherwise an exception leaves this value
  // unchanged.
  value_t& operator=(const value_t& other);
  value_t& operator=(value_t&& other) noexcept;

  type_t type() const noexcept;

  // Returns the held T, or null if another type is held. Valid until the value changes.
  template <held_type T>
  const T* get_if() const noexcept;

  // Values of different types are unequal. Arrays and dictionaries compare their elements, unless
  // they share them.
  friend bool operator==(const value_t& left, const value_t& right);

 private:
  friend class comparison;
  template <held_type T>
  class instance;

  static implementation_t* moved_from() noexcept;

  implementation_t* implementation;  // owned unless it is moved_from(); never null
};

// A held object. Binary operations require that both hold the same type.
class value_t::implementation_t {
 public:
  implementation_t() = default;
  implementation_t& operator=(const implementation_t&) = delete;
  virtual ~implementation_t() = default;

  virtual bool equals(const implementation_t& other) const = 0;
  virtual type_t type() const noexcept = 0;
  virtual std::unique_ptr<implementation_t> clone() const = 0;
  virtual void assign(const implementation_t& other) = 0;

 protected:
  implementation_t(const implementation_t&) = default;
};

// A copy-on-write sequence. Its reference count is a plain 32-bit integer.
template <class Element>
class shared_sequence {
 public:
  shared_sequence();  // shares the process-wide empty sequence
  shared_sequence(const shared_sequence& other) noexcept;
  shared_sequence& operator=(const shared_sequence& other) noexcept;
  ~shared_sequence();

  // Valid until this object changes.
  std::span<const Element> elements() const noexcept;

  // The reference count.
  uint32_t use_count() const noexcept;
  bool shares_with(const shared_sequence& other) const noexcept {
    return representation == other.representation;
  }

 protected:
  // Returns the elements, after copying them if they are shared.
  std::vector<Element>& unique();

 private:
  struct representation_t;

  explicit shared_sequence(representation_t* owned) noexcept : representation(owned) {}
  static representation_t* share_empty();

  representation_t* representation;  // never null
};

class array_t : public shared_sequence<value_t> {
 public:
  // An exception leaves the array unchanged.
  void push_back(value_t value);

  friend bool operator==(const array_t& left, const array_t& right);
};

// Pairs of unique names and values, ordered by the bytes of the names.
class dictionary_t : public shared_sequence<std::pair<name_t, value_t>> {
 public:
  // An exception leaves the dictionary unchanged.
  void insert_or_assign(name_t name, const value_t& value);

  friend bool operator==(const dictionary_t& left, const dictionary_t& right);
};

extern template class shared_sequence<value_t>;
extern template class shared_sequence<std::pair<name_t, value_t>>;

}  // namespace orvane
