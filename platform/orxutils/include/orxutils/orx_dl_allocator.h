#pragma once

#include <cstddef>
#include <limits>
#include <new>

#include "orxutils/export.h"

namespace orx {

/// Memory that one module may take and another give back.
/// \throws std::bad_alloc
ORXUTILS_EXPORT void* orx_operator_new(std::size_t bytes);
/// Gives back what `orx_operator_new` returned; null is allowed.
ORXUTILS_EXPORT void orx_operator_delete(void* memory) noexcept;

/// Standard allocator over `orx_operator_new` and `orx_operator_delete`.
template <class T>
struct orx_dl_allocator {
  using value_type = T;  ///< what is allocated

  orx_dl_allocator() noexcept = default;
  /// All allocators are one.
  template <class U>
  orx_dl_allocator(const orx_dl_allocator<U>&) noexcept {}

  /// \return memory for so many objects, not initialised
  /// \throws std::bad_alloc
  T* allocate(std::size_t count) {
    if (count > std::numeric_limits<std::size_t>::max() / sizeof(T)) throw std::bad_alloc();
    return static_cast<T*>(orx_operator_new(count * sizeof(T)));
  }
  /// Gives back what any of these allocators returned.
  void deallocate(T* memory, std::size_t) noexcept { orx_operator_delete(memory); }
};

/// What one allocator took, every other gives back.
template <class T, class U>
bool operator==(const orx_dl_allocator<T>&, const orx_dl_allocator<U>&) noexcept {
  return true;
}
/// Never: all allocators are one.
template <class T, class U>
bool operator!=(const orx_dl_allocator<T>&, const orx_dl_allocator<U>&) noexcept {
  return false;
}

}  // namespace orx
