#include "data/set_image.h"

#include <algorithm>
#include <sstream>
#include <stdexcept>

#include "data/release_source.h"
#include "data/set_member_check.h"
#include "dataset/icu_data_file.h"

void set_image::add(set_member member) {
  if (!path_stays_inside(member.path)) {
    throw std::runtime_error("the path \"" + member.path +
                             "\" leaves the data set");
  }
  if (member.type == set_member::kind::link &&
      !link_stays_inside(member.path, member.data)) {
    throw std::runtime_error("the link " + member.path + " -> " + member.data +
                             " leaves the data set");
  }
  if (member.type == set_member::kind::hard_link) {
    check_hard_link(member);
  }
  // Permission bits only, no set-user-ID, set-group-ID or sticky bit; the
  // owner, who stages it, can always read and write what it writes.
  member.mode = (member.mode & 0777) |
                (member.type == set_member::kind::directory ? 0700 : 0600);
  if (member.type == set_member::kind::file) {
    files.emplace(member.path, entries.size());
  }
  entries.push_back(std::move(member));
}

void set_image::check_hard_link(const set_member& member) const {
  const std::string what =
      "the hard link " + member.path + " to " + member.data;
  if (!path_stays_inside(member.data)) {
    throw std::runtime_error(what + " leaves the data set");
  }
  if (files.contains(member.data)) {
    return;
  }
  const bool earlier = std::any_of(
      entries.begin(), entries.end(),
      [&](const set_member& other) { return other.path == member.data; });
  throw std::runtime_error(what + (earlier ? " names no regular file"
                                           : " names no member before it"));
}

const std::string& set_image::bytes_of(const set_member& member) const {
  return member.type == set_member::kind::hard_link
             ? entries[files.at(member.data)].data
             : member.data;
}

std::string set_image::release() const {
  for (const set_member& member : entries) {
    if (member.path == "zoneinfo/+VERSION" &&
        member.type == set_member::kind::file) {
      std::istringstream words(member.data);
      std::string release;
      if (words >> release && is_release_name(release)) {
        return release;
      }
    }
  }
  throw std::runtime_error(
      "the data set has no zoneinfo/+VERSION naming a release");
}

std::string set_image::schema() const {
  for (const set_member& member : entries) {
    if (member.type == set_member::kind::file &&
        member.path.starts_with("icutz/")) {
      // The schema is a view into the name, which must outlive it.
      const std::string name = member.path.substr(6);
      const auto schema = icu_data_file_schema(name);
      if (schema) {
        return std::string(*schema);
      }
    }
  }
  return {};
}

std::uint64_t set_image::disk_bytes(std::uint64_t block_size) const {
  std::uint64_t total = 0;
  for (const set_member& member : entries) {
    if (member.type == set_member::kind::hard_link) {
      continue;
    }
    const std::uint64_t blocks =
        (member.data.size() + block_size - 1) / block_size;
    total += std::max<std::uint64_t>(blocks, 1) * block_size;
  }
  return total;
}

std::size_t set_image::inodes() const {
  return entries.size() -
         static_cast<std::size_t>(std::count_if(
             entries.begin(), entries.end(), [](const set_member& m) {
               return m.type == set_member::kind::hard_link;
             }));
}
