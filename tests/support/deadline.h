#ifndef KESTREL_TESTS_SUPPORT_DEADLINE_H_
#define KESTREL_TESTS_SUPPORT_DEADLINE_H_

// Kills the test, as a failure, if the code under test blocks: SIGALRM ends
// the process ten seconds after the deadline is made, unless it is gone by
// then. For reads of FIFOs and the like, which must never wait.
class deadline {
 public:
  deadline();
  ~deadline();
  deadline(const deadline&) = delete;
  deadline& operator=(const deadline&) = delete;
};

#endif  // KESTREL_TESTS_SUPPORT_DEADLINE_H_
