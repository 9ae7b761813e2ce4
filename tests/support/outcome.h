#ifndef KESTREL_TESTS_OUTCOME_H_
#define KESTREL_TESTS_OUTCOME_H_

#include <string>
#include <vector>

#include "gtest/gtest.h"

// The line warn() writes for message when errno holds error.
std::string warning(const std::string& message, int error);

// Whether text is exactly lines, each ended by a newline. As in the scenario
// files, a line ending in ": any" stands for that line ending in the text of
// any errno: the warnings that report no failed call of their own carry
// whatever errno an earlier call left.
testing::AssertionResult same_lines(const std::string& text,
                                    const std::vector<std::string>& lines);

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
