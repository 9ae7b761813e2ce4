#include <string>

#include "captured_stderr.h"
#include "driver/current_data.h"
#include "gtest/gtest.h"

TEST(dataset_path_from_link, maps_targets_to_data_set_directories) {
  const struct {
    const char* target;
    const char* directory;
  } cases[] = {
      {"/var/db/timezone/tz/2019c.1.0/zoneinfo",
       "/var/db/timezone/tz/2019c.1.0"},
      {"/var/db/timezone/tz/x/zoneinfo", "/var/db/timezone/tz/x"},
      {"/var/db/timezone/tz/2019c.1.0/zoneinfo/",
       "/var/db/timezone/tz/2019c.1.0/zoneinfo"},
      {"/var/db/timezone/tz/a/b/zoneinfo", "/var/db/timezone/tz/a/b"},
      {"/var/db/timezone/tz/2019c.1.0/anything",
       "/var/db/timezone/tz/2019c.1.0"},
      {"/usr/share/zoneinfo.default", ""},
  };
  for (const auto& c : cases) {
    captured_stderr err;
    EXPECT_EQ(dataset_path_from_link(c.target), c.directory) << c.target;
    EXPECT_EQ(err.text(), "") << c.target;
  }
}

TEST(dataset_path_from_link, bad_targets_warn_and_raise_minus_one) {
  const char* const cases[] = {
      "",
      "/var/db/timezone/tz/2019c.1.0",
      "/var/db/timezone/tz//zoneinfo",
      "/var/db/timezone/tz/",
      "/var/db/timezone/tz",
      "/usr/share/zoneinfo",
      "/usr/share/zoneinfo.default/",
      "/var/db/timezone/zoneinfo",
      "var/db/timezone/tz/2019c.1.0/zoneinfo",
  };
  for (const char* target : cases) {
    captured_stderr err;
    errno = ENOENT;
    int raised = 0;
    try {
      dataset_path_from_link(target);
    } catch (int value) {
      raised = value;
    }
    EXPECT_EQ(raised, -1) << target;
    EXPECT_EQ(err.text(), std::string("kestrel: Bad zoneinfo link ") + target +
                              ": No such file or directory\n");
  }
}
