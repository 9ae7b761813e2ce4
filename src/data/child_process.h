#ifndef KESTREL_DATA_CHILD_PROCESS_H_
#define KESTREL_DATA_CHILD_PROCESS_H_

#include <string>
#include <utility>
#include <vector>

// Another program run to its end: zic, tar, make, icupkg, the ICU probe.
struct child_process {
  explicit child_process(std::vector<std::string> argv)
      : argv(std::move(argv)) {}

  std::vector<std::string> argv;
  // Set in the child's environment ("" as a value unsets the variable).
  std::vector<std::pair<std::string, std::string>> environment;
  // The child's working directory; empty keeps ours.
  std::string directory;
  // Given to the child as its standard input.
  std::string input;
  // Whether the child's standard output is kept in output rather than
  // passed on.
  bool capture = false;

  // Runs the program, searched in PATH, and waits for it. Returns its exit
  // status; a program that cannot start or that dies of a signal raises
  // std::runtime_error.
  int run();

  std::string output;
};

#endif  // KESTREL_DATA_CHILD_PROCESS_H_
