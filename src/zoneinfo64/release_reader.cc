#include "zoneinfo64/release_reader.h"

#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <cstring>
#include <fstream>
#include <sstream>
#include <stdexcept>
#include <vector>

#include "zoneinfo64/negative_saves.h"

extern char** environ;

namespace {

// The data files in the order of the Makefile's TDATA: the primary data,
// etcetera, factory, then backward.
constexpr std::array<const char*, 10> kDataFiles = {
    "africa",       "antarctica",   "asia",     "australasia", "europe",
    "northamerica", "southamerica", "etcetera", "factory",     "backward"};

bool readable(const std::string& path) {
  return access(path.c_str(), R_OK) == 0;
}

std::string read_file(const std::string& path) {
  std::ifstream in(path, std::ios::binary);
  if (!in)
    throw std::runtime_error("cannot read " + path + ": " +
                             std::strerror(errno));
  std::ostringstream text;
  text << in.rdbuf();
  return text.str();
}

std::string first_word(const std::string& text) {
  const size_t start = text.find_first_not_of(" \t\n");
  if (start == std::string::npos) return "";
  return text.substr(start, text.find_first_of(" \t\n", start) - start);
}

// awk -v DATAFORM=rearguard -f ziguard.awk FILES..., in dir, its output.
std::string run_ziguard(const std::string& dir) {
  std::vector<std::string> words = {"awk", "-v", "DATAFORM=rearguard", "-f",
                                    dir + "/ziguard.awk"};
  for (const char* file : kDataFiles) words.push_back(dir + "/" + file);
  std::vector<char*> argv;
  argv.reserve(words.size() + 1);
  for (std::string& word : words) argv.push_back(word.data());
  argv.push_back(nullptr);
  std::array<int, 2> pipe_ends{};
  if (pipe(pipe_ends.data()) != 0)
    throw std::runtime_error("pipe: " + std::string(std::strerror(errno)));
  posix_spawn_file_actions_t actions;
  posix_spawn_file_actions_init(&actions);
  posix_spawn_file_actions_adddup2(&actions, pipe_ends[1], STDOUT_FILENO);
  posix_spawn_file_actions_addclose(&actions, pipe_ends[0]);
  pid_t pid = 0;
  const int spawned =
      posix_spawnp(&pid, "awk", &actions, nullptr, argv.data(), environ);
  posix_spawn_file_actions_destroy(&actions);
  close(pipe_ends[1]);
  std::string text;
  if (spawned == 0) {
    std::array<char, 65536> buffer{};
    ssize_t got = 0;
    while ((got = read(pipe_ends[0], buffer.data(), buffer.size())) > 0 ||
           (got < 0 && errno == EINTR)) {
      if (got > 0) text.append(buffer.data(), static_cast<size_t>(got));
    }
  }
  close(pipe_ends[0]);
  if (spawned != 0)
    throw std::runtime_error("cannot run awk: " +
                             std::string(std::strerror(spawned)));
  int status = 0;
  while (waitpid(pid, &status, 0) < 0 && errno == EINTR) {
  }
  if (!WIFEXITED(status) || WEXITSTATUS(status) != 0) {
    throw std::runtime_error("awk -f " + dir + "/ziguard.awk failed");
  }
  return text;
}

}  // namespace

release_text read_release(const std::string& dir) {
  release_text release;
  release.zone_tab = read_file(dir + "/zone.tab");
  if (readable(dir + "/ziguard.awk")) {
    release.zic_text = run_ziguard(dir);
  } else if (readable(dir + "/tzdata.zi")) {
    release.zic_text = fold_negative_saves(read_file(dir + "/tzdata.zi"));
  } else {
    throw std::runtime_error(
        dir + " holds neither ziguard.awk with the data files nor tzdata.zi");
  }
  if (readable(dir + "/version")) {
    release.version = first_word(read_file(dir + "/version"));
  } else if (release.zic_text.starts_with("# version ")) {
    release.version =
        first_word(release.zic_text.substr(std::strlen("# version ")));
  }
  if (release.version.empty())
    throw std::runtime_error("no release version in " + dir);
  // The text is the release's tzdata.zi, which names its version first.
  if (!release.zic_text.starts_with("# version ")) {
    release.zic_text = "# version " + release.version + "\n" + release.zic_text;
  }
  return release;
}
