#include "orxutils/orx_dl_allocator.h"

namespace orx {

void* orx_operator_new(std::size_t bytes) { return ::operator new(bytes); }

void orx_operator_delete(void* memory) noexcept { ::operator delete(memory); }

}  // namespace orx
