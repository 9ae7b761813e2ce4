#ifndef KESTREL_ZONEINFO64_ZIC_LINES_H_
#define KESTREL_ZONEINFO64_ZIC_LINES_H_

#include <map>
#include <string>
#include <string_view>
#include <vector>

// zic input text line by line, some lines replaced by others, for a rewrite
// that leaves every other line as it was.
class zic_lines {
 public:
  explicit zic_lines(std::string_view text);

  // The fields of a line, counting from 1 (see split_fields).
  std::vector<std::string_view> fields(size_t line) const;

  // Puts text (one or more lines) in place of a line.
  void replace(size_t line, std::string text);

  // The text with its replaced lines.
  std::string text() const;

 private:
  std::vector<std::string_view> lines;
  std::map<size_t, std::string> replaced;
};

#endif  // KESTREL_ZONEINFO64_ZIC_LINES_H_
