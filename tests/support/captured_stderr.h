#ifndef KESTREL_TESTS_CAPTURED_STDERR_H_
#define KESTREL_TESTS_CAPTURED_STDERR_H_

#include <string>

// Sends standard error to a temporary file for as long as it lives, so that a
// test can read back exactly the lines the code under test wrote.
class captured_stderr {
 public:
  captured_stderr();
  ~captured_stderr();
  captured_stderr(const captured_stderr&) = delete;
  captured_stderr& operator=(const captured_stderr&) = delete;

  // Everything written to standard error so far.
  std::string text() const;

 private:
  int saved_fd;
  int file_fd;
};

#endif  // KESTREL_TESTS_CAPTURED_STDERR_H_
