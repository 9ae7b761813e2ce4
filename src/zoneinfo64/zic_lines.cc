#include "zoneinfo64/zic_lines.h"

#include "zoneinfo64/tz_source.h"

zic_lines::zic_lines(std::string_view text) {
  for (size_t end = 0; (end = text.find('\n')) != std::string_view::npos;) {
    lines.push_back(text.substr(0, end));
    text.remove_prefix(end + 1);
  }
  lines.push_back(text);
}

std::vector<std::string_view> zic_lines::fields(size_t line) const {
  return split_fields(lines.at(line - 1));
}

void zic_lines::replace(size_t line, std::string text) {
  replaced[line] = std::move(text);
}

std::string zic_lines::text() const {
  std::string out;
  for (size_t i = 0; i < lines.size(); ++i) {
    const auto found = replaced.find(i + 1);
    out += found != replaced.end() ? found->second : std::string(lines[i]);
    if (i + 1 < lines.size()) out += "\n";
  }
  return out;
}
