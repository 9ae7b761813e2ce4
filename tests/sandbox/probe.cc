// Stands in for kestrel inside the device sandbox: reports what it can see
// on standard error, then ends as its first argument says ("exit N" or
// "signal N").

#include <signal.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>

int main(int argc, char** argv) {
  for (const char* path : {"/var/db/timezone", "/usr/share/zoneinfo.default",
                           "/work", "/proc/self"}) {
    std::fprintf(stderr, "%s %s\n", path,
                 access(path, F_OK) == 0 ? "seen" : "unseen");
  }
  for (int i = 3; i < argc; ++i) {
    std::fprintf(stderr, "argument %s\n", argv[i]);
  }
  if (argc >= 3 && std::strcmp(argv[1], "signal") == 0) {
    raise(std::atoi(argv[2]));
  }
  return argc >= 3 ? std::atoi(argv[2]) : 0;
}
