// The component interface has no virtual destructor, so a component must be
// freed by a delete of its own type. This binary replaces the global sized
// operator delete (recording_delete.cc) to see which: a delete of a
// kal_zoneinfo frees sizeof(kal_zoneinfo) bytes after running ~kal_zoneinfo,
// while a delete through the interface would free
// sizeof(kal_dataset_component).

#include <cstddef>
#include <memory>
#include <string>
#include <vector>

#include "clean_device.h"
#include "dataset/kal_dataset.h"
#include "dataset/kal_icu.h"
#include "dataset/kal_zoneinfo.h"
#include "gtest/gtest.h"
#include "recording_delete.h"
#include "tree.h"

namespace {

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
    recording_delete::start();
  }
  EXPECT_EQ(recording_delete::frees_of(zoneinfo), sizes{sizeof(kal_zoneinfo)});
  EXPECT_EQ(recording_delete::frees_of(icu), sizes{sizeof(kal_icu)});
}

TEST_F(kal_dataset_lifetime, system_data_set_frees_its_components_too) {
  const void* zoneinfo = nullptr;
  const void* icu = nullptr;
  {
    const kal_dataset system;
    zoneinfo = dynamic_cast<const void*>(system.components[0].get());
    icu = dynamic_cast<const void*>(system.components[1].get());
    recording_delete::start();
  }
  EXPECT_EQ(recording_delete::frees_of(zoneinfo), sizes{sizeof(kal_zoneinfo)});
  EXPECT_EQ(recording_delete::frees_of(icu), sizes{sizeof(kal_icu)});
}

TEST_F(kal_dataset_lifetime, last_owner_frees_a_shared_component) {
  std::shared_ptr<kal_dataset_component> kept;
  const void* icu = nullptr;
  {
    const kal_dataset data_set(kStaged);
    kept = data_set.components[1];
    icu = dynamic_cast<const void*>(kept.get());
    recording_delete::start();
  }
  EXPECT_EQ(recording_delete::frees_of(icu), sizes{});
  recording_delete::start();
  kept.reset();
  EXPECT_EQ(recording_delete::frees_of(icu), sizes{sizeof(kal_icu)});
}
