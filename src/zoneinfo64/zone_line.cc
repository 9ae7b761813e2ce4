#include "zoneinfo64/zone_line.h"

#include <cstdlib>

std::string zone_line::text(const std::string& stdoff, const std::string& rules,
                            const std::string& format,
                            const std::string& until) {
  std::string line = lead + "\t" + stdoff + "\t" + rules + "\t" + format;
  lead = "\t\t";
  return until.empty() ? line + "\n" : line + "\t" + until + "\n";
}

std::string zone_line::until(int delta) const {
  std::string text;
  for (size_t i = first + 3; i < fields.size(); ++i) {
    if (!text.empty()) text += " ";
    text += i == first + 6 ? moved_time(fields[i], era.until, delta)
                           : std::string(fields[i]);
  }
  return text;
}

std::string zic_hms(int seconds) {
  std::string text = seconds < 0 ? "-" : "";
  seconds = std::abs(seconds);
  text += std::to_string(seconds / 3600);
  const int minutes = seconds / 60 % 60;
  const int rest = seconds % 60;
  if (minutes != 0 || rest != 0) {
    text += (minutes < 10 ? ":0" : ":") + std::to_string(minutes);
  }
  if (rest != 0) text += (rest < 10 ? ":0" : ":") + std::to_string(rest);
  return text;
}

std::string moved_time(std::string_view field, const tz_day_time& when,
                       int delta) {
  if (when.clock != tz_clock::standard || delta == 0) return std::string(field);
  return zic_hms(when.seconds + delta) + "s";
}

std::string swapped_format(std::string_view format) {
  const size_t slash = format.find('/');
  if (slash == std::string_view::npos) return std::string(format);
  return std::string(format.substr(slash + 1)) + "/" +
         std::string(format.substr(0, slash));
}

std::string standard_format(const std::string& format,
                            const std::string& letters) {
  const size_t slash = format.find('/');
  if (slash != std::string::npos) return format.substr(0, slash);
  const size_t s = format.find("%s");
  if (s == std::string::npos) return format;
  return format.substr(0, s) + letters + format.substr(s + 2);
}
