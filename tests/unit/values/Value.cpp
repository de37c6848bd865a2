#include "support/SmallStack.h"
#include "support/ValuePrinter.h"

#include <LumoraKit/platform/Value.h>

#include <cmath>
#include <limits>

using namespace lumora;
using lumora::tests::onSmallStack;
using namespace std::chrono_literals;

namespace {

using Type = Value::Type;

constexpr std::uint64_t largestUnsigned = std::numeric_limits<std::uint64_t>::max();

std::vector<Value> oneOfEachType() {
  return {"text", 1, largestUnsigned, 1.5, true, Date(1s), Data{1}, Array{1}, Dictionary{{"a", 1}}};
}

TEST(Value, hasTheType_whenMadeFromAnything) {
  EXPECT_EQ(Value("text").type(), Type::String);
  EXPECT_EQ(Value(std::string("text")).type(), Type::String);
  EXPECT_EQ(Value(std::string_view("text")).type(), Type::String);
  EXPECT_EQ(Value(-1).type(), Type::Integer);
  EXPECT_EQ(Value(1U).type(), Type::Integer);
  EXPECT_EQ(Value(std::uint64_t{1}).type(), Type::Integer);
  EXPECT_EQ(Value(largestUnsigned).type(), Type::UnsignedInteger);
  EXPECT_EQ(Value(1.0).type(), Type::Real);
  EXPECT_EQ(Value(true).type(), Type::Boolean);
  EXPECT_EQ(Value(Date()).type(), Type::Date);
  EXPECT_EQ(Value(Data()).type(), Type::Data);
  EXPECT_EQ(Value(Array()).type(), Type::Array);
  EXPECT_EQ(Value(Dictionary()).type(), Type::Dictionary);
}

TEST(Value, handsOutItsContentOnly_whenAskedForEachType) {
  const std::vector<Value> values = oneOfEachType();
  for (const Value& value : values) {
    EXPECT_EQ(value.string() != nullptr, value.type() == Type::String);
    EXPECT_EQ(value.data() != nullptr, value.type() == Type::Data);
    EXPECT_EQ(value.array() != nullptr, value.type() == Type::Array);
    EXPECT_EQ(value.dictionary() != nullptr, value.type() == Type::Dictionary);
    EXPECT_EQ(value.boolean().has_value(), value.type() == Type::Boolean);
    EXPECT_EQ(value.date().has_value(), value.type() == Type::Date);
  }
  EXPECT_EQ(*values[0].string(), "text");
  EXPECT_EQ(*values[6].data(), Data{1});
  EXPECT_EQ(values[4].boolean(), true);
  EXPECT_EQ(values[5].date(), Date(1s));
}

TEST(Value, convertsNumbers_whenTheyFit) {
  EXPECT_EQ(Value(-1).integer(), -1);
  EXPECT_EQ(Value(-1).unsignedInteger(), std::nullopt);
  EXPECT_EQ(Value(1).unsignedInteger(), 1U);
  EXPECT_EQ(Value(largestUnsigned).integer(), std::nullopt);
  EXPECT_EQ(Value(largestUnsigned).unsignedInteger(), largestUnsigned);
  EXPECT_EQ(Value(true).integer(), 1);
  EXPECT_EQ(Value(false).unsignedInteger(), 0U);
  EXPECT_EQ(Value(2).real(), 2.0);
  EXPECT_EQ(Value(largestUnsigned).real(), 18446744073709551616.0);
  EXPECT_EQ(Value(1.5).integer(), std::nullopt);
  EXPECT_EQ(Value("1").integer(), std::nullopt);
  EXPECT_EQ(Value("1").real(), std::nullopt);
}

TEST(Value, equalsOnlyItself_whenTypesDiffer) {
  const std::vector<Value> values = oneOfEachType();
  for (std::size_t i = 0; i < values.size(); ++i) {
    for (std::size_t j = 0; j < values.size(); ++j) {
      EXPECT_EQ(values[i] == values[j], i == j) << i << ' ' << j;
    }
  }
  EXPECT_NE(Value(1), Value(1.0));
  EXPECT_NE(Value(1), Value(true));
  EXPECT_NE(Value("1"), Value(1));
}

TEST(Value, equalsByContent_whenMadeDifferently) {
  EXPECT_EQ(Value(1), Value(std::uint64_t{1}));
  EXPECT_EQ(Value(0.0), Value(-0.0));
  EXPECT_EQ(Value(std::nan("")), Value(std::nan("")));
  EXPECT_NE(Value(std::nan("")), Value(1.0));
  EXPECT_NE(Value(Array{1, 2}), Value(Array{2, 1}));
  EXPECT_NE(Value(Array{1}), Value(Array{1, 1}));
  EXPECT_NE(Value(Array{Array{1}}), Value(Array{Array{2}}));
  EXPECT_NE(Value(Data{1}), Value(Data{2}));
}

TEST(Value, isIndependent_whenCopied) {
  const Value original = Dictionary{{"a", Array{1, Dictionary{{"b", Data{1}}}}}, {"c", Array{}}};
  Value copy = original;
  EXPECT_EQ(copy, original);
  copy.dictionary()->find("a")->array()->push_back(2);
  EXPECT_NE(copy, original);
  EXPECT_EQ(original.description(), "{a: [1, {b: <01>}], c: []}");
}

TEST(Value, keepsItsContent_whenAssignedFromItself) {
  Value value = Array{1, Array{2}};
  const Value& same = value;
  value = same;
  EXPECT_EQ(value, Value(Array{1, Array{2}}));
}

TEST(Value, takesAPartOfItself_whenAssignedFromIt) {
  Value value = Array{1, Array{2, Array{3}}};
  value = std::move(value.array()->back());
  EXPECT_EQ(value, Value(Array{2, Array{3}}));
  value = value.array()->back();
  EXPECT_EQ(value, Value(Array{3}));
}

TEST(Value, describesItself_whenItIsAnyType) {
  EXPECT_EQ(Value("a \"b\"").description(), "a \"b\"");
  EXPECT_EQ(Value(-5).description(), "-5");
  EXPECT_EQ(Value(largestUnsigned).description(), "18446744073709551615");
  EXPECT_EQ(Value(0.1).description(), "0.1");
  EXPECT_EQ(Value(5.0).description(), "5");
  EXPECT_EQ(Value(1e100).description(), "1e+100");
  EXPECT_EQ(Value(true).description(), "1");
  EXPECT_EQ(Value(false).description(), "0");
  EXPECT_EQ(Value(Date(1263999845s)).description(), "2010-01-20 15:04:05 +0000");
  EXPECT_EQ(Value(Data{0x0f, 0xbe}).description(), "<0fbe>");
  EXPECT_EQ(Value(Data{}).description(), "<>");
  EXPECT_EQ(Value(Array{1, Array{}, Array{"a", 2}}).description(), "[1, [], [a, 2]]");
  EXPECT_EQ(Value(Dictionary{{"a", 1}, {"b", Dictionary{}}, {"c", Dictionary{{"d", Array{1}}}}}).description(),
            "{a: 1, b: {}, c: {d: [1]}}");
}

TEST(Value, describesADate_whenItsYearHasNotFourDigits) {
  EXPECT_EQ(Value(Date(-62135596800s)).description(), "0001-01-01 00:00:00 +0000");
  EXPECT_EQ(Value(Date(-62135596801s)).description(), "-62135596801 s after 1970-01-01");
  EXPECT_EQ(Value(Date::max()).description(), "9223372036854775807 s after 1970-01-01");
}

Value nested(int depth) {
  Value value = 1;
  for (int i = 0; i < depth; ++i) {
    Array inside;
    inside.push_back(std::move(value));
    if (i % 2 != 0) {
      value = std::move(inside);
      continue;
    }
    Dictionary outer;
    outer.set("inside", std::move(inside));
    value = std::move(outer);
  }
  return value;
}

TEST(Value, doesNotRecurse_whenDeeplyNestedAndTheStackIsSmall) {
  onSmallStack([] {
    const Value value = nested(100'000);
    Value copy = value;
    EXPECT_TRUE(copy == value);
    EXPECT_GT(copy.description().size(), 100'000U);
    copy = nested(100'001);
    EXPECT_FALSE(copy == value);
    copy = 1;
  });
}

TEST(Dictionary, doesNotRecurse_whenDeeplyNestedAndTheStackIsSmall) {
  onSmallStack([] {
    const Dictionary dictionary{{"a", nested(100'000)}};
    Dictionary copy = dictionary;
    EXPECT_TRUE(copy == dictionary);
    copy.remove("a");
    EXPECT_TRUE(copy.empty());
  });
}

} // namespace
