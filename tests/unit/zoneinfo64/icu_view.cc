#include "icu_view.h"

#include <sys/wait.h>
#include <unicode/basictz.h>
#include <unicode/strenum.h>
#include <unicode/timezone.h>
#include <unicode/tztrans.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <memory>
#include <sstream>
#include <stdexcept>

namespace {

constexpr double kFrom = -2208988800000.0;  // 1900-01-01 UT
constexpr double kTo = 4102444800000.0;     // 2100-01-01 UT

// Runs work in a child process that reads ICU's zones from dir, and returns
// what it wrote to its file.
template <typename Work>
std::string in_child(const std::string& dir, Work work) {
  char path[] = "/tmp/zoneinfo64-icu-XXXXXX";
  const int fd = mkstemp(path);
  if (fd < 0) throw std::runtime_error("mkstemp");
  close(fd);
  std::fflush(nullptr);
  const pid_t pid = fork();
  if (pid == 0) {
    setenv("ICU_TIMEZONE_FILES_DIR", dir.c_str(), 1);
    std::ofstream out(path);
    work(out);
    out.close();
    std::_Exit(out ? 0 : 1);
  }
  int status = 0;
  waitpid(pid, &status, 0);
  std::ifstream in(path);
  std::stringstream text;
  text << in.rdbuf();
  unlink(path);
  if (!WIFEXITED(status) || WEXITSTATUS(status) != 0)
    throw std::runtime_error("ICU child failed");
  return text.str();
}

std::string utf8(const icu::UnicodeString& text) {
  std::string out;
  text.toUTF8String(out);
  return out;
}

std::vector<std::string> zone_ids() {
  UErrorCode status = U_ZERO_ERROR;
  std::unique_ptr<icu::StringEnumeration> ids(
      icu::TimeZone::createEnumeration(status));
  std::vector<std::string> names;
  while (const icu::UnicodeString* id = ids->snext(status))
    names.push_back(utf8(*id));
  return names;
}

}  // namespace

icu_view view_icu_zones(const std::string& dir) {
  const std::string text = in_child(dir, [](std::ostream& out) {
    UErrorCode status = U_ZERO_ERROR;
    out << icu::TimeZone::getTZDataVersion(status) << "\n";
    for (const std::string& name : zone_ids()) {
      const icu::UnicodeString id = icu::UnicodeString::fromUTF8(name);
      char region[8] = "";
      status = U_ZERO_ERROR;
      icu::TimeZone::getRegion(id, region, sizeof region, status);
      out << name << " " << (U_SUCCESS(status) ? region : "?") << " ";
      for (int32_t i = 0; i < icu::TimeZone::countEquivalentIDs(id); ++i) {
        out << utf8(icu::TimeZone::getEquivalentID(id, i)) << ",";
      }
      std::unique_ptr<icu::TimeZone> zone(icu::TimeZone::createTimeZone(id));
      const auto* basic = dynamic_cast<const icu::BasicTimeZone*>(zone.get());
      icu::TimeZoneTransition change;
      for (double at = kFrom;
           basic != nullptr && basic->getNextTransition(at, false, change) &&
           change.getTime() < kTo;
           at = change.getTime()) {
        out << " " << static_cast<int64_t>(change.getTime());
      }
      out << "\n";
    }
  });
  icu_view view;
  std::istringstream lines(text);
  std::getline(lines, view.version);
  for (std::string line; std::getline(lines, line);) {
    std::istringstream words(line);
    std::string name;
    icu_zone_view zone;
    words >> name >> zone.region >> zone.equivalents;
    for (int64_t at = 0; words >> at;)
      zone.transitions.push_back(static_cast<double>(at));
    view.zones[name] = zone;
  }
  return view;
}

std::map<std::string, std::vector<icu_offsets>> icu_offsets_at(
    const std::string& dir,
    const std::map<std::string, std::vector<double>>& instants) {
  const std::string text = in_child(dir, [&](std::ostream& out) {
    for (const auto& [name, times] : instants) {
      std::unique_ptr<icu::TimeZone> zone(
          icu::TimeZone::createTimeZone(icu::UnicodeString::fromUTF8(name)));
      out << name;
      for (const double at : times) {
        UErrorCode status = U_ZERO_ERROR;
        int32_t raw = 0, dst = 0;
        zone->getOffset(at, false, raw, dst, status);
        const bool daylight = zone->inDaylightTime(at, status);
        out << " " << raw << " " << dst << " " << (daylight ? 1 : 0);
      }
      out << "\n";
    }
  });
  std::map<std::string, std::vector<icu_offsets>> result;
  std::istringstream lines(text);
  for (std::string line; std::getline(lines, line);) {
    std::istringstream words(line);
    std::string name;
    words >> name;
    auto& list = result[name];
    icu_offsets offsets;
    int daylight = 0;
    while (words >> offsets.raw >> offsets.dst >> daylight) {
      offsets.total = offsets.raw + offsets.dst;
      offsets.in_daylight = daylight != 0;
      list.push_back(offsets);
    }
  }
  return result;
}
