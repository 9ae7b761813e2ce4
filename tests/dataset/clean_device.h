#ifndef KESTREL_TESTS_DATASET_CLEAN_DEVICE_H_
#define KESTREL_TESTS_DATASET_CLEAN_DEVICE_H_

#include <string>

#include "gtest/gtest.h"

// Runs only inside the private device of private_device_main. Every test
// starts from an empty /var and /usr/share holding just the directory of the
// links, /var/db/timezone, and builds the data it needs.
class clean_device : public testing::Test {
 protected:
  void SetUp() override;
};

// The line warn() writes for message when errno holds error.
std::string warning(const std::string& message, int error);

// Runs call, which must raise an int, and returns that int.
template <typename Call>
int raised_by(Call call) {
  try {
    call();
  } catch (int error) {
    return error;
  }
  ADD_FAILURE() << "nothing was raised";
  return 0;
}

#endif  // KESTREL_TESTS_DATASET_CLEAN_DEVICE_H_
