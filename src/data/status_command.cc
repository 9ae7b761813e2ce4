#include "data/status_command.h"

#include <cstdio>
#include <cstdlib>

#include "data/usage_error.h"

namespace {

std::string json_string(const std::string& text) {
  std::string quoted = "\"";
  for (const char c : text) {
    if (c == '"' || c == '\\') {
      quoted += '\\';
      quoted += c;
    } else if (static_cast<unsigned char>(c) < 0x20) {
      char escaped[8];
      (void)std::snprintf(escaped, sizeof escaped, "\\u%04x", c);
      quoted += escaped;
    } else {
      quoted += c;
    }
  }
  return quoted + "\"";
}

std::string as_json(const device_state& s) {
  std::string out =
      "{\"system\":{\"version\":" + json_string(s.system_version) +
      ",\"icu_schema\":" + json_string(s.system_schema) + "}";
  out += ",\"designated\":{\"path\":" + json_string(s.designated_path) +
         ",\"version\":" + json_string(s.designated_version) + "}";
  out += ",\"tz_latest\":" + json_string(s.latest) + ",\"staged\":[";
  for (std::size_t i = 0; i < s.staged.size(); ++i) {
    const staged_set& set = s.staged[i];
    out +=
        std::string(i == 0 ? "" : ",") + "{\"path\":" + json_string(set.path) +
        ",\"version\":" + json_string(set.version) +
        ",\"icu_schema\":" + json_string(set.schema) +
        ",\"fault\":" + json_string(set.fault) +
        ",\"adopted_at_next_start\":" + (set.adoption.yes ? "true" : "false") +
        ",\"reason\":" + json_string(set.adoption.reason) + "}";
  }
  out += std::string("],\"needs_cleanup\":") +
         (s.cleanup_marker ? "true" : "false");
  out += ",\"last_version_change\":" + json_string(s.version_record) + "}\n";
  return out;
}

std::string as_text(const device_state& s) {
  std::string out = "system partition: " + s.system_version + ", ICU schema " +
                    (s.system_schema.empty() ? "(none)" : s.system_schema) +
                    "\n";
  out += "designated by the links: " + s.designated_version +
         (s.designated_path.empty() ? "" : " (" + s.designated_path + ")") +
         "\n";
  out += "tz_latest: " + (s.latest.empty() ? "(none)" : s.latest) + "\n";
  out += "staged sets: " + std::to_string(s.staged.size()) + "\n";
  for (const staged_set& set : s.staged) {
    out += "  " + set.version + ", ICU schema " +
           (set.schema.empty() ? "(none)" : set.schema) +
           ", adopted at next start: " + (set.adoption.yes ? "yes" : "no") +
           " (" + set.adoption.reason + ")\n";
  }
  out += std::string("clean-up marker: ") +
         (s.cleanup_marker ? "present" : "absent") + "\n";
  out += "last version change: " +
         (s.version_record.empty() ? "(none)" : s.version_record) + "\n";
  return out;
}

}  // namespace

std::string format_status(const device_state& state, bool json) {
  return json ? as_json(state) : as_text(state);
}

int run_status(const std::vector<std::string>& args) {
  const bool json = args.size() == 1 && args[0] == "--json";
  if (args.size() > 1 || (args.size() == 1 && !json)) {
    throw usage_error("status [--json]");
  }
  (void)std::fputs(format_status(device_state::read(), json).c_str(), stdout);
  return EXIT_SUCCESS;
}
