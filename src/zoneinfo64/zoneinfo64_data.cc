#include "zoneinfo64/zoneinfo64_data.h"

#include <algorithm>
#include <stdexcept>

#include "zoneinfo64/icu_compat.h"
#include "zoneinfo64/tz_source.h"
#include "zoneinfo64/zone_compiler.h"

namespace {

// zone.tab: country code, coordinates and zone name, tab-separated.
using country_map = std::map<std::string, std::string, std::less<>>;

country_map read_zone_tab(std::string_view text) {
  country_map countries;
  while (!text.empty()) {
    const size_t end = text.find('\n');
    const std::string_view line = text.substr(0, end);
    text.remove_prefix(end == std::string_view::npos ? text.size() : end + 1);
    if (line.empty() || line[0] == '#') continue;
    const size_t first = line.find('\t');
    const size_t second =
        line.find('\t', first == std::string_view::npos ? first : first + 1);
    if (second == std::string_view::npos)
      throw std::runtime_error("zone.tab: short line");
    const std::string_view name =
        line.substr(second + 1, line.find('\t', second + 1) - second - 1);
    countries.emplace(name, line.substr(0, first));
  }
  return countries;
}

// The zone a link leads to through any chain of links.
std::string resolve(const tz_source& source, const std::string& name) {
  std::string target = name;
  for (size_t steps = 0; !source.zones.contains(target); ++steps) {
    const auto link = source.links.find(target);
    if (link == source.links.end())
      throw std::runtime_error("link to unknown zone " + target);
    if (steps > source.links.size())
      throw std::runtime_error("link loop at " + name);
    target = link->second;
  }
  return target;
}

// A name's country: its own in zone.tab; else the one ICU keeps for it;
// else the first in zone.tab along the links it had before link chains
// were cut short; else its zone's; else none, "001".
std::string region_of(const tz_source& source, const country_map& countries,
                      const std::string& name, const std::string& zone) {
  if (const auto listed = countries.find(name); listed != countries.end())
    return listed->second;
  const auto& kept = icu_compat_regions();
  if (const auto found = kept.find(name); found != kept.end())
    return found->second;
  std::string step = name;
  for (size_t steps = 0; steps <= source.former_links.size(); ++steps) {
    const auto former = source.former_links.find(step);
    if (former == source.former_links.end()) break;
    step = former->second;
    if (const auto listed = countries.find(step); listed != countries.end()) {
      return listed->second;
    }
  }
  const auto of_zone = countries.find(zone);
  return of_zone != countries.end() ? of_zone->second : "001";
}

// Refuses a name that ICU's text format could not carry as written: zone
// names are written in strings and comments, rule names and the version as
// resource keys and strings. The tz data's names use only these characters.
void check_name(const std::string& name, std::string_view allowed,
                const char* what) {
  const bool plain =
      !name.empty() && std::all_of(name.begin(), name.end(), [&](char c) {
        return (c >= 'A' && c <= 'Z') || (c >= 'a' && c <= 'z') ||
               (c >= '0' && c <= '9') ||
               allowed.find(c) != std::string_view::npos;
      });
  if (!plain)
    throw std::runtime_error(std::string(what) + " \"" + name +
                             "\" has characters ICU IDs do not use");
}

}  // namespace

zoneinfo64_data build_zoneinfo64(std::string_view zic_text,
                                 std::string_view zone_tab,
                                 const std::string& version) {
  tz_source source = parse_tz_source(zic_text);
  const tz_source compat = parse_tz_source(icu_compat_source());
  // The release's own data wins where a compatibility name is in it again.
  for (const auto& [name, rules] : compat.rules)
    source.rules.try_emplace(name, rules);
  for (const auto& [name, eras] : compat.zones) {
    if (!source.links.contains(name)) source.zones.try_emplace(name, eras);
  }
  // A compatibility ID whose zone the release lacks is left out.
  for (const auto& [name, target] : compat.links) {
    const bool known =
        source.zones.contains(target) || source.links.contains(target);
    if (known && !source.zones.contains(name))
      source.links.try_emplace(name, target);
  }
  const auto countries = read_zone_tab(zone_tab);

  zoneinfo64_data data;
  check_name(version, "._-", "version");
  data.version = version;
  std::map<std::string, int> index;
  for (const auto& entry : source.zones) index.emplace(entry.first, 0);
  for (const auto& entry : source.links) index.emplace(entry.first, 0);
  for (auto& [name, position] : index) {
    check_name(name, "/_+-.", "zone name");
    position = static_cast<int>(data.names.size());
    data.names.push_back(name);
  }
  data.alias_of.assign(data.names.size(), -1);
  data.zones.resize(data.names.size());
  for (size_t i = 0; i < data.names.size(); ++i) {
    const std::string& name = data.names[i];
    const std::string zone = resolve(source, name);
    if (zone != name) data.alias_of[i] = index.at(zone);
    data.regions.push_back(region_of(source, countries, name, zone));
    if (zone != name) continue;
    try {
      data.zones[i] = compile_zone(source, source.zones.at(name));
    } catch (const std::runtime_error& error) {
      throw std::runtime_error("zone " + name + ": " + error.what());
    }
    if (const auto& rule = data.zones[i].final) {
      check_name(rule->name, "_-", "rule name");
      const auto [known, added] = data.rules.emplace(rule->name, rule->fields);
      if (!added && known->second != rule->fields) {
        throw std::runtime_error("rule " + rule->name +
                                 " ends differently in zone " + name);
      }
    }
  }
  return data;
}
