#ifndef KESTREL_TESTS_UNIT_DATA_HAND_MADE_ARCHIVE_H_
#define KESTREL_TESTS_UNIT_DATA_HAND_MADE_ARCHIVE_H_

#include <string>
#include <vector>

// Archives built member by member, good or bad, as kestrel-data's own
// writer never would.
struct raw_member {
  std::string path;
  char type;         // ustar type flag
  std::string data;  // a file's bytes or a link's target
};

// The ustar bytes of the members and the end blocks.
std::string tar_bytes(const std::vector<raw_member>& members);

// Writes bytes gzip-compressed to path; throws on failure.
void write_gzip(const std::string& path, const std::string& bytes);

// A small archive that reads well: its manifest, zoneinfo/, +VERSION of
// release and a link.
std::vector<raw_member> good_members(const std::string& release = "2026a");

// The good members with one more after them.
std::vector<raw_member> good_members_and(const raw_member& extra);

#endif  // KESTREL_TESTS_UNIT_DATA_HAND_MADE_ARCHIVE_H_
