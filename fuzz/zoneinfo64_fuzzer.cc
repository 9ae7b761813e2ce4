// The converter from tz source to ICU's zoneinfo64 over any text: it either
// refuses the text with a message or writes a resource whose every string
// is closed and whose braces balance, that is, text genrb can read as the
// converter meant it.

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <stdexcept>
#include <string>
#include <string_view>

#include "zoneinfo64/zoneinfo64_data.h"
#include "zoneinfo64/zoneinfo64_writer.h"

namespace {

void check(bool holds) {
  if (!holds) {
    std::abort();
  }
}

// Strings closed on their line, comments closed, and braces balanced
// outside both.
void check_resource_text(std::string_view text) {
  int depth = 0;
  for (size_t i = 0; i < text.size(); ++i) {
    if (text[i] == '"') {
      const size_t close = text.find('"', i + 1);
      check(close != std::string_view::npos);
      check(text.substr(i, close - i).find('\n') == std::string_view::npos);
      i = close;
    } else if (text.substr(i, 2) == "/*") {
      const size_t close = text.find("*/", i + 2);
      check(close != std::string_view::npos);
      i = close + 1;
    } else if (text.substr(i, 2) == "//") {
      i = text.find('\n', i);
      check(i != std::string_view::npos);
    } else if (text[i] == '{') {
      ++depth;
    } else if (text[i] == '}') {
      check(--depth >= 0);
    }
  }
  check(depth == 0);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  const std::string_view input(reinterpret_cast<const char*>(data), size);
  // The release's zic input, then after a form feed line its zone.tab.
  const size_t split = input.find("\n\f\n");
  const std::string_view source = input.substr(0, split);
  const std::string_view zone_tab = split == std::string_view::npos
                                        ? std::string_view()
                                        : input.substr(split + 3);
  std::string text;
  try {
    text = write_zoneinfo64(build_zoneinfo64(source, zone_tab, "2099z"));
  } catch (const std::runtime_error& error) {
    check(std::string_view(error.what()).size() > 0);
    return 0;
  }
  check(text.starts_with("// Time-zone data for ICU"));
  check_resource_text(text);
  return 0;
}
