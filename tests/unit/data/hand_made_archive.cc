#include "hand_made_archive.h"

#include <zlib.h>

#include <stdexcept>

#include "data/manifest.h"
#include "data/tar_header.h"

std::string tar_bytes(const std::vector<raw_member>& members) {
  std::string bytes;
  for (const raw_member& m : members) {
    const bool file = m.type == '0';
    const auto header = tar_header::make(
        m.path, m.type, 0644, file ? m.data.size() : 0, file ? "" : m.data);
    bytes.append(header.data(), header.size());
    if (file) {
      bytes += m.data;
      bytes.append((512 - m.data.size() % 512) % 512, '\0');
    }
  }
  return bytes + std::string(1024, '\0');
}

void write_gzip(const std::string& path, const std::string& bytes) {
  gzFile out = gzopen(path.c_str(), "wb");
  if (out == nullptr ||
      gzwrite(out, bytes.data(), static_cast<unsigned>(bytes.size())) !=
          static_cast<int>(bytes.size()) ||
      gzclose(out) != Z_OK) {
    throw std::runtime_error("cannot write " + path);
  }
}

std::vector<raw_member> good_members(const std::string& release) {
  const std::string version = release + "\n";
  return {{kManifestName, '0', sha256_hex(version) + "  zoneinfo/+VERSION\n"},
          {"zoneinfo/", '5', ""},
          {"zoneinfo/+VERSION", '0', version},
          {"zoneinfo/V", '2', "+VERSION"}};
}

std::vector<raw_member> good_members_and(const raw_member& extra) {
  std::vector<raw_member> members = good_members();
  members.push_back(extra);
  return members;
}
