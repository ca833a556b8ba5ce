// SPDX-License-Identifier: Apache-2.0
#include "values/value.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <limits>
#include <memory>
#include <string>

#include "values/dictionary.h"
#include "values/printer.h"

namespace probeview {
namespace {

TEST(Value, IsAnEmptyTextByDefault) {
  EXPECT_EQ(Value().kind(), ValueKind::Text);
  EXPECT_EQ(Value().text(), "");
}

TEST(Value, TextsOfEveryLengthSurviveCopiesAndMoves) {
  for (std::size_t length : {0u, 1u, 29u, 30u, 31u, 32u, 33u, 1000u}) {
    const std::string content(length, 'x');
    Value value = Value::text(content);
    Value copy = value;
    Value moved = std::move(value);
    EXPECT_EQ(copy.text(), content);
    EXPECT_EQ(moved.text(), content);
    EXPECT_EQ(value.text(), "");  // NOLINT(bugprone-use-after-move): a moved-from value is an empty text
    copy = Value(std::int32_t{1});
    EXPECT_EQ(moved.text(), content);
  }
}

TEST(Value, SelfAssignmentKeepsTheContent) {
  Value value = Value::text(std::string(100, 'y'));
  const Value& same = value;
  value = same;
  EXPECT_EQ(value.text(), std::string(100, 'y'));
}

TEST(Value, WritingToOneCopyLeavesTheOtherAsItWas) {
  Value one = Dictionary{{"a", std::int32_t{1}}};
  Value two = one;
  two.mutableDictionary()->set("a", std::int32_t{2});
  EXPECT_EQ(printed(one), R"(["a": 1])");
  EXPECT_EQ(printed(two), R"(["a": 2])");
  Value list = List{one, two};
  Value other = list;
  other.mutableList()->append(true);
  EXPECT_EQ(list.list()->size(), 2u);
  EXPECT_EQ(other.list()->size(), 3u);
}

TEST(Value, WhatAValueHoldsLivesUntilItsLastCopyGoes) {
  auto first = std::make_unique<Value>(List{Value::text(std::string(40, 'x')), Dictionary{{"a", std::int32_t{1}}}});
  Value second = *first;
  EXPECT_EQ(second.list(), second.mutableList()) << "a container is at its own place";
  const Value inner = (*first->list())[1];
  first->mutableList()->clear();
  first.reset();
  EXPECT_EQ(printed(second), "[\"" + std::string(40, 'x') + "\", [\"a\": 1]]");
  second = Value();
  EXPECT_EQ(printed(inner), "[\"a\": 1]");
}

TEST(Value, AnEmptyContainerIsCopiedAndFilledLikeAnyOther) {
  for (const Value& empty : {Value(List()), Value(Dictionary())}) {
    Value copy = empty;
    const Value other = copy;
    EXPECT_TRUE(copy == other);
    if (List* const list = copy.mutableList()) list->append(true);
    if (Dictionary* const dictionary = copy.mutableDictionary()) dictionary->set("a", true);
    EXPECT_FALSE(copy == other);
    EXPECT_EQ(printed(other), "[]");
  }
}

TEST(List, AFillerReplacesWhatWasThereAndKeepsWhatItHadWhenItEndsEarly) {
  List list{std::int32_t{1}, std::int32_t{2}};
  try {
    List::Filler values(list, 10);
    values.append(Value::text(std::string(40, 'y')));
    throw 1;
  } catch (int) {
  }
  EXPECT_EQ(printed(list), "[\"" + std::string(40, 'y') + "\"]");
  list.append(std::int32_t{3});
  EXPECT_EQ(list.size(), 2U);
}

TEST(Value, AnIntegerIsWhatFitsIntoSigned32Bits) {
  EXPECT_EQ(Value(std::int32_t{-5}).integer32(), -5);
  EXPECT_EQ(Value(std::uint32_t{2147483647u}).integer32(), 2147483647);
  EXPECT_EQ(Value(std::uint32_t{2147483648u}).integer32(), std::nullopt);
  EXPECT_EQ(Value(std::int64_t{-2147483648LL}).integer32(), std::numeric_limits<std::int32_t>::min());
  EXPECT_EQ(Value(std::int64_t{-2147483649LL}).integer32(), std::nullopt);
  EXPECT_EQ(Value(std::uint64_t{7}).integer32(), 7);
  EXPECT_EQ(Value(std::numeric_limits<std::uint64_t>::max()).integer32(), std::nullopt);
  EXPECT_EQ(Value(true).integer32(), std::nullopt);
  EXPECT_EQ(Value(1.0).integer32(), std::nullopt);
  EXPECT_EQ(Value::text("1").integer32(), std::nullopt);
}

TEST(Value, ARealIsAnyNumberButABoolean) {
  EXPECT_EQ(Value(std::uint32_t{3}).real(), 3.0);
  EXPECT_EQ(Value(1.5f).real(), 1.5);
  EXPECT_EQ(Value(true).real(), std::nullopt);
  EXPECT_EQ(Value::text("1").real(), std::nullopt);
}

TEST(Value, OnlyASigned64BitIntegerIsAnEventInteger) {
  EXPECT_EQ(Value(std::int64_t{2}).int64(), 2);
  EXPECT_EQ(Value(std::int32_t{2}).int64(), std::nullopt);
  EXPECT_EQ(Value(std::uint64_t{2}).int64(), std::nullopt);
}

TEST(Dictionary, KeepsTheOrderOfInsertionAndReplacesInPlace) {
  Dictionary dictionary{{"b", std::int32_t{1}}, {"a", std::int32_t{2}}};
  dictionary.set("c", std::int32_t{3});
  dictionary.set("b", Value::text("new"));
  EXPECT_EQ(printed(dictionary), R"(["b": "new", "a": 2, "c": 3])");
}

TEST(Dictionary, ComparesRegardlessOfOrder) {
  EXPECT_EQ((Dictionary{{"a", true}, {"b", false}}), (Dictionary{{"b", false}, {"a", true}}));
  EXPECT_FALSE((Dictionary{{"a", true}}) == (Dictionary{{"a", std::int32_t{1}}}));
}

TEST(Key, CopiesOwnTheirText) {
  std::string source = "temporary";
  Key key = Key::copy(source);
  source = "overwritten!!";
  Key copy = key;
  key = Key::copy("other");
  EXPECT_EQ(copy.text(), "temporary");
  EXPECT_EQ(key.text(), "other");
}

TEST(Value, IsAssignedFromWhatItHolds) {
  Value value(List{List{std::int32_t{1}}, std::int32_t{2}});
  value = Value((*value.list())[0]);
  EXPECT_EQ(printed(value), "[1]");
  value = Value(Dictionary{{"inner", Dictionary{{"key", Value::text(std::string(40, 'y'))}}}});
  value = std::move(value.mutableDictionary()->find("inner")->mutableDictionary()->find("key")[0]);
  EXPECT_EQ(bareText(value), std::string(40, 'y'));
}

}  // namespace
}  // namespace probeview
