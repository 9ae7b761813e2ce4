#include "data/tzif_file.h"

#include <array>
#include <cstddef>
#include <fstream>
#include <iterator>
#include <stdexcept>

namespace {

constexpr std::size_t kHeaderSize = 44;
constexpr std::size_t kCountsAt = 20;

// The six counts of a header, in file order.
struct counts {
  std::uint64_t isut, isstd, leap, time, type, chars;
};

std::uint64_t big_endian(std::string_view bytes, std::size_t at,
                         std::size_t width) {
  std::uint64_t value = 0;
  for (std::size_t i = 0; i < width; ++i) {
    value = (value << 8U) | static_cast<unsigned char>(bytes[at + i]);
  }
  return value;
}

void need(std::string_view bytes, std::uint64_t end) {
  if (end > bytes.size()) {
    throw std::runtime_error("TZif data cut short");
  }
}

counts read_header(std::string_view bytes, std::size_t at) {
  need(bytes, at + kHeaderSize);
  if (bytes.substr(at, 4) != "TZif") {
    throw std::runtime_error("not a TZif file");
  }
  std::array<std::uint64_t, 6> c{};
  for (std::size_t i = 0; i < c.size(); ++i) {
    c[i] = big_endian(bytes, at + kCountsAt + 4 * i, 4);
  }
  return {c[0], c[1], c[2], c[3], c[4], c[5]};
}

// The size of a data block whose times are width bytes wide.
std::uint64_t block_size(const counts& c, std::uint64_t width) {
  return c.time * width + c.time + c.type * 6 + c.chars +
         c.leap * (width + 4) + c.isstd + c.isut;
}

}  // namespace

tzif_file parse_tzif(std::string_view bytes) {
  const counts v1 = read_header(bytes, 0);
  if (bytes[4] < '2') {
    throw std::runtime_error("TZif version 1 has no 64-bit data");
  }
  const std::uint64_t second = kHeaderSize + block_size(v1, 4);
  need(bytes, second);
  const counts v2 = read_header(bytes, second);
  const std::uint64_t data = second + kHeaderSize;
  const std::uint64_t footer_at = data + block_size(v2, 8);
  need(bytes, footer_at + 1);

  tzif_file file;
  file.transitions.reserve(v2.time);
  for (std::uint64_t i = 0; i < v2.time; ++i) {
    file.transitions.push_back(
        static_cast<std::int64_t>(big_endian(bytes, data + 8 * i, 8)));
  }
  const std::size_t end = bytes.find('\n', footer_at + 1);
  if (bytes[footer_at] != '\n' || end == std::string_view::npos) {
    throw std::runtime_error("TZif footer missing");
  }
  file.footer = bytes.substr(footer_at + 1, end - footer_at - 1);
  return file;
}

tzif_file read_tzif(const std::string& path) {
  std::ifstream in(path, std::ios::binary);
  if (!in) {
    throw std::runtime_error("cannot read " + path);
  }
  const std::string bytes{std::istreambuf_iterator<char>(in),
                          std::istreambuf_iterator<char>()};
  return parse_tzif(bytes);
}
