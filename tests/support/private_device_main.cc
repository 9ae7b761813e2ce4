// Test main for tests that work on the device's fixed paths. Before
// GoogleTest starts any thread it moves the process into a private user and
// mount namespace and mounts empty tmpfs file systems over /var and
// /usr/share, so /var/db/timezone, /usr/share/zoneinfo.default and
// /usr/share/icu are the test's own. If any step fails the tests do not run:
// they must never reach the machine's real data.

#include <fcntl.h>
#include <sched.h>
#include <sys/mount.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>

#include "gtest/gtest.h"

namespace {

[[noreturn]] void refuse(const char* what) {
  std::fprintf(stderr,
               "private device: %s: %s\n"
               "These tests need unprivileged user and mount namespaces "
               "(see user_namespaces(7)); they were not run.\n",
               what, std::strerror(errno));
  std::exit(EXIT_FAILURE);
}

void write_proc(const char* file, const std::string& text) {
  const int fd = open(file, O_WRONLY | O_CLOEXEC);
  if (fd < 0 || write(fd, text.data(), text.size()) !=
                    static_cast<ssize_t>(text.size())) {
    refuse(file);
  }
  close(fd);
}

void enter_private_device() {
  const uid_t uid = getuid();
  const gid_t gid = getgid();
  if (unshare(CLONE_NEWUSER | CLONE_NEWNS) != 0) {
    refuse("unshare of the user and mount namespaces");
  }
  write_proc("/proc/self/setgroups", "deny");
  write_proc("/proc/self/uid_map", "0 " + std::to_string(uid) + " 1");
  write_proc("/proc/self/gid_map", "0 " + std::to_string(gid) + " 1");
  if (mount(nullptr, "/", nullptr, MS_REC | MS_PRIVATE, nullptr) != 0) {
    refuse("making the mount tree private");
  }
  for (const char* dir : {"/var", "/usr/share"}) {
    if (mount("device", dir, "tmpfs", 0, "mode=0755") != 0) {
      refuse(dir);
    }
  }
}

}  // namespace

int main(int argc, char** argv) {
  enter_private_device();
  testing::InitGoogleTest(&argc, argv);
  return RUN_ALL_TESTS();
}
