#pragma once

#include <array>
#include <boost/smart_ptr/intrusive_ptr.hpp>
#include <cstdint>
#include <cstring>
#include <functional>
#include <memory>
#include <new>
#include <variant>

#include "store/binary_value.h"

namespace orx::cs::velta {

/// A copy of a value's bytes that several adaptors hold.
struct SharedBlock {
  std::uint32_t references = 0;
  std::unique_ptr<unsigned char[]> bytes;
  std::uint32_t size = 0;
};

inline void intrusive_ptr_add_ref(SharedBlock* block) { ++block->references; }
inline void intrusive_ptr_release(SharedBlock* block) {
  if (--block->references == 0) std::default_delete<SharedBlock>()(block);
}

/// A block of bytes of any size under any type code.
class TSimpleBinValue : public TBinaryValue {
 public:
  /// Who holds the bytes: nobody, a block that others may hold too, the caller, the adaptor itself.
  enum class Storage : std::uint8_t { kEmpty = 0, kShared = 1, kBorrowed = 2, kInline = 3 };

  /// Up to this many bytes are held inline.
  static constexpr std::uint32_t kInlineBytes = 8;

  TSimpleBinValue() = default;
  /// Borrows the bytes, which must live as long as the adaptor or until it is set anew.
  TSimpleBinValue(std::uint8_t type, const void* data, std::uint32_t size)
      : valid_(true), type_(type), size_(size), holder_(data) {}

  /// Never refuses a value. When there is no memory for a copy, the adaptor ends up empty.
  bool SetData(std::uint32_t type, const void* data, std::uint32_t size, bool copy) override {
    // The bytes may lie in what is held, which therefore goes last.
    holder_ = Take(data, size, copy);
    valid_ = storage() != Storage::kEmpty;
    type_ = static_cast<std::uint8_t>(type);
    size_ = size;
    return true;
  }

  /// A block that the other adaptor holds is shared with it.
  std::int32_t Assign(const bin_value& other) override {
    const auto* const simple = dynamic_cast<const TSimpleBinValue*>(&other);
    if (simple && simple->storage() == Storage::kShared) {
      *this = *simple;
      return kSuccess;
    }
    return SetData(other.GetType(), other.GetData(), other.GetSize(), true) ? kSuccess
                                                                            : kValueRefused;
  }

  std::uint32_t GetType() const override { return type_; }
  std::uint32_t GetSize() const override { return size_; }
  const void* GetData() const override {
    switch (storage()) {
      case Storage::kShared:
        return std::get<Block>(holder_)->bytes.get();
      case Storage::kBorrowed:
        return std::get<const void*>(holder_);
      case Storage::kInline:
        return std::get<InlineBytes>(holder_).data();
      case Storage::kEmpty:
        break;
    }
    return nullptr;
  }

  bool valid() const { return valid_; }
  Storage storage() const { return static_cast<Storage>(holder_.index()); }

 private:
  using Block = boost::intrusive_ptr<SharedBlock>;
  using InlineBytes = std::array<unsigned char, kInlineBytes>;
  /// The alternatives in the order of `Storage`.
  using Holder = std::variant<std::monostate, Block, const void*, InlineBytes>;

  Holder Take(const void* data, std::uint32_t size, bool copy) const {
    if (!data) return {};
    const std::uint32_t bytes = size == 0 ? TextBytes(data) : size;
    if (bytes <= kInlineBytes) {
      InlineBytes taken = {};
      std::memcpy(taken.data(), data, bytes);
      return taken;
    }
    if (!copy && !LiesInBlock(data)) return data;
    return CopyOf(data, bytes);
  }

  bool LiesInBlock(const void* data) const {
    const auto* const block = std::get_if<Block>(&holder_);
    if (!block) return false;
    const unsigned char* const start = (*block)->bytes.get();
    const auto* const at = static_cast<const unsigned char*>(data);
    return !std::less<>()(at, start) && std::less<>()(at, start + (*block)->size);
  }

  static Holder CopyOf(const void* data, std::uint32_t bytes) {
    auto block = std::unique_ptr<SharedBlock>(new (std::nothrow) SharedBlock);
    if (block) block->bytes.reset(new (std::nothrow) unsigned char[bytes]);
    if (!block || !block->bytes) return {};
    block->size = bytes;
    std::memcpy(block->bytes.get(), data, bytes);
    return Block(block.release());
  }

  bool valid_ = false;
  std::uint8_t type_ = kNoValue;
  std::uint32_t size_ = 0;
  Holder holder_;
};

}  // namespace orx::cs::velta
