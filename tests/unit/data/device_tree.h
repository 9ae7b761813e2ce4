#ifndef KESTREL_TESTS_UNIT_DATA_DEVICE_TREE_H_
#define KESTREL_TESTS_UNIT_DATA_DEVICE_TREE_H_

#include <map>
#include <string>

// Everything under root, path by path: each entry's kind, permission bits
// and content or link target. Two snapshots are equal exactly when nothing
// under root changed but times.
std::map<std::string, std::string> snapshot(const std::string& root);

// The same with paths relative to root, for comparing two trees.
std::map<std::string, std::string> relative_snapshot(const std::string& root);

// Every regular file under root, by path relative to root: its link count
// and the first of its names under root in a walk by name. Two trees whose
// maps are equal share inodes between the same names.
std::map<std::string, std::string> shared_inodes(const std::string& root);

// The private device of a test: the system partition's release and ICU
// schema, and the zoneinfo link at the system partition.
void make_device(const std::string& system_release,
                 const std::string& system_schema = "44l");

#endif  // KESTREL_TESTS_UNIT_DATA_DEVICE_TREE_H_
