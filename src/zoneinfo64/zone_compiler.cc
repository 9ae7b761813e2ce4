#include "zoneinfo64/zone_compiler.h"

#include <algorithm>
#include <climits>
#include <stdexcept>

#include "zoneinfo64/final_rule.h"

namespace {

// Rule evaluations allowed for one zone: far above what any release needs,
// and a bound on the time any input can take.
constexpr int64_t kWorkLimit = 20'000'000;

const std::vector<tz_rule>& rules_named(const tz_source& source,
                                        const std::string& name) {
  const auto found = source.rules.find(name);
  if (found == source.rules.end())
    throw std::runtime_error("no rule set named " + name);
  return found->second;
}

// The raw offset and saving under a line of standard offset stdoff with
// the given saving. ICU has no negative saving: the main form's are folded
// away before the text gets here (fold_negative_saves).
zone_offset split(int stdoff, int save) {
  if (save < 0) {
    throw std::runtime_error("a negative saving, " + std::to_string(save) +
                             " s, which ICU cannot hold");
  }
  return {stdoff, save};
}

// Seconds to subtract from a local time read on the given clock.
int64_t clock_offset(tz_clock clock, int stdoff, int save) {
  if (clock == tz_clock::universal) return 0;
  return clock == tz_clock::standard ? stdoff : stdoff + save;
}

// zic's clean-up of the sorted transitions: one that does not move local
// time past the local time of the one before replaces it; and, as ICU keeps
// only raw offset and saving, one that changes neither is dropped.
std::vector<zone_transition> tidy(zone_offset initial,
                                  std::vector<zone_transition> list) {
  std::stable_sort(list.begin(), list.end(),
                   [](const auto& a, const auto& b) { return a.at < b.at; });
  std::vector<zone_transition> kept;
  for (const zone_transition& next : list) {
    if (!kept.empty()) {
      const zone_offset before =
          kept.size() == 1 ? initial : kept[kept.size() - 2].offset;
      const zone_offset& last = kept.back().offset;
      if (next.at + last.raw + last.dst <=
          kept.back().at + before.raw + before.dst) {
        kept.back().offset = next.offset;
        if (kept.back().offset == before) kept.pop_back();
        continue;
      }
    }
    if (next.offset != (kept.empty() ? initial : kept.back().offset))
      kept.push_back(next);
  }
  return kept;
}

}  // namespace

compiled_zone compile_zone(const tz_source& source,
                           const std::vector<tz_era>& eras) {
  compiled_zone zone;
  std::vector<zone_transition> list;
  int save = 0;
  int64_t start_time = 0;
  int64_t work = 0;
  for (size_t i = 0; i < eras.size(); ++i) {
    const tz_era& era = eras[i];
    bool use_start = i > 0;
    const bool use_until = i + 1 < eras.size();
    const int stdoff = era.stdoff;
    if (era.rules.empty()) {
      save = era.save;
      const zone_offset offset = split(stdoff, save);
      if (use_start) {
        list.push_back({start_time, offset});
      } else {
        zone.initial = offset;
      }
    } else {
      const std::vector<tz_rule>& rules = rules_named(source, era.rules);
      // zic reads a line's rule times with the saving of the line's own
      // rules, none before their first transition: what an earlier line
      // left does not carry over (China's first daylight saving under the
      // PRC rules, 1986 May 4 2:00, follows Shanghai's summer of 1949 and
      // is 18:00 UT).
      save = 0;
      int first_year = INT_MAX;
      int last_year = INT_MIN;
      for (const tz_rule& rule : rules) {
        first_year = std::min(first_year, rule.from);
        last_year = std::max(last_year, rule.to_max ? rule.from + 1 : rule.to);
      }
      if (use_until) {
        last_year = era.until_year;
      } else {
        zone.final = find_final_rule(
            era, rules, use_start ? std::optional(start_time) : std::nullopt);
        if (zone.final) last_year = zone.final->year - 1;
      }
      if (!use_start) {
        zone.initial = split(stdoff, 0);
      }
      int start_save = 0;
      std::vector<bool> done(rules.size());
      for (int year = first_year; year <= last_year; ++year) {
        work += static_cast<int64_t>(rules.size());
        if (work > kWorkLimit)
          throw std::runtime_error("rule set " + era.rules + " too large");
        for (size_t j = 0; j < rules.size(); ++j) {
          done[j] =
              year < rules[j].from || (!rules[j].to_max && year > rules[j].to);
        }
        for (;;) {
          int64_t change = 0;
          size_t earliest = rules.size();
          for (size_t j = 0; j < rules.size(); ++j) {
            if (done[j]) continue;
            const int64_t at = local_seconds(year, rules[j].at) -
                               clock_offset(rules[j].at.clock, stdoff, save);
            if (earliest == rules.size() || at < change) {
              earliest = j;
              change = at;
            }
          }
          if (earliest == rules.size()) break;
          done[earliest] = true;
          if (use_until &&
              change >= local_seconds(era.until_year, era.until) -
                            clock_offset(era.until.clock, stdoff, save)) {
            break;
          }
          save = rules[earliest].save;
          if (use_start && change == start_time) use_start = false;
          if (use_start && change < start_time) {
            start_save = save;
            continue;
          }
          list.push_back({change, split(stdoff, save)});
        }
      }
      if (use_start) {
        list.push_back({start_time, split(stdoff, start_save)});
      }
    }
    if (use_until) {
      start_time = local_seconds(era.until_year, era.until) -
                   clock_offset(era.until.clock, stdoff, save);
    }
  }
  zone.transitions = tidy(zone.initial, std::move(list));
  return zone;
}
