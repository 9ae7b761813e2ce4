#ifndef KESTREL_TESTS_OUTCOME_H_
#define KESTREL_TESTS_OUTCOME_H_

#include <string>

#include "gtest/gtest.h"

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

#endif  // KESTREL_TESTS_OUTCOME_H_
