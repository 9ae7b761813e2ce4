#include "data/tar_header.h"

#include <algorithm>
#include <cstdio>
#include <stdexcept>

namespace {

constexpr std::size_t kName = 0, kNameSize = 100;
constexpr std::size_t kMode = 100, kSize = 124, kMtime = 136, kChecksum = 148;
constexpr std::size_t kType = 156, kLink = 157, kMagic = 257;
constexpr std::size_t kPrefix = 345, kPrefixSize = 155;

void put_text(tar_header::block& b, std::size_t at, std::size_t width,
              const std::string& text) {
  std::copy_n(text.data(), std::min(width, text.size()), b.begin() + at);
}

void put_octal(tar_header::block& b, std::size_t at, std::size_t width,
               std::uint64_t value) {
  char text[32];
  (void)std::snprintf(text, sizeof text, "%0*llo", static_cast<int>(width - 1),
                      static_cast<unsigned long long>(value));
  put_text(b, at, width - 1, text);
}

std::string get_text(const tar_header::block& b, std::size_t at,
                     std::size_t width) {
  const auto begin = b.begin() + at;
  return {begin, std::find(begin, begin + width, '\0')};
}

std::uint64_t get_octal(const tar_header::block& b, std::size_t at,
                        std::size_t width) {
  std::uint64_t value = 0;
  for (std::size_t i = at; i < at + width && b[i] != '\0' && b[i] != ' '; ++i) {
    if (b[i] < '0' || b[i] > '7') {
      throw std::runtime_error("the archive has a bad number in a header");
    }
    value = value * 8 + static_cast<std::uint64_t>(b[i] - '0');
  }
  return value;
}

std::uint64_t checksum(const tar_header::block& b) {
  std::uint64_t sum = 0;
  for (std::size_t i = 0; i < b.size(); ++i) {
    const bool in_field = i >= kChecksum && i < kChecksum + 8;
    sum += in_field ? ' ' : static_cast<unsigned char>(b[i]);
  }
  return sum;
}

}  // namespace

tar_header::block tar_header::make(const std::string& path, char type,
                                   unsigned mode, std::uint64_t size,
                                   const std::string& link_target) {
  block b{};
  std::size_t split = 0;
  if (path.size() > kNameSize) {
    split = path.rfind('/', kPrefixSize);
    if (split == std::string::npos || path.size() - split - 1 > kNameSize) {
      throw std::runtime_error("the path " + path + " is too long for ustar");
    }
    put_text(b, kPrefix, kPrefixSize, path.substr(0, split));
    ++split;
  }
  if (link_target.size() > kNameSize) {
    throw std::runtime_error("the link target of " + path + " is too long");
  }
  put_text(b, kName, kNameSize, path.substr(split));
  put_octal(b, kMode, 8, mode);
  put_octal(b, 108, 8, 0);  // uid
  put_octal(b, 116, 8, 0);  // gid
  put_octal(b, kSize, 12, size);
  put_octal(b, kMtime, 12, 0);
  b[kType] = type;
  put_text(b, kLink, kNameSize, link_target);
  put_text(b, kMagic, 8, std::string("ustar\0" "00", 8));
  put_octal(b, kChecksum, 7, checksum(b));
  b[kChecksum + 7] = ' ';
  return b;
}

tar_header::tar_header(const block& bytes) {
  if (get_text(bytes, kMagic, 6) != "ustar") {
    throw std::runtime_error("the archive is not a ustar archive");
  }
  if (get_octal(bytes, kChecksum, 8) != checksum(bytes)) {
    throw std::runtime_error("the archive has a header with a bad checksum");
  }
  const std::string prefix = get_text(bytes, kPrefix, kPrefixSize);
  path = (prefix.empty() ? "" : prefix + "/") + get_text(bytes, kName, kNameSize);
  type = bytes[kType] == '\0' ? '0' : bytes[kType];
  mode = static_cast<unsigned>(get_octal(bytes, kMode, 8));
  size = get_octal(bytes, kSize, 12);
  link_target = get_text(bytes, kLink, kNameSize);
}

bool tar_header::is_end(const block& bytes) {
  return std::all_of(bytes.begin(), bytes.end(), [](char c) { return c == 0; });
}
