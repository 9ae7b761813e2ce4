#include "data/manifest.h"

#include <openssl/evp.h>

#include <map>
#include <sstream>
#include <stdexcept>

namespace {

bool has_bytes(const set_member& member) {
  return member.type == set_member::kind::file ||
         member.type == set_member::kind::hard_link;
}

}  // namespace

std::string sha256_hex(std::string_view bytes) {
  unsigned char digest[EVP_MAX_MD_SIZE];
  unsigned int length = 0;
  if (EVP_Digest(bytes.data(), bytes.size(), digest, &length, EVP_sha256(),
                 nullptr) != 1) {
    throw std::runtime_error("SHA-256 failed");
  }
  static constexpr char kHex[] = "0123456789abcdef";
  std::string hex;
  for (unsigned int i = 0; i < length; ++i) {
    hex += kHex[digest[i] >> 4U];
    hex += kHex[digest[i] & 15U];
  }
  return hex;
}

std::string make_manifest(const set_image& image) {
  std::string manifest;
  for (const set_member& member : image.members()) {
    if (has_bytes(member)) {
      manifest +=
          sha256_hex(image.bytes_of(member)) + "  " + member.path + "\n";
    }
  }
  return manifest;
}

void check_manifest(const set_image& image, const std::string& manifest) {
  std::map<std::string, std::string> listed;
  std::istringstream lines(manifest);
  std::string line;
  while (std::getline(lines, line)) {
    if (line.size() < 67 || line.compare(64, 2, "  ") != 0 ||
        !listed.emplace(line.substr(66), line.substr(0, 64)).second) {
      throw std::runtime_error("the manifest has a bad line: " + line);
    }
  }
  for (const set_member& member : image.members()) {
    if (!has_bytes(member)) {
      continue;
    }
    const auto sum = listed.find(member.path);
    if (sum == listed.end()) {
      throw std::runtime_error(member.path + " is not in the manifest");
    }
    if (sum->second != sha256_hex(image.bytes_of(member))) {
      throw std::runtime_error(member.path + " does not match its SHA-256 sum");
    }
    listed.erase(sum);
  }
  if (!listed.empty()) {
    throw std::runtime_error(listed.begin()->first +
                             " is in the manifest but not in the archive");
  }
}
