// The component interface has no virtual destructor, so a component must be
// freed by a delete of its own type. This binary replaces the global sized
// operator delete to see which: a delete of a kal_zoneinfo frees
// sizeof(kal_zoneinfo) bytes after running ~kal_zoneinfo, while a delete
// through the interface would free sizeof(kal_dataset_component).

#include <cstddef>
#include <cstdlib>
#include <memory>
#include <new>
#include <string>
#include <vector>

#include "clean_device.h"
#include "dataset/kal_dataset.h"
#include "dataset/kal_icu.h"
#include "dataset/kal_zoneinfo.h"
#include "gtest/gtest.h"
#include "tree.h"

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

void start_recording() {
  freed_count = 0;
  recording = true;
}

// The sizes with which address was freed since recording started.
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

class kal_dataset_lifetime : public clean_device {
 protected:
  void SetUp() override {
    clean_device::SetUp();
    tree::write_file("/usr/share/zoneinfo.default/+VERSION", "2019c\n");
    tree::write_file(kStaged + "/zoneinfo/+VERSION", "2019c\n");
    tree::write_file(kStaged + "/icutz/icutz57l.dat", "data");
  }

  const std::string kStaged = "/var/db/timezone/tz/2019c.1.0";
};

using sizes = std::vector<std::size_t>;

}  // namespace

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

TEST_F(kal_dataset_lifetime, sizes_tell_the_kinds_apart) {
  ASSERT_NE(sizeof(kal_zoneinfo), sizeof(kal_dataset_component));
  ASSERT_NE(sizeof(kal_icu), sizeof(kal_dataset_component));
}

TEST_F(kal_dataset_lifetime, data_set_frees_each_component_as_its_kind) {
  const void* zoneinfo = nullptr;
  const void* icu = nullptr;
  {
    const kal_dataset data_set(kStaged);
    ASSERT_EQ(data_set.components.size(), 2U);
    zoneinfo = dynamic_cast<const void*>(data_set.components[0].get());
    icu = dynamic_cast<const void*>(data_set.components[1].get());
    start_recording();
  }
  EXPECT_EQ(frees_of(zoneinfo), sizes{sizeof(kal_zoneinfo)});
  EXPECT_EQ(frees_of(icu), sizes{sizeof(kal_icu)});
}

TEST_F(kal_dataset_lifetime, system_data_set_frees_its_components_too) {
  const void* zoneinfo = nullptr;
  const void* icu = nullptr;
  {
    const kal_dataset system;
    zoneinfo = dynamic_cast<const void*>(system.components[0].get());
    icu = dynamic_cast<const void*>(system.components[1].get());
    start_recording();
  }
  EXPECT_EQ(frees_of(zoneinfo), sizes{sizeof(kal_zoneinfo)});
  EXPECT_EQ(frees_of(icu), sizes{sizeof(kal_icu)});
}

TEST_F(kal_dataset_lifetime, last_owner_frees_a_shared_component) {
  std::shared_ptr<kal_dataset_component> kept;
  const void* icu = nullptr;
  {
    const kal_dataset data_set(kStaged);
    kept = data_set.components[1];
    icu = dynamic_cast<const void*>(kept.get());
    start_recording();
  }
  EXPECT_EQ(frees_of(icu), sizes{});
  start_recording();
  kept.reset();
  EXPECT_EQ(frees_of(icu), sizes{sizeof(kal_icu)});
}
