#include "data/manifest.h"

#include <stdexcept>
#include <string>

#include "gtest/gtest.h"

namespace {

TEST(manifest_test, sha256_of_known_texts) {
  const struct {
    std::string text;
    const char* sum;
  } kSums[] = {
      {"", "e3b0c44298fc1c149afbf4c8996fb92427ae41e4649b934ca495991b7852b855"},
      {"abc", "ba7816bf8f01cfea414140de5dae2223b00361a396177a9cb410ff61f20015ad"},
      {std::string(1000000, 'a'),
       "cdc76e5c9914fb9281a1c7e284d73e67f1809a48a497200e046d39ccc7112cd0"},
  };
  for (const auto& s : kSums) {
    EXPECT_EQ(sha256_hex(s.text), s.sum) << s.text.size();
  }
}

set_image sample_image() {
  set_image image;
  image.add({"zoneinfo", set_member::kind::directory, 0755, ""});
  image.add({"zoneinfo/+VERSION", set_member::kind::file, 0644, "2026a\n"});
  image.add({"zoneinfo/UTC", set_member::kind::link, 0777, "+VERSION"});
  return image;
}

TEST(manifest_test, lists_every_regular_file_with_its_sum) {
  EXPECT_EQ(make_manifest(sample_image()),
            sha256_hex("2026a\n") + "  zoneinfo/+VERSION\n");
  EXPECT_NO_THROW(check_manifest(sample_image(), make_manifest(sample_image())));
}

TEST(manifest_test, refuses_a_manifest_that_does_not_match) {
  const std::string sum = sha256_hex("2026a\n");
  const std::string wrong = sha256_hex("2026b\n");
  const struct {
    std::string manifest;
    const char* message;
  } kBad[] = {
      {"", "zoneinfo/+VERSION is not in the manifest"},
      {wrong + "  zoneinfo/+VERSION\n", "does not match its SHA-256 sum"},
      {sum + "  zoneinfo/+VERSION\n" + sum + "  zoneinfo/extra\n",
       "zoneinfo/extra is in the manifest but not in the archive"},
      {sum + "  zoneinfo/+VERSION\n" + sum + "  zoneinfo/+VERSION\n",
       "bad line"},
      {sum + " zoneinfo/+VERSION\n", "bad line"},
  };
  for (const auto& bad : kBad) {
    try {
      check_manifest(sample_image(), bad.manifest);
      ADD_FAILURE() << "accepted: " << bad.manifest;
    } catch (const std::runtime_error& e) {
      EXPECT_NE(std::string(e.what()).find(bad.message), std::string::npos)
          << e.what();
    }
  }
}

}  // namespace
