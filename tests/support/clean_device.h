#ifndef KESTREL_TESTS_CLEAN_DEVICE_H_
#define KESTREL_TESTS_CLEAN_DEVICE_H_

#include "gtest/gtest.h"

// Runs only inside the private device of private_device_main. Every test
// starts from an empty /var and /usr/share holding just the directory of the
// links, /var/db/timezone, and builds the data it needs.
class clean_device : public testing::Test {
 protected:
  void SetUp() override;
};

#endif  // KESTREL_TESTS_CLEAN_DEVICE_H_
