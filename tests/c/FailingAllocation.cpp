// Replaces the C++ allocation of the whole program, the library's included, by one that fails on
// demand.

#include <cstdlib>
#include <new>

namespace {

long left = -1;
bool failed = false;

void* allocate(std::size_t size) noexcept {
  if (left == 0) {
    failed = true;
    return nullptr;
  }
  left -= left > 0 ? 1 : 0;
  return std::malloc(size == 0 ? 1 : size);
}

void* allocateOrThrow(std::size_t size) {
  void* const memory = allocate(size);
  if (memory == nullptr) {
    throw std::bad_alloc();
  }
  return memory;
}

}  // namespace

extern "C" {

void fail_allocations_after(long count) {
  left = count;
  failed = failed && count < 0;
}

bool allocation_failed() { return failed; }
}

void* operator new(std::size_t size) { return allocateOrThrow(size); }
void* operator new[](std::size_t size) { return allocateOrThrow(size); }
void* operator new(std::size_t size, const std::nothrow_t&) noexcept { return allocate(size); }
void* operator new[](std::size_t size, const std::nothrow_t&) noexcept { return allocate(size); }
void operator delete(void* memory) noexcept { std::free(memory); }
void operator delete[](void* memory) noexcept { std::free(memory); }
void operator delete(void* memory, std::size_t) noexcept { std::free(memory); }
void operator delete[](void* memory, std::size_t) noexcept { std::free(memory); }
void operator delete(void* memory, const std::nothrow_t&) noexcept { std::free(memory); }
void operator delete[](void* memory, const std::nothrow_t&) noexcept { std::free(memory); }
