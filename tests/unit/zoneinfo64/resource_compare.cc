#include "resource_compare.h"

#include <stdexcept>
#include <vector>

namespace {

const resource_node& need(const resource_node& node, std::string_view key) {
  const resource_node* found = node.child(key);
  if (found == nullptr)
    throw std::runtime_error("zoneinfo64 without " + std::string(key));
  return *found;
}

std::string joined(const std::vector<std::string>& values) {
  std::string text;
  for (const std::string& value : values)
    text += (text.empty() ? "" : ",") + value;
  return text.size() > 160 ? text.substr(0, 160) + "..." : text;
}

// A zone in words that do not depend on the order of names: an alias by
// its target's name, the links of a zone by their names.
std::map<std::string, std::string> describe(
    const resource_node& zone, const std::vector<std::string>& names) {
  auto name_of = [&](const std::string& index) {
    const size_t i = std::stoul(index);
    return i < names.size() ? names[i] : "#" + index;
  };
  if (zone.label == ":int") return {{"alias of", name_of(zone.values.at(0))}};
  std::map<std::string, std::string> parts;
  for (const resource_node& part : zone.children) {
    const std::string key = part.label.substr(0, part.label.find(':'));
    std::vector<std::string> values = part.values;
    if (key == "links") {
      for (std::string& value : values) value = name_of(value);
    }
    parts[key] = joined(values);
  }
  return parts;
}

}  // namespace

std::map<std::string, int> compare_zoneinfo64(const resource_node& mine,
                                              const resource_node& theirs,
                                              std::FILE* out) {
  std::map<std::string, int> differences = {
      {"Names", 0}, {"Zones", 0}, {"Rules", 0}, {"Regions", 0}};
  const auto& my_names = need(mine, "Names").values;
  const auto& their_names = need(theirs, "Names").values;
  if (my_names != their_names) {
    ++differences["Names"];
    std::fprintf(out, "Names differ: %zu mine, %zu ICU's\n", my_names.size(),
                 their_names.size());
  }
  std::map<std::string, size_t> my_index;
  for (size_t i = 0; i < my_names.size(); ++i) my_index[my_names[i]] = i;
  const auto& my_zones = need(mine, "Zones").children;
  const auto& their_zones = need(theirs, "Zones").children;
  const auto& my_regions = need(mine, "Regions").values;
  const auto& their_regions = need(theirs, "Regions").values;
  for (size_t i = 0; i < their_names.size() && i < their_zones.size(); ++i) {
    const std::string& name = their_names[i];
    const auto found = my_index.find(name);
    if (found == my_index.end() || found->second >= my_zones.size()) {
      ++differences["Zones"];
      std::fprintf(out, "%s: missing from mine\n", name.c_str());
      continue;
    }
    const auto my_parts = describe(my_zones[found->second], my_names);
    const auto their_parts = describe(their_zones[i], their_names);
    if (my_parts != their_parts) {
      ++differences["Zones"];
      for (const auto& [key, value] : their_parts) {
        const auto mine_part = my_parts.find(key);
        const std::string my_value =
            mine_part == my_parts.end() ? "(none)" : mine_part->second;
        if (my_value != value) {
          std::fprintf(out, "%s %s:\n  mine %s\n  ICU  %s\n", name.c_str(),
                       key.c_str(), my_value.c_str(), value.c_str());
        }
      }
      for (const auto& [key, value] : my_parts) {
        if (!their_parts.contains(key))
          std::fprintf(out, "%s %s: only mine\n", name.c_str(), key.c_str());
      }
    }
    if (found->second >= my_regions.size() || i >= their_regions.size() ||
        my_regions[found->second] != their_regions[i]) {
      ++differences["Regions"];
      std::fprintf(out, "%s: region differs\n", name.c_str());
    }
  }
  std::map<std::string, std::string> my_rules, their_rules;
  for (const auto& rule : need(mine, "Rules").children)
    my_rules[rule.label] = joined(rule.values);
  for (const auto& rule : need(theirs, "Rules").children)
    their_rules[rule.label] = joined(rule.values);
  if (my_rules.size() != their_rules.size()) ++differences["Rules"];
  for (const auto& [name, fields] : their_rules) {
    if (my_rules[name] != fields) {
      ++differences["Rules"];
      std::fprintf(out, "rule %s: mine %s, ICU's %s\n", name.c_str(),
                   my_rules[name].c_str(), fields.c_str());
    }
  }
  return differences;
}
