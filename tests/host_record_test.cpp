#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <functional>

#include "host/Error.h"
#include "host/Record.h"

namespace {

using host::Record;
using testing::ThrowsMessage;

TEST(Record, ACopyIsChangedWithoutTheOriginal) {
  const std::string text = R"({"name":"a","inner":{"key":1},"list":[{"key":2}]})";
  const struct {
    std::function<void(Record&)> change;
    const char* expected;
  } kCases[] = {
      {[](Record& r) { r.Set("inner/key", 3); }, R"({"name":"a","inner":{"key":3},"list":[{"key":2}]})"},
      {[](Record& r) { r.Set("list/0/key", 3); }, R"({"name":"a","inner":{"key":1},"list":[{"key":3}]})"},
      {[](Record& r) { r.Set("inner", r); },
       R"({"name":"a","inner":{"name":"a","inner":{"key":1},"list":[{"key":2}]},"list":[{"key":2}]})"},
      {[](Record& r) { r.Append("list", Record()); },
       R"({"name":"a","inner":{"key":1},"list":[{"key":2},{}]})"},
      {[](Record& r) { r.Erase("inner/key"); }, R"({"name":"a","inner":{},"list":[{"key":2}]})"},
      {[](Record& r) { r.Erase("list/0"); }, R"({"name":"a","inner":{"key":1},"list":[]})"},
  };
  for (const auto& row : kCases) {
    const Record original = Record::Parse(text);
    Record copy = original;
    row.change(copy);
    EXPECT_EQ(copy.Text(), row.expected);
    EXPECT_EQ(original.Text(), text) << row.expected;
  }
}

TEST(Record, WhatCannotBeStoredIsNotRepeated) {
  Record record;
  EXPECT_THAT([&] { record.Set("chap/secret", "hush\xff"); },
              ThrowsMessage<host::Error>("The text for \"chap/secret\" is not UTF-8."));
  EXPECT_THAT([&] { record.Set("chap/secret", std::string("hush\0", 5)); },
              ThrowsMessage<host::Error>("The text for \"chap/secret\" has a zero byte."));
}

}  // namespace
