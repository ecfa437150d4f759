// Value adaptors.

#include <gtest/gtest.h>

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
  const std::string ones(size, '\1');
  const ValueDescriptor others[] = {{type, size + 1, 1}, {type == 2 ? 3U : 2U, size, 1}, {5, 0, 1}};
  TBinValue<T> value;
  for (const ValueDescriptor& other : others) {
    EXPECT_FALSE(value.GetData());
    EXPECT_EQ(value.GetType(), 0U);
    EXPECT_EQ(value.GetSize(), 0U);
    EXPECT_EQ(value.GetByteSize(), 0U);
    EXPECT_EQ(value.SetFromDescriptor({type, size, 1}, ones.data(), false), kSuccess);
    EXPECT_EQ(value.GetType(), type);
    EXPECT_EQ(value.GetSize(), size);
    EXPECT_EQ(Held(value), ones);
    EXPECT_EQ(value.SetFromDescriptor(other, ones.data(), true), kValueRefused);
  }
  EXPECT_TRUE(value.SetData(type, nullptr, size, true));
  EXPECT_EQ(Held(value), ones) << "the old value";
  EXPECT_TRUE(value.SetData(0, nullptr, 0, true));
  EXPECT_FALSE(value.GetData());
  EXPECT_EQ(value.Assign(TBinValue<T>(T())), kSuccess);
  EXPECT_EQ(Held(value), std::string(size, '\0'));
}

TEST(TypedValue, TakesItsKindAndRefusesOthers) {
  ExpectKind<signed char>(2, 1);
  ExpectKind<unsigned short>(3, 2);
  ExpectKind<int>(2, 4);
  ExpectKind<unsigned int>(3, 4);
  ExpectKind<bool>(3, 1);
  ExpectKind<BinaryType<unsigned int>>(1, 4);
  TBinValue<bool> flag(false);
  EXPECT_TRUE(flag.SetData(3, "\x80", 1, false));
  EXPECT_TRUE(flag.GetTypedValue());
}

TEST(StringValue, HoldsTextAsItIsStored) {
  const TBinValue<std::wstring> value(L"A\u00e9\U0001F30D");
  EXPECT_EQ(Held(value), std::string("A\0\xe9\0\x3c\xd8\x0d\xdf\0\0", 10));
  const std::string odd = "?" + Held(value);
  TBinValue<std::wstring> read;
  EXPECT_TRUE(read.SetData(5, odd.data() + 1, 0, false));
  EXPECT_EQ(Held(read), Held(value));
  const void* const own = static_cast<const char16_t*>(read.GetData()) + 1;
  EXPECT_TRUE(read.SetData(5, own, 0, false));
  EXPECT_TRUE(read.GetTypedValue() == L"\u00e9\U0001F30D");
  EXPECT_TRUE(read.SetData(5, nullptr, 0, false));
  EXPECT_EQ(Held(read), std::string(2, '\0'));
  EXPECT_EQ(read.Assign(value), kSuccess);
  EXPECT_EQ(Held(read), Held(value));
  EXPECT_FALSE(read.SetData(5, u"A", 2, true));
  EXPECT_FALSE(read.SetData(1, u"A", 0, true));
}

TEST(BlockValue, IsHeldWhereItsSizeAndTheCopyFlagSay) {
  for (const auto& [size, copy, storage] : {std::tuple{8U, true, Storage::kInline},
                                            {8U, false, Storage::kInline},
                                            {9U, true, Storage::kShared},
                                            {9U, false, Storage::kBorrowed}}) {
    TSimpleBinValue value;
    EXPECT_TRUE(value.SetData(1, kBytes, size, copy));
    EXPECT_TRUE(value.valid());
    EXPECT_EQ(value.storage(), storage) << size;
    EXPECT_EQ(Held(value), std::string(kBytes, size));
    EXPECT_EQ(value.GetData() == kBytes, storage == Storage::kBorrowed);
    EXPECT_TRUE(value.SetData(3, nullptr, 7, copy));
    EXPECT_FALSE(value.valid());
    EXPECT_FALSE(value.GetData());
    EXPECT_EQ(value.GetType(), 3U);
    EXPECT_EQ(value.GetSize(), 7U);
    EXPECT_TRUE(value.SetData(5, u"abc", 0, copy));
    EXPECT_EQ(Held(value), std::string("a\0b\0c\0\0\0", 8));
  }
}

TEST(BlockValue, SharesABlockAndCanBeSetFromItsOwnBytes) {
  for (const bool copy : {true, false}) {
    TSimpleBinValue value;
    TSimpleBinValue sharer;
    value.SetData(1, kBytes, 16, true);
    EXPECT_EQ(sharer.Assign(value), kSuccess);
    EXPECT_EQ(sharer.GetData(), value.GetData());
    EXPECT_EQ(sharer.Assign(TSimpleBinValue(1, kBytes, 9)), kSuccess);
    EXPECT_TRUE(sharer.storage() == Storage::kShared);
    EXPECT_EQ(Held(sharer), "012345678");
    std::string expected = kBytes;
    for (const auto& [from, size] : {std::pair{2U, 12U}, {1U, 6U}, {2U, 3U}}) {
      value.SetData(1, static_cast<const char*>(value.GetData()) + from, size, copy);
      expected = expected.substr(from, size);
      EXPECT_EQ(Held(value), expected);
    }
  }
}

}  // namespace
}  // namespace orx::cs::velta
