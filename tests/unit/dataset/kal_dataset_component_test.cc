#include "dataset/kal_dataset_component.h"

#include <cerrno>
#include <string>
#include <utility>

#include "captured_stderr.h"
#include "clean_device.h"
#include "dataset/kal_dataset.h"
#include "dataset/kal_icu.h"
#include "dataset/kal_zoneinfo.h"
#include "gtest/gtest.h"
#include "outcome.h"
#include "tree.h"

namespace {

class kal_dataset_component_on_device : public clean_device {
 protected:
  void SetUp() override {
    clean_device::SetUp();
    tree::write_file("/usr/share/zoneinfo.default/+VERSION", "2019c\n");
    tree::write_file("/usr/share/icu/icutzformat.txt", "57l\n");
    tree::write_file(kStaged + "/zoneinfo/+VERSION", "2020a\n");
    tree::write_file(kStaged + "/icutz/icutz57l.dat", "data");
  }

  const std::string kStaged = "/var/db/timezone/tz/2020a.1.0";
};

const std::string kMismatch = warning(
    "kal_icu::compatible_schema: could not dynamic_cast other component",
    EAGAIN);

}  // namespace

TEST_F(kal_dataset_component_on_device, zone_files_come_before_icu_data) {
  for (const kal_dataset& data_set : {kal_dataset(), kal_dataset(kStaged)}) {
    ASSERT_EQ(data_set.components.size(), 2U);
    EXPECT_NE(dynamic_cast<kal_zoneinfo*>(data_set.components[0].get()),
              nullptr);
    EXPECT_NE(dynamic_cast<kal_icu*>(data_set.components[1].get()), nullptr);
  }
}

TEST_F(kal_dataset_component_on_device, each_kind_judges_its_own_kind) {
  const kal_dataset staged(kStaged);
  captured_stderr err;
  EXPECT_TRUE(staged.compatible(kal_dataset()));
  EXPECT_EQ(err.text(), "");
}

TEST_F(kal_dataset_component_on_device, components_out_of_place_are_answered) {
  const kal_dataset usual;
  kal_dataset swapped;
  std::swap(swapped.components[0], swapped.components[1]);
  captured_stderr err;
  errno = EAGAIN;
  // The ICU component, asked about zone files, says no at once.
  EXPECT_FALSE(swapped.compatible(usual));
  EXPECT_EQ(err.text(), kMismatch);
  // The zone files accept ICU data; then the ICU component says no.
  EXPECT_FALSE(usual.compatible(swapped));
  EXPECT_EQ(err.text(), kMismatch + kMismatch);
}
