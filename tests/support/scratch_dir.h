#ifndef KESTREL_TESTS_SCRATCH_DIR_H_
#define KESTREL_TESTS_SCRATCH_DIR_H_

#include <string>

// A fresh empty directory under /tmp, removed with all it holds at the end.
class scratch_dir {
 public:
  scratch_dir();
  ~scratch_dir();
  scratch_dir(const scratch_dir&) = delete;
  scratch_dir& operator=(const scratch_dir&) = delete;

  // The directory's path joined with name.
  std::string operator/(const std::string& name) const;
  const std::string& path() const { return root; }

 private:
  std::string root;
};

#endif  // KESTREL_TESTS_SCRATCH_DIR_H_
