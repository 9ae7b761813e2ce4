#include "zoneinfo64/negative_saves.h"

#include <algorithm>
#include <climits>
#include <cstdint>
#include <map>
#include <set>
#include <stdexcept>
#include <vector>

#include "zoneinfo64/tz_source.h"
#include "zoneinfo64/zic_lines.h"
#include "zoneinfo64/zone_line.h"

namespace {

// A rule's transition in one year. Its instant is taken on the line's
// standard time: close enough to order transitions months apart.
struct occurrence {
  int64_t at;
  const tz_rule* rule;
  int year;
};

int64_t instant(int year, const tz_day_time& when, int stdoff) {
  return local_seconds(year, when) -
         (when.clock == tz_clock::universal ? 0 : stdoff);
}

// The date of a rule's transition as a zone line's UNTIL.
std::string until_of(const zic_lines& lines, const occurrence& o, int delta) {
  const auto f = lines.fields(o.rule->line);
  return std::to_string(o.year) + " " + std::string(f[5]) + " " +
         std::string(f[6]) + " " + moved_time(f[7], o.rule->at, delta);
}

// The transitions of rules under a line, from their first to the line's
// end.
std::vector<occurrence> occurrences(const std::vector<tz_rule>& rules,
                                    const tz_era& era, int64_t end) {
  int from = INT_MAX;
  int to = INT_MIN;
  for (const tz_rule& rule : rules) {
    from = std::min(from, rule.from);
    to = std::max(to, rule.to_max ? rule.from : rule.to);
  }
  if (era.has_until) to = std::min(to, era.until_year);
  std::vector<occurrence> list;
  for (int year = from; year <= to; ++year) {
    for (const tz_rule& rule : rules) {
      if (year < rule.from || (!rule.to_max && year > rule.to)) continue;
      const int64_t at = instant(year, rule.at, era.stdoff);
      if (at < end) list.push_back({at, &rule, year});
    }
  }
  std::stable_sort(list.begin(), list.end(),
                   [](const auto& a, const auto& b) { return a.at < b.at; });
  return list;
}

// The lines in place of a line that follows rules with negative savings, or
// nothing when none falls within it; adds the copy of the rules it follows
// to raised.
std::string fold_rules_line(const tz_source& source, const zic_lines& lines,
                            zone_line line,
                            std::map<std::string, std::set<int>>& raised) {
  const auto found = source.rules.find(line.era.rules);
  if (found == source.rules.end()) return "";
  const auto list = occurrences(found->second, line.era, line.end);
  const auto negative = [](const occurrence& o) { return o.rule->save < 0; };
  const auto begin = std::partition_point(
      list.begin(), list.end(),
      [&](const occurrence& o) { return o.at < line.start; });
  // Under rules already running when the line starts, a zero saving among
  // negative ones is daylight time from the start (Morocco from 2018);
  // before a rule set's first transition the line's standard offset is
  // standard time (Ireland 1968-1971, Namibia 1990-1994).
  const bool running = begin != list.begin();
  const auto first =
      running ? std::prev(begin) : std::find_if(begin, list.end(), negative);
  if (std::find_if(first, list.end(), negative) == list.end()) return "";
  auto after = std::find_if(list.rbegin(), list.rend(), negative).base();
  const bool endless =
      std::any_of(found->second.begin(), found->second.end(),
                  [](const tz_rule& r) { return r.save < 0 && r.to_max; });
  if (endless && !line.era.has_until) after = list.end();
  int low = 0;
  for (auto o = first; o != after; ++o) low = std::min(low, o->rule->save);
  const bool slashed = line.format().find('/') != std::string::npos;
  for (auto o = first; o != after; ++o) {
    if (slashed && o->rule->save != low && o->rule->save != 0) {
      throw std::runtime_error("zone line " + std::to_string(line.era.line) +
                               ": a STD/DST abbreviation with three savings");
    }
  }
  raised[line.era.rules].insert(-low);
  std::string out;
  if (!running) {
    // Before the rules' first transition the line has no saving, and zic
    // finds no abbreviation in rules none of which comes within the line:
    // a fixed line, named as zic names the line's time before its rules,
    // from the first rule with no saving.
    const auto zero = std::find_if(first, list.end(), [](const occurrence& o) {
      return o.rule->save == 0;
    });
    std::string letters;
    if (zero != list.end()) {
      letters = std::string(lines.fields(zero->rule->line)[9]);
      if (letters == "-") letters.clear();
    }
    out +=
        line.text(line.stdoff(), "-", standard_format(line.format(), letters),
                  until_of(lines, *first, 0));
  }
  out += line.text(
      zic_hms(line.era.stdoff + low), line.rules() + "_" + std::to_string(-low),
      swapped_format(line.format()),
      after == list.end() ? line.until(low) : until_of(lines, *after, low));
  if (after != list.end()) {
    out += line.text(line.stdoff(), line.rules(), line.format(), line.until(0));
  }
  return out;
}

// The copy of a rule set with every saving raised by raise seconds.
std::string raised_rules(const std::string& name,
                         const std::vector<tz_rule>& rules,
                         const zic_lines& lines, int raise) {
  std::string out;
  for (const tz_rule& rule : rules) {
    const auto f = lines.fields(rule.line);
    const std::string letters = f[9].empty() ? "-" : std::string(f[9]);
    const std::vector<std::string> words = {"Rule",
                                            name + "_" + std::to_string(raise),
                                            std::string(f[2]),
                                            std::string(f[3]),
                                            "-",
                                            std::string(f[5]),
                                            std::string(f[6]),
                                            moved_time(f[7], rule.at, -raise),
                                            zic_hms(rule.save + raise),
                                            letters};
    for (size_t i = 0; i < words.size(); ++i) {
      out += words[i];
      out += i + 1 < words.size() ? "\t" : "\n";
    }
  }
  return out;
}

}  // namespace

std::string fold_negative_saves(std::string_view text) {
  const tz_source source = parse_tz_source(text);
  zic_lines lines(text);
  std::map<std::string, std::set<int>> raised;
  for (const auto& [name, eras] : source.zones) {
    int64_t start = INT64_MIN;
    for (size_t i = 0; i < eras.size(); ++i) {
      const tz_era& era = eras[i];
      const int64_t end = era.has_until
                              ? instant(era.until_year, era.until, era.stdoff)
                              : INT64_MAX;
      zone_line line{era,
                     lines.fields(era.line),
                     i == 0 ? 2U : 0U,
                     i == 0 ? "Zone\t" + name : "\t\t",
                     start,
                     end};
      std::string folded;
      if (era.rules.empty() && era.save < 0) {
        folded = line.text(zic_hms(era.stdoff + era.save), "-", line.format(),
                           line.until(era.save));
      } else if (!era.rules.empty()) {
        folded = fold_rules_line(source, lines, line, raised);
      }
      if (!folded.empty()) {
        folded.pop_back();
        lines.replace(era.line, folded);
      }
      start = end;
    }
  }
  std::string out = lines.text();
  for (const auto& [name, raises] : raised) {
    if (!out.empty() && out.back() != '\n') out += "\n";
    for (const int raise : raises) {
      out += raised_rules(name, source.rules.at(name), lines, raise);
    }
  }
  return out;
}
