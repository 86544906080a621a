// Names and values.
#include <gtest/gtest.h>

#include <algorithm>
#include <limits>

#include "wrapper-framework/source/Values.h"

namespace {

using orvane::array_t;
using orvane::dictionary_t;
using orvane::empty_t;
using orvane::name_t;
using orvane::value_t;

array_t Array(const std::vector<value_t>& values) {
  array_t array;
  for (const value_t& value : values) array.push_back(value);
  return array;
}

dictionary_t Dictionary(const std::vector<std::pair<const char*, value_t>>& pairs) {
  dictionary_t dictionary;
  for (const auto& [name, value] : pairs) dictionary.insert_or_assign(name_t(name), value);
  return dictionary;
}

// Each unequal to all others.
std::vector<value_t> Samples() {
  const value_t zero(0.0), yes(true);
  return {value_t(),
          zero,
          value_t(1.5),
          value_t(false),
          yes,
          value_t(std::string()),
          value_t(std::string("a\0b", 3)),
          value_t(std::string("a\0c", 3)),
          value_t(name_t()),
          value_t(name_t("sample")),
          value_t(array_t()),
          value_t(Array({zero})),
          value_t(Array({zero, yes})),
          value_t(Array({value_t(Array({zero}))})),
          value_t(Array({value_t(Array({yes}))})),
          value_t(dictionary_t()),
          value_t(Dictionary({{"a", zero}})),
          value_t(Dictionary({{"a", yes}})),
          value_t(Dictionary({{"b", zero}})),
          value_t(Dictionary({{"a", zero}, {"b", yes}})),
          value_t(Dictionary({{"a", value_t(Dictionary({{"a", zero}}))}})),
          value_t(Dictionary({{"a", value_t(Dictionary({{"a", yes}}))}}))};
}

TEST(Values, OfAllKindsCopyMoveAssignAndCompare) {
  const std::vector<value_t> samples = Samples();
  const std::vector<value_t> twins = Samples();  // which share nothing
  for (size_t i = 0; i < samples.size(); ++i) {
    for (size_t j = 0; j < samples.size(); ++j) {
      EXPECT_EQ(samples[i] == twins[j], i == j) << i << ' ' << j;
      value_t value(samples[i]);
      EXPECT_EQ(value, twins[i]);
      value = samples[j];
      EXPECT_EQ(value, twins[j]) << i << ' ' << j;
      EXPECT_EQ(value.type(), twins[j].type());
      value = *&value;
      value_t moved(std::move(value));
      EXPECT_EQ(moved, twins[j]);
      EXPECT_EQ(value, value_t()) << "moved-from";
      value = samples[i];
      moved = std::move(value);
      EXPECT_EQ(moved, twins[i]);
      EXPECT_EQ(value, value_t()) << "moved-from";
    }
  }
}

TEST(Values, AssignInPlaceWhereTheTypeIsTheSame) {
  value_t value(std::string("one"));
  const auto* const held = value.get_if<std::string>();
  value = value_t(std::string("moved in"));
  EXPECT_NE(value.get_if<std::string>(), held);
  const value_t two(std::string("two")), number(2.0);
  const auto* const before = value.get_if<std::string>();
  value = two;
  EXPECT_EQ(value.get_if<std::string>(), before);
  EXPECT_EQ(*before, "two");
  value = number;
  EXPECT_EQ(value.get_if<std::string>(), nullptr);
  EXPECT_EQ(*value.get_if<double>(), 2.0);

  value = value_t(Array({value_t(Array({two}))}));
  value = value.get_if<array_t>()->elements()[0];  // part of what it replaces
  EXPECT_EQ(value, value_t(Array({two})));
  value = value.get_if<array_t>()->elements()[0];
  EXPECT_EQ(value, two);
}

TEST(Values, NaNEqualsNothingExceptInWhatIsShared) {
  const value_t nan(std::numeric_limits<double>::quiet_NaN());
  EXPECT_FALSE(nan == nan);
  const array_t array = Array({nan});
  const dictionary_t dictionary = Dictionary({{"a", nan}});
  EXPECT_TRUE(array == array_t(array));
  EXPECT_FALSE(array == Array({nan}));
  EXPECT_TRUE(dictionary == dictionary_t(dictionary));
  EXPECT_FALSE(dictionary == Dictionary({{"a", nan}}));
}

// As many places as no machine could visit, of which each is one of sixty.
TEST(Values, CompareWhatIsSharedOnce) {
  const auto nested = [](double innermost) {
    value_t value(innermost);
    for (int i = 0; i < 60; ++i) value = i % 2 == 0 ? value_t(Array({value, value})) : value_t(Dictionary({{"a", value}, {"b", value}}));
    return value;
  };
  EXPECT_TRUE(nested(1) == nested(1));
  EXPECT_FALSE(nested(1) == nested(2));
}

TEST(Names, AreInternedAndOrderedByBytes) {
  static const char text[] = "interned", same[] = "interned", none[] = "";
  const name_t name(text);
  EXPECT_EQ(name_t(same), name);
  EXPECT_EQ(name_t(same).text(), static_cast<const char*>(text));
  EXPECT_EQ(name_t(none), name_t(nullptr));
  EXPECT_EQ(name_t(none), name_t());
  EXPECT_STREQ(name_t().text(), "");
  const char* const ordered[] = {"", "A", "a", "a\x01", "aa", "b", "\x80", "\xFF"};
  for (const auto& left : ordered) {
    for (const auto& right : ordered) {
      EXPECT_EQ(name_t(left) <=> name_t(right), &left <=> &right) << left << ' ' << right;
    }
  }
}

TEST(Array, IsCopiedWhenItChanges) {
  array_t first;
  const uint32_t emptyUses = first.use_count();
  {
    const array_t second;
    EXPECT_TRUE(second.shares_with(first));
    EXPECT_EQ(first.use_count(), emptyUses + 1);
  }
  EXPECT_EQ(first.use_count(), emptyUses);
  first.push_back(value_t(1.0));
  EXPECT_EQ(first.use_count(), 1u);
  EXPECT_EQ(array_t().use_count(), emptyUses) << "first left it, another came";

  array_t copy(first);
  const array_t third(copy);
  copy = *&copy;
  EXPECT_EQ(first.use_count(), 3u);
  copy.push_back(value_t(2.0));
  EXPECT_EQ(first.use_count(), 2u);
  EXPECT_EQ(first, Array({value_t(1.0)}));
  EXPECT_EQ(copy, Array({value_t(1.0), value_t(2.0)}));

  copy.push_back(value_t(copy));
  copy.push_back(copy.elements()[0]);
  ASSERT_EQ(copy.elements().size(), 4u);
  EXPECT_EQ(copy.elements()[2], value_t(Array({value_t(1.0), value_t(2.0)})));
  EXPECT_EQ(copy.elements()[3], value_t(1.0));
}

TEST(Dictionary, KeepsItsNamesInOrderAndOnce) {
  dictionary_t dictionary = Dictionary({{"b", value_t(1.0)}, {"a", value_t()}, {"c", value_t()}});
  const dictionary_t copy(dictionary);
  dictionary.insert_or_assign(name_t("b"), value_t(std::string("new")));
  std::string order;
  for (const auto& [name, value] : dictionary.elements()) order += name.text();
  EXPECT_EQ(order, "abc");
  EXPECT_EQ(dictionary.elements()[1].second, value_t(std::string("new")));
  EXPECT_EQ(copy.elements()[1].second, value_t(1.0));
  EXPECT_EQ(copy, Dictionary({{"c", value_t()}, {"b", value_t(1.0)}, {"a", value_t()}}));
  const auto* const unshared = dictionary.elements().data();
  dictionary.insert_or_assign(name_t("a"), value_t());
  EXPECT_EQ(dictionary.elements().data(), unshared);
  dictionary.insert_or_assign(name_t("b"), value_t(dictionary));
  EXPECT_EQ(dictionary.elements()[1].second.get_if<dictionary_t>()->elements().size(), 3u);
}

}  // namespace
