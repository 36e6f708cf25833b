#include "MemoryCounter.h"

#include <unicode/uclean.h>

#include <algorithm>
#include <cstdlib>
#include <new>

namespace {

std::size_t liveBytes = 0;
std::size_t peakBytes = 0;

/// In front of each block, as large as the strictest alignment of ordinary memory.
struct alignas(std::max_align_t) BlockHeader {
  std::size_t size;
};

void* allocate(std::size_t size) noexcept {
  auto* const block = static_cast<BlockHeader*>(std::malloc(sizeof(BlockHeader) + size));
  if (block == nullptr) {
    return nullptr;
  }
  block->size = size;
  liveBytes += size;
  peakBytes = std::max(peakBytes, liveBytes);
  return block + 1;
}

void release(void* memory) noexcept {
  if (memory != nullptr) {
    auto* const block = static_cast<BlockHeader*>(memory) - 1;
    liveBytes -= block->size;
    std::free(block);
  }
}

void* reallocate(void* memory, std::size_t size) noexcept {
  void* const grown = allocate(size);
  if (grown != nullptr && memory != nullptr) {
    const std::size_t kept = std::min((static_cast<BlockHeader*>(memory) - 1)->size, size);
    std::copy_n(static_cast<const char*>(memory), kept, static_cast<char*>(grown));
    release(memory);
  }
  return grown;
}

const bool kIcuIsCounted = [] {
  UErrorCode status = U_ZERO_ERROR;
  u_setMemoryFunctions(
      nullptr, [](const void*, std::size_t size) { return allocate(size); },
      [](const void*, void* memory, std::size_t size) { return reallocate(memory, size); },
      [](const void*, void* memory) { release(memory); }, &status);
  return U_SUCCESS(status) != 0;
}();

}  // namespace

void* operator new(std::size_t size) {
  if (void* const memory = allocate(size)) {
    return memory;
  }
  throw std::bad_alloc();
}
void* operator new(std::size_t size, const std::nothrow_t& /*tag*/) noexcept {
  return allocate(size);
}
void operator delete(void* memory) noexcept { release(memory); }
void operator delete(void* memory, std::size_t /*size*/) noexcept { release(memory); }
void operator delete(void* memory, const std::nothrow_t& /*tag*/) noexcept { release(memory); }

// The standard library's own forms for arrays call these, those of the address sanitizer do not.
void* operator new[](std::size_t size) { return operator new(size); }
void* operator new[](std::size_t size, const std::nothrow_t& tag) noexcept {
  return operator new(size, tag);
}
void operator delete[](void* memory) noexcept { release(memory); }
void operator delete[](void* memory, std::size_t /*size*/) noexcept { release(memory); }
void operator delete[](void* memory, const std::nothrow_t& /*tag*/) noexcept { release(memory); }

namespace wordcatcher::testing {

std::size_t MemoryCounter::live() noexcept { return liveBytes; }
std::size_t MemoryCounter::peak() noexcept { return peakBytes; }
void MemoryCounter::restartPeak() noexcept { peakBytes = liveBytes; }
bool MemoryCounter::countsIcu() noexcept { return kIcuIsCounted; }

}  // namespace wordcatcher::testing
