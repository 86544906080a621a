#include "wrapper-framework/source/Values.h"

#include <algorithm>
#include <cstddef>
#include <set>

namespace orvane {
namespace {

// The base of the reference-counted representations.
struct counted_t {
  counted_t() = default;
  counted_t(const counted_t&) = delete;
  counted_t& operator=(const counted_t&) = delete;
  virtual ~counted_t() = default;

  uint32_t useCount = 1;
  counted_t* nextDying = nullptr;
};

// Deferred destruction: representations that lose their last reference while another is destroyed
// are queued, so deep nesting takes no stack.
void release(counted_t* counted) noexcept {
  static counted_t* dying = nullptr;
  static bool destroying = false;
  if (--counted->useCount != 0) return;
  counted->nextDying = std::exchange(dying, counted);
  if (destroying) return;
  destroying = true;
  while (dying != nullptr) {
    const std::unique_ptr<counted_t> next(dying);
    dying = next->nextDying;
  }
  destroying = false;
}

template <held_type T>
constexpr type_t kTypeOf = type_t::empty;
template <>
constexpr type_t kTypeOf<double> = type_t::number;
template <>
constexpr type_t kTypeOf<bool> = type_t::truth;
template <>
constexpr type_t kTypeOf<std::string> = type_t::bytes;
template <>
constexpr type_t kTypeOf<name_t> = type_t::name;
template <>
constexpr type_t kTypeOf<array_t> = type_t::array;
template <>
constexpr type_t kTypeOf<dictionary_t> = type_t::dictionary;

}  // namespace

template <held_type T>
class value_t::instance final : public implementation_t {
 public:
  explicit instance(T initial) : held(std::move(initial)) {}

  bool equals(const implementation_t& other) const override { return held == held_by(other); }
  type_t type() const noexcept override { return kTypeOf<T>; }
  std::unique_ptr<implementation_t> clone() const override {
    return std::make_unique<instance>(*this);
  }
  void assign(const implementation_t& other) override { held = held_by(other); }

  static const T& held_by(const implementation_t& implementation) noexcept {
    return static_cast<const instance&>(implementation).held;
  }

 private:
  T held;
};

value_t::implementation_t* value_t::moved_from() noexcept {
  static instance<empty_t> nothing{empty_t()};
  return &nothing;
}

value_t::value_t() : value_t(empty_t()) {}

template <held_type T>
value_t::value_t(T held) : implementation(new instance<T>(std::move(held))) {}

value_t::value_t(const value_t& other) : implementation(other.implementation->clone().release()) {}

value_t::value_t(value_t&& other) noexcept
    : implementation(std::exchange(other.implementation, moved_from())) {}

value_t::~value_t() {
  if (implementation != moved_from()) delete implementation;
}

value_t& value_t::operator=(const value_t& other) {
  if (implementation == other.implementation) return *this;
  if (type() == other.type()) {
    implementation->assign(*other.implementation);
    return *this;
  }
  return *this = value_t(other);
}

value_t& value_t::operator=(value_t&& other) noexcept {
  value_t moved(std::move(other));
  std::swap(implementation, moved.implementation);
  return *this;
}

type_t value_t::type() const noexcept {
  return implementation->type();
}

template <held_type T>
const T* value_t::get_if() const noexcept {
  return type() == kTypeOf<T> ? &instance<T>::held_by(*implementation) : nullptr;
}

template value_t::value_t(empty_t);
template value_t::value_t(double);
template value_t::value_t(bool);
template value_t::value_t(std::string);
template value_t::value_t(name_t);
template value_t::value_t(array_t);
template value_t::value_t(dictionary_t);
template const empty_t* value_t::get_if() const noexcept;
template const double* value_t::get_if() const noexcept;
template const bool* value_t::get_if() const noexcept;
template const std::string* value_t::get_if() const noexcept;
template const name_t* value_t::get_if() const noexcept;
template const array_t* value_t::get_if() const noexcept;
template const dictionary_t* value_t::get_if() const noexcept;

template <class Element>
struct shared_sequence<Element>::representation_t final : counted_t {
  std::vector<Element> elements;
};

template <class Element>
shared_sequence<Element>::shared_sequence() : representation(share_empty()) {}

template <class Element>
shared_sequence<Element>::shared_sequence(const shared_sequence& other) noexcept
    : representation(other.representation) {
  ++representation->useCount;
}

// Retains first: `other` may be part of what is released.
template <class Element>
shared_sequence<Element>& shared_sequence<Element>::operator=(
    const shared_sequence& other) noexcept {
  ++other.representation->useCount;
  release(std::exchange(representation, other.representation));
  return *this;
}

template <class Element>
shared_sequence<Element>::~shared_sequence() {
  release(representation);
}

template <class Element>
std::span<const Element> shared_sequence<Element>::elements() const noexcept {
  return representation->elements;
}

template <class Element>
uint32_t shared_sequence<Element>::use_count() const noexcept {
  return representation->useCount;
}

template <class Element>
std::vector<Element>& shared_sequence<Element>::unique() {
  if (representation->useCount != 1) {
    auto copy = std::make_unique<representation_t>();
    copy->elements = representation->elements;
    release(std::exchange(representation, copy.release()));
  }
  return representation->elements;
}

template <class Element>
typename shared_sequence<Element>::representation_t* shared_sequence<Element>::share_empty() {
  static const shared_sequence empty(new representation_t);
  ++empty.representation->useCount;
  return empty.representation;
}

template class shared_sequence<value_t>;
template class shared_sequence<std::pair<name_t, value_t>>;

void array_t::push_back(value_t value) {
  unique().push_back(std::move(value));
}

void dictionary_t::insert_or_assign(name_t name, const value_t& value) {
  auto& pairs = unique();
  const auto place = std::ranges::lower_bound(pairs, name, {}, &std::pair<name_t, value_t>::first);
  if (place != pairs.end() && place->first == name) {
    place->second = value;
  } else {
    pairs.emplace(place, name, value);
  }
}

// Compares values. Nested arrays and dictionaries are queued, so deep nesting takes no stack.
class comparison {
 public:
  bool compare(const array_t& left, const array_t& right) {
    if (left.shares_with(right) || is_known(left, right)) return true;
    return std::ranges::equal(left.elements(), right.elements(),
                              [this](const value_t& leftElement, const value_t& rightElement) {
                                return compare_or_defer(leftElement, rightElement);
                              });
  }

  bool compare(const dictionary_t& left, const dictionary_t& right) {
    if (left.shares_with(right) || is_known(left, right)) return true;
    return std::ranges::equal(left.elements(), right.elements(),
                              [this](const auto& leftPair, const auto& rightPair) {
                                return leftPair.first == rightPair.first &&
                                       compare_or_defer(leftPair.second, rightPair.second);
                              });
  }

  bool compare_deferred() {
    while (!deferred.empty()) {
      const auto [left, right] = deferred.back();
      deferred.pop_back();
      if (!compare_inside(*left, *right)) return false;
    }
    return true;
  }

 private:
  // Whether this pair was compared before or is queued, so that shared parts are compared once.
  // Sequences that are not shared cannot occur twice.
  template <class Sequence>
  bool is_known(const Sequence& left, const Sequence& right) {
    if (left.use_count() == 1 || right.use_count() == 1) return false;
    return !known.emplace(left.elements().data(), right.elements().data()).second;
  }

  bool compare_inside(const value_t& left, const value_t& right) {
    if (const array_t* const array = left.get_if<array_t>()) {
      return compare(*array, *right.get_if<array_t>());
    }
    return compare(*left.get_if<dictionary_t>(), *right.get_if<dictionary_t>());
  }

  bool compare_or_defer(const value_t& left, const value_t& right) {
    if (left.type() != right.type()) return false;
    if (left.type() != type_t::array && left.type() != type_t::dictionary) return left == right;
    deferred.emplace_back(&left, &right);
    return true;
  }

  std::vector<std::pair<const value_t*, const value_t*>> deferred;
  std::set<std::pair<const void*, const void*>> known;
};

bool operator==(const value_t& left, const value_t& right) {
  return left.type() == right.type() && left.implementation->equals(*right.implementation);
}

bool operator==(const array_t& left, const array_t& right) {
  comparison elements;
  return elements.compare(left, right) && elements.compare_deferred();
}

bool operator==(const dictionary_t& left, const dictionary_t& right) {
  comparison pairs;
  return pairs.compare(left, right) && pairs.compare_deferred();
}

}  // namespace orvane
