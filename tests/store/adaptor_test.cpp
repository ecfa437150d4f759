// Value adaptors.

#include <gtest/gtest.h>

#include <string>

#include "store/simple_value.h"
#include "store/typed_value.h"

namespace orx::cs::velta {
namespace {

using Storage = TSimpleBinValue::Storage;

const char kBytes[] = "0123456789abcdef";

std::string Held(const bin_value& value) {
  return {static_cast<const char*>(value.GetData()), value.GetByteSize()};
}

template <class T>
void ExpectKind(std::uint32_t type, std::uint32_t size) {
  const TBinValue<T> set{T()}, unset;
  EXPECT_TRUE(set.GetType() == type && set.GetSize() == size && set.GetByteSize() == size);
  EXPECT_EQ(unset.GetType() + unset.GetSize() + unset.GetByteSize(), 0U);
  EXPECT_TRUE(!unset.GetData() && unset.GetDescriptor().dimension == 1);
  const std::string ones(size, '\1');
  TBinValue<T> read{T()};
  const ValueDescriptor others[] = {{type, size + 1, 1}, {type == 2 ? 3U : 2U, size, 1}, {5, 0, 1}};
  for (const ValueDescriptor& other : others) {
    EXPECT_EQ(read.SetFromDescriptor({type, size, 1}, ones.data(), false), kSuccess);
    EXPECT_EQ(Held(read), ones);
    EXPECT_EQ(read.SetFromDescriptor(other, ones.data(), true), kValueRefused);
    EXPECT_EQ(read.GetType(), 0U);
  }
  EXPECT_TRUE(read.SetData(type, nullptr, size, true) && Held(read) == ones);  // the old value
  EXPECT_TRUE(read.SetData(0, nullptr, 0, true) && !read.GetData());
  EXPECT_EQ(read.Assign(set) + read.Assign(read), kSuccess);
  EXPECT_EQ(Held(read), Held(set));
}

TEST(TypedValue, TakesItsKindAndRefusesOthers) {
  ExpectKind<signed char>(2, 1);
  ExpectKind<unsigned short>(3, 2);
  ExpectKind<int>(2, 4);
  ExpectKind<unsigned int>(3, 4);
  ExpectKind<bool>(3, 1);
  ExpectKind<BinaryType<unsigned int>>(1, 4);
  TBinValue<bool> flag(false);
  EXPECT_TRUE(flag.SetData(3, "\x80", 1, false) && flag.GetTypedValue());
}

TEST(StringValue, HoldsTextAsItIsStored) {
  const std::wstring text = L"A\u00e9\U0001F30D";
  const TBinValue<std::wstring> value(text);
  EXPECT_EQ(Held(value), std::string("A\0\xe9\0\x3c\xd8\x0d\xdf\0\0", 10));
  const std::string odd = "?" + Held(value);
  TBinValue<std::wstring> read;
  EXPECT_TRUE(read.SetData(5, odd.data() + 1, 0, false));
  EXPECT_EQ(read.GetTypedValue(), text);
  EXPECT_TRUE(read.SetData(5, static_cast<const char16_t*>(read.GetData()) + 1, 0, false));
  EXPECT_EQ(read.GetTypedValue(), text.substr(1));
  EXPECT_EQ(read.Assign(value), kSuccess);
  EXPECT_EQ(read.GetTypedValue(), text);
  EXPECT_TRUE(read.SetData(5, nullptr, 0, false));
  EXPECT_EQ(Held(read), std::string(2, '\0'));
  EXPECT_EQ(read.SetFromDescriptor({5, 2, 1}, u"A", true), kValueRefused);
  EXPECT_EQ(read.SetFromDescriptor({1, 0, 1}, u"A", true), kValueRefused);
}

TEST(BlockValue, IsHeldWhereItsSizeAndTheCopyFlagSay) {
  const struct {
    std::uint32_t size;
    bool copy;
    Storage storage;
  } cases[] = {{1, false, Storage::kInline},
               {8, true, Storage::kInline},
               {8, false, Storage::kInline},
               {9, true, Storage::kShared},
               {9, false, Storage::kBorrowed}};
  for (const auto& c : cases) {
    TSimpleBinValue value;
    EXPECT_TRUE(value.SetData(1, kBytes, c.size, c.copy) && value.valid());
    EXPECT_EQ(value.storage(), c.storage) << c.size;
    EXPECT_EQ(Held(value), std::string(kBytes, c.size));
    EXPECT_EQ(value.GetData() == kBytes, c.storage == Storage::kBorrowed);
    EXPECT_TRUE(value.SetData(3, nullptr, 7, c.copy) && !value.valid());
    EXPECT_EQ(value.storage(), Storage::kEmpty);
    EXPECT_TRUE(value.GetType() == 3 && value.GetSize() == 7 && !value.GetData());
  }
  TSimpleBinValue text;
  text.SetData(5, u"ab", 0, false);
  EXPECT_EQ(text.storage(), Storage::kInline);
  EXPECT_TRUE(text.GetSize() == 0 && text.GetByteSize() == 6);
  text.SetData(5, u"abcd", 0, true);
  EXPECT_EQ(Held(text), std::string("a\0b\0c\0d\0\0\0", 10));
}

TEST(BlockValue, CopiesOfASharedBlockShareIt) {
  TSimpleBinValue second;
  const void* block = nullptr;
  {
    TSimpleBinValue first;
    first.SetData(1, kBytes, 16, true);
    block = first.GetData();
    EXPECT_EQ(second.Assign(first) + first.Assign(first), kSuccess);
    first.SetData(1, "x", 1, true);
  }
  EXPECT_TRUE(second.GetData() == block && Held(second) == kBytes);
  EXPECT_EQ(second.Assign(TBinValue<int>(5)), kSuccess);
  EXPECT_TRUE(second.GetType() == 2 && second.storage() == Storage::kInline);
  EXPECT_EQ(second.Assign(TSimpleBinValue(1, kBytes, 16)) + second.Assign(second), kSuccess);
  EXPECT_TRUE(second.storage() == Storage::kShared && Held(second) == kBytes);
}

TEST(BlockValue, CanBeSetFromItsOwnBytes) {
  for (const bool copy : {true, false}) {
    TSimpleBinValue value;
    const auto keep = [&](std::uint32_t from, std::uint32_t size) {
      value.SetData(1, static_cast<const char*>(value.GetData()) + from, size, copy);
      return Held(value);
    };
    value.SetData(1, kBytes, 16, true);
    EXPECT_EQ(keep(2, 12), "23456789abcd");
    EXPECT_EQ(keep(1, 6), "345678");
    EXPECT_EQ(keep(2, 3), "567");
  }
}

}  // namespace
}  // namespace orx::cs::velta
