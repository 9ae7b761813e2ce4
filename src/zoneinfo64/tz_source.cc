#include "zoneinfo64/tz_source.h"

#include <array>
#include <stdexcept>

#include "zoneinfo64/tz_words.h"

namespace {

constexpr std::array<std::string_view, 3> kLineKinds = {"Rule", "Zone", "Link"};
constexpr std::array<std::string_view, 3> kRangeWords = {"minimum", "maximum",
                                                         "only"};

}  // namespace

std::vector<std::string_view> split_fields(std::string_view line) {
  std::vector<std::string_view> fields;
  size_t i = 0;
  while (i < line.size()) {
    while (i < line.size() &&
           (line[i] == ' ' || line[i] == '\t' || line[i] == '\r' ||
            line[i] == '\f' || line[i] == '\v')) {
      ++i;
    }
    if (i == line.size() || line[i] == '#') break;
    const size_t start = i;
    if (line[i] == '"') {
      const size_t close = line.find('"', i + 1);
      if (close == std::string_view::npos)
        throw std::runtime_error("unterminated quoted field");
      fields.push_back(line.substr(i + 1, close - i - 1));
      i = close + 1;
      continue;
    }
    while (i < line.size() && line[i] != ' ' && line[i] != '\t' &&
           line[i] != '\r' && line[i] != '#') {
      ++i;
    }
    fields.push_back(line.substr(start, i - start));
  }
  return fields;
}

namespace {

template <typename T>
T need(std::optional<T> value, const char* what, std::string_view field) {
  if (!value)
    throw std::runtime_error(std::string("bad ") + what + " \"" +
                             std::string(field) + "\"");
  return *value;
}

tz_rule read_rule(const std::vector<std::string_view>& f) {
  if (f.size() != 10) throw std::runtime_error("a Rule line has 10 fields");
  tz_rule rule;
  const auto from_word = match_word(f[2], kRangeWords);
  if (from_word && *from_word == 0) {
    throw std::runtime_error("a rule from \"minimum\" has no first year");
  }
  rule.from = need(parse_year(f[2]), "FROM year", f[2]);
  const auto to_word = match_word(f[3], kRangeWords);
  if (to_word && *to_word == 2) {
    rule.to = rule.from;
  } else if (to_word && *to_word == 1) {
    rule.to = rule.from;
    rule.to_max = true;
  } else {
    rule.to = need(parse_year(f[3]), "TO year", f[3]);
  }
  if (rule.to < rule.from) throw std::runtime_error("TO year before FROM year");
  if (f[4] != "-" && !f[4].empty())
    throw std::runtime_error("rule types are not supported");
  const int month = need(match_month(f[5]), "month", f[5]);
  rule.at = need(parse_at(f[7], need(parse_on(f[6], month), "day", f[6])),
                 "time", f[7]);
  std::string_view save = f[8];
  if (!save.empty() && (save.back() == 's' || save.back() == 'd'))
    save.remove_suffix(1);
  rule.save = need(parse_hms(save), "SAVE", f[8]);
  return rule;
}

// The fields of a zone line from STDOFF on.
tz_era read_era(const std::vector<std::string_view>& f, size_t first) {
  if (f.size() < first + 3 || f.size() > first + 7) {
    throw std::runtime_error("a zone line has STDOFF RULES FORMAT [UNTIL]");
  }
  tz_era era;
  era.stdoff = need(parse_hms(f[first]), "STDOFF", f[first]);
  const std::string_view rules = f[first + 1];
  if (rules != "-") {
    if (rules[0] == '-' || (rules[0] >= '0' && rules[0] <= '9')) {
      std::string_view save = rules;
      if (save.back() == 's' || save.back() == 'd') save.remove_suffix(1);
      era.save = need(parse_hms(save), "saving", rules);
    } else {
      era.rules = std::string(rules);
    }
  }
  if (f.size() == first + 3) return era;
  era.has_until = true;
  era.until_year = need(parse_year(f[first + 3]), "UNTIL year", f[first + 3]);
  int month = 1;
  if (f.size() > first + 4)
    month = need(match_month(f[first + 4]), "month", f[first + 4]);
  tz_day_time day;
  day.month = month;
  if (f.size() > first + 5)
    day = need(parse_on(f[first + 5], month), "day", f[first + 5]);
  if (f.size() > first + 6)
    day = need(parse_at(f[first + 6], day), "time", f[first + 6]);
  era.until = day;
  return era;
}

}  // namespace

tz_source parse_tz_source(std::string_view text) {
  tz_source source;
  std::vector<tz_era>* open_zone = nullptr;  // the zone whose lines continue
  size_t line_number = 0;
  while (!text.empty()) {
    const size_t end = text.find('\n');
    const std::string_view line = text.substr(0, end);
    text.remove_prefix(end == std::string_view::npos ? text.size() : end + 1);
    ++line_number;
    try {
      const auto fields = split_fields(line);
      if (fields.empty()) continue;
      if (open_zone != nullptr) {
        open_zone->push_back(read_era(fields, 0));
        open_zone->back().line = line_number;
      } else {
        const auto kind = match_word(fields[0], kLineKinds);
        if (!kind)
          throw std::runtime_error("unknown line \"" + std::string(fields[0]) +
                                   "\"");
        if (*kind == 0) {
          tz_rule rule = read_rule(fields);
          rule.line = line_number;
          source.rules[std::string(fields[1])].push_back(rule);
        } else if (*kind == 1) {
          if (fields.size() < 2)
            throw std::runtime_error("a Zone line has a name");
          auto [zone, added] = source.zones.try_emplace(std::string(fields[1]));
          if (!added)
            throw std::runtime_error("zone " + zone->first + " defined twice");
          open_zone = &zone->second;
          open_zone->push_back(read_era(fields, 2));
          open_zone->back().line = line_number;
        } else {
          if (fields.size() != 3)
            throw std::runtime_error("a Link line has 3 fields");
          source.links[std::string(fields[2])] = std::string(fields[1]);
          const size_t former = line.find("#=");
          if (former != std::string_view::npos) {
            const auto words = split_fields(line.substr(former + 2));
            if (!words.empty())
              source.former_links[std::string(fields[2])] =
                  std::string(words[0]);
          }
        }
      }
      if (open_zone != nullptr && !open_zone->back().has_until)
        open_zone = nullptr;
    } catch (const std::runtime_error& error) {
      throw std::runtime_error("line " + std::to_string(line_number) + ": " +
                               error.what());
    }
  }
  if (open_zone != nullptr)
    throw std::runtime_error("the last zone has no line without UNTIL");
  return source;
}
