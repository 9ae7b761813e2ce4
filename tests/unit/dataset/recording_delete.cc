#include "recording_delete.h"

#include <cstdlib>
#include <new>

// The replacements live in a translation unit of their own: were they
// inlined into the tests, an optimising compiler would pair the malloc inside
// operator new with the operator delete that frees it and warn of a mismatch
// (-Wmismatched-new-delete), although the two belong together here.

namespace {

struct freed_block {
  const void* address;
  std::size_t size;
};

// Filled from operator delete, which must not allocate.
constexpr std::size_t kMaxFreed = 4096;
freed_block freed[kMaxFreed];
std::size_t freed_count = 0;
bool recording = false;

}  // namespace

namespace recording_delete {

void start() {
  freed_count = 0;
  recording = true;
}

std::vector<std::size_t> frees_of(const void* address) {
  recording = false;
  std::vector<std::size_t> sizes;
  for (std::size_t i = 0; i < freed_count; ++i) {
    if (freed[i].address == address) {
      sizes.push_back(freed[i].size);
    }
  }
  return sizes;
}

}  // namespace recording_delete

// The whole set is replaced, over malloc and free, so that every allocation
// of the binary pairs with the recording delete.
void* operator new(std::size_t size) {
  void* address = std::malloc(size == 0 ? 1 : size);
  if (address == nullptr) {
    throw std::bad_alloc();
  }
  return address;
}

void operator delete(void* address) noexcept { std::free(address); }

void operator delete(void* address, std::size_t size) noexcept {
  if (recording && freed_count < kMaxFreed) {
    freed[freed_count++] = {address, size};
  }
  std::free(address);
}
