#include "data/set_member_check.h"

#include "gtest/gtest.h"

namespace {

TEST(set_member_check_test, paths_that_stay_inside_the_set) {
  const struct {
    const char* path;
    bool inside;
  } kPaths[] = {
      {"zoneinfo", true},          {"zoneinfo/Europe/Paris", true},
      {"icutz/icutz44l.dat", true}, {"", false},
      {"/etc/passwd", false},       {"..", false},
      {"zoneinfo/../..", false},    {"zoneinfo/./x", false},
      {"zoneinfo//x", false},       {"zoneinfo/", false},
      {"a/../b", false},            {"..x", true},
  };
  for (const auto& p : kPaths) {
    EXPECT_EQ(path_stays_inside(p.path), p.inside) << p.path;
  }
}

TEST(set_member_check_test, links_that_resolve_inside_the_set) {
  const struct {
    const char* link;
    const char* target;
    bool inside;
  } kLinks[] = {
      {"zoneinfo/UTC", "Etc/UTC", true},
      {"zoneinfo/US/Eastern", "../America/New_York", true},
      {"zoneinfo/a", "..", true},
      {"zoneinfo/a", "../..", false},
      {"zoneinfo/a", "/usr/share/zoneinfo/UTC", false},
      {"zoneinfo/a", "", false},
      {"a", "../a", false},
      {"zoneinfo/a/b", "c/../../../../x", false},
      {"zoneinfo/a/b", "c/../../../x", true},
      {"zoneinfo/a/b", "c/../../x", true},
      {"../a", "b", false},
  };
  for (const auto& l : kLinks) {
    EXPECT_EQ(link_stays_inside(l.link, l.target), l.inside)
        << l.link << " -> " << l.target;
  }
}

}  // namespace
