#include "zoneinfo64/zoneinfo64_writer.h"

#include <algorithm>
#include <cstdint>
#include <set>
#include <stdexcept>

namespace {

void write_ints(std::string& out, const char* key,
                const std::vector<int64_t>& values) {
  if (values.empty()) return;
  out += "    ";
  out += key;
  out += ":intvector { ";
  for (size_t i = 0; i < values.size(); ++i) {
    if (i > 0) out += ", ";
    out += std::to_string(values[i]);
  }
  out += " }\n";
}

void write_zone(std::string& out, const compiled_zone& zone,
                const std::vector<int64_t>& links) {
  std::set<zone_offset> others;
  for (const zone_transition& change : zone.transitions) {
    if (change.offset != zone.initial) others.insert(change.offset);
  }
  if (others.size() > 255)
    throw std::runtime_error("more than 256 offsets in one zone");
  std::vector<zone_offset> types = {zone.initial};
  types.insert(types.end(), others.begin(), others.end());
  std::vector<int64_t> before, within, after, offsets;
  std::string type_map;
  constexpr int64_t kLow32 = INT32_MIN;
  constexpr int64_t kHigh32 = INT32_MAX;
  for (const zone_transition& change : zone.transitions) {
    if (change.at < kLow32 || change.at > kHigh32) {
      auto& pairs = change.at < kLow32 ? before : after;
      pairs.push_back(change.at >> 32);
      pairs.push_back(
          static_cast<int32_t>(static_cast<uint32_t>(change.at & 0xffffffff)));
    } else {
      within.push_back(change.at);
    }
    size_t type = 0;
    while (types[type] != change.offset) ++type;
    static constexpr char kHex[] = "0123456789abcdef";
    type_map += kHex[type >> 4];
    type_map += kHex[type & 15];
  }
  for (const zone_offset& type : types) {
    offsets.push_back(type.raw);
    offsets.push_back(type.dst);
  }
  write_ints(out, "transPre32", before);
  write_ints(out, "trans", within);
  write_ints(out, "transPost32", after);
  write_ints(out, "typeOffsets", offsets);
  if (!type_map.empty()) out += "    typeMap:bin { \"" + type_map + "\" }\n";
  if (zone.final) {
    out += "    finalRule { \"" + zone.final->name + "\" }\n";
    out += "    finalRaw:int { " + std::to_string(zone.final->raw) + " }\n";
    out += "    finalYear:int { " + std::to_string(zone.final->year) + " }\n";
  }
  write_ints(out, "links", links);
}

}  // namespace

std::string write_zoneinfo64(const zoneinfo64_data& data) {
  std::vector<std::vector<int64_t>> links(data.names.size());
  for (size_t i = 0; i < data.names.size(); ++i) {
    if (data.alias_of[i] >= 0)
      links[data.alias_of[i]].push_back(static_cast<int64_t>(i));
  }
  std::string out =
      "// Time-zone data for ICU, made from tz release " + data.version + ".\n";
  out += "zoneinfo64:table(nofallback) {\n TZVersion { \"" + data.version +
         "\" }\n Zones:array {\n";
  for (size_t i = 0; i < data.names.size(); ++i) {
    const std::string tag = "  /* " + data.names[i] + " */ ";
    const std::string number = " //Z#" + std::to_string(i) + "\n";
    if (data.alias_of[i] >= 0) {
      out.append(tag).append(":int { ").append(
          std::to_string(data.alias_of[i]));
      out.append(" }").append(number);
      continue;
    }
    if (!links[i].empty())
      links[i].insert(links[i].begin(), static_cast<int64_t>(i));
    std::sort(links[i].begin(), links[i].end());
    out.append(tag).append(":table {\n");
    write_zone(out, data.zones[i], links[i]);
    out += "  }" + number;
  }
  out += " }\n Names {\n";
  for (const std::string& name : data.names) out += "  \"" + name + "\",\n";
  out += " }\n Rules {\n";
  int rule_number = 0;
  for (const auto& [name, fields] : data.rules) {
    out += "  " + name + ":intvector {\n    ";
    for (size_t i = 0; i < fields.size(); ++i) {
      out += (i > 0 ? ", " : "") + std::to_string(fields[i]);
    }
    out += "\n  } //_#" + std::to_string(rule_number++) + "\n";
  }
  out += " }\n Regions:array {\n";
  for (size_t i = 0; i < data.names.size(); ++i) {
    out += "  \"" + data.regions[i] + "\", //Z#" + std::to_string(i) + " " +
           data.names[i] + "\n";
  }
  out += " }\n}\n";
  return out;
}
