#ifndef KESTREL_ICUPROBE_ZONE_COMPARISON_H_
#define KESTREL_ICUPROBE_ZONE_COMPARISON_H_

#include <cstdint>
#include <string>

// ICU against the C library for one zone name, at every instant that
// check_instants() picks from the name's compiled zone file under zoneinfo.
// The process's TZDIR must already name zoneinfo.
struct zone_comparison {
  zone_comparison(const std::string& name, const std::string& zoneinfo);

  std::int64_t instants = 0;
  std::int64_t disagreements = 0;
  // The first disagreement, for the report; empty when there is none.
  std::string first;
};

#endif  // KESTREL_ICUPROBE_ZONE_COMPARISON_H_
