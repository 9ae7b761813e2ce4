#include "data/child_process.h"

#include <fcntl.h>
#include <sys/mman.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <stdexcept>

namespace {

[[noreturn]] void fail(const std::string& what) {
  throw std::runtime_error(what + ": " + std::strerror(errno));
}

// The input, in an anonymous file the child reads from its start.
int input_file(const std::string& input) {
  const int fd = memfd_create("kestrel-data-input", MFD_CLOEXEC);
  if (fd < 0 ||
      write(fd, input.data(), input.size()) !=
          static_cast<ssize_t>(input.size()) ||
      lseek(fd, 0, SEEK_SET) != 0) {
    fail("child input");
  }
  return fd;
}

// In the child: only async-signal-safe calls and exec.
[[noreturn]] void exec_child(const child_process& child, int in, int out) {
  if ((in >= 0 && dup2(in, STDIN_FILENO) < 0) ||
      (out >= 0 && dup2(out, STDOUT_FILENO) < 0) ||
      (!child.directory.empty() && chdir(child.directory.c_str()) != 0)) {
    _exit(127);
  }
  std::vector<char*> args;
  for (const std::string& arg : child.argv) {
    args.push_back(const_cast<char*>(arg.c_str()));
  }
  args.push_back(nullptr);
  execvp(args[0], args.data());
  _exit(127);
}

}  // namespace

int child_process::run() {
  const int in = input.empty() ? -1 : input_file(input);
  int pipe_fds[2] = {-1, -1};
  if (capture && pipe2(pipe_fds, O_CLOEXEC) != 0) {
    fail("pipe");
  }
  // The environment is changed in the child only, before exec.
  const pid_t pid = fork();
  if (pid < 0) {
    fail("fork");
  }
  if (pid == 0) {
    for (const auto& [name, value] : environment) {
      (void)(value.empty() ? unsetenv(name.c_str())
                           : setenv(name.c_str(), value.c_str(), 1));
    }
    exec_child(*this, in, pipe_fds[1]);
  }
  if (in >= 0) {
    (void)close(in);
  }
  output.clear();
  if (capture) {
    (void)close(pipe_fds[1]);
    char buffer[65536];
    ssize_t got = 0;
    while ((got = read(pipe_fds[0], buffer, sizeof buffer)) > 0 ||
           (got < 0 && errno == EINTR)) {
      output.append(buffer, got > 0 ? static_cast<std::size_t>(got) : 0);
    }
    (void)close(pipe_fds[0]);
  }
  int status = 0;
  while (waitpid(pid, &status, 0) < 0) {
    if (errno != EINTR) {
      fail("waitpid");
    }
  }
  if (!WIFEXITED(status)) {
    throw std::runtime_error(argv[0] + " died of signal " +
                             std::to_string(WTERMSIG(status)));
  }
  if (WEXITSTATUS(status) == 127) {
    throw std::runtime_error("cannot run " + argv[0]);
  }
  return WEXITSTATUS(status);
}
