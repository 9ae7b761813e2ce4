#include "fs/first_word.h"

#include <fcntl.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

#include <cerrno>
#include <cstdint>
#include <cstring>
#include <fstream>
#include <random>
#include <sstream>
#include <string>

#include "captured_stderr.h"
#include "deadline.h"
#include "fs/word_file.h"
#include "gtest/gtest.h"
#include "scratch_dir.h"
#include "tree.h"

namespace {

// What formatted extraction from a stream makes of the same bytes.
std::string stream_word(const std::string& content) {
  std::istringstream in(content);
  std::string word;
  in >> word;
  return word;
}

std::string file_stream_word(const std::string& path) {
  std::ifstream in(path);
  std::string word;
  in >> word;
  return word;
}

void make_fifo(const std::string& path) {
  ASSERT_EQ(mkfifo(path.c_str(), 0644), 0) << std::strerror(errno);
}

}  // namespace

TEST(read_first_word, reads_as_a_stream_does) {
  const std::string nul(1, '\0');
  const std::string cases[] = {
      "2019c\n",
      "  2019c more words\nand a second line\n",
      "2019c.1.0",
      "\t\n\v\f\r 2020a",
      "",
      " \n\t\n",
      "57l\n",
      "  57l\nsecond line\n",
      "word" + nul + "with-nul rest",
      nul,
      "\xc3\xa9t\xc3\xa9 \xff\x80",
      "a\v" + std::string(40000, 'b'),
      std::string(16383, ' ') + "boundary\n",
      std::string(16380, ' ') + "across-the-boundary\n",
      std::string(16384, 'w') + " next",
      std::string(50000, '\n') + std::string(50000, 'z'),
      "\x1c\x1d\x1e\x1f\x85\xa0word",
  };
  scratch_dir dir;
  captured_stderr err;
  for (const std::string& content : cases) {
    tree::write_file(dir / "file", content);
    EXPECT_EQ(fs::read_first_word(dir / "file"), stream_word(content))
        << content.size() << " bytes";
  }
  EXPECT_EQ(err.text(), "");
}

TEST(read_first_word, reads_generated_contents_as_a_stream_does) {
  const std::string pieces[] = {
      " ", "\t", "\n", "\v",   "\f",   "\r",  "a",        "2019c",
      ".", "/",  "\0", "\x80", "\xff", "57l", "+VERSION", "\xc2\xa0",
  };
  std::mt19937 engine(8);
  scratch_dir dir;
  for (int i = 0; i < 400; ++i) {
    std::string content;
    const std::uint32_t count = engine() % 12;
    for (std::uint32_t j = 0; j < count; ++j) {
      content += pieces[engine() % std::size(pieces)];
    }
    tree::write_file(dir / "file", content);
    ASSERT_EQ(fs::read_first_word(dir / "file"), stream_word(content))
        << '"' << content << '"';
  }
}

TEST(read_first_word, missing_file_is_empty_and_silent) {
  scratch_dir dir;
  captured_stderr err;
  errno = 0;
  EXPECT_EQ(fs::read_first_word(dir / "missing"), "");
  EXPECT_EQ(errno, ENOENT);
  EXPECT_EQ(fs::read_first_word(dir / "missing/below"), "");
  EXPECT_EQ(err.text(), "");
}

TEST(read_first_word, file_without_permissions_reads_as_a_stream_does) {
  scratch_dir dir;
  tree::write_file(dir / "file", "57l\n", 0000);
  EXPECT_EQ(fs::read_first_word(dir / "file"), file_stream_word(dir / "file"));
}

TEST(read_first_word, link_to_a_file_is_followed) {
  scratch_dir dir;
  tree::write_file(dir / "file", "2019c\n");
  tree::make_link(dir / "file", dir / "link");
  EXPECT_EQ(fs::read_first_word(dir / "link"), "2019c");
  tree::make_link(dir / "nothing", dir / "dangling");
  EXPECT_EQ(fs::read_first_word(dir / "dangling"), "");
}

TEST(read_first_word, directory_is_unreadable_as_a_stream_finds_it) {
  scratch_dir dir;
  tree::make_dir(dir / "sub");
  captured_stderr err;
  errno = EAGAIN;
  EXPECT_EQ(fs::read_first_word(dir / "sub"), "");
  EXPECT_EQ(errno, EISDIR);
  EXPECT_EQ(err.text(), "");
}

TEST(read_first_word, regular_file_leaves_errno_alone) {
  scratch_dir dir;
  tree::write_file(dir / "file", "2019c");
  errno = EAGAIN;
  EXPECT_EQ(fs::read_first_word(dir / "file"), "2019c");
  EXPECT_EQ(errno, EAGAIN);
}

TEST(read_first_word, fifo_without_writer_is_empty_at_once) {
  scratch_dir dir;
  make_fifo(dir / "fifo");
  tree::make_link(dir / "fifo", dir / "link");
  const deadline guard;
  captured_stderr err;
  EXPECT_EQ(fs::read_first_word(dir / "fifo"), "");
  EXPECT_EQ(fs::read_first_word(dir / "link"), "");
  EXPECT_EQ(err.text(), "");
}

TEST(read_first_word, fifo_with_a_writer_is_empty_and_not_read) {
  scratch_dir dir;
  make_fifo(dir / "fifo");
  const int writer = open((dir / "fifo").c_str(), O_RDWR | O_NONBLOCK);
  ASSERT_GE(writer, 0);
  const std::string data = "2019c\n";
  ASSERT_EQ(write(writer, data.data(), data.size()),
            static_cast<ssize_t>(data.size()));
  const deadline guard;
  EXPECT_EQ(fs::read_first_word(dir / "fifo"), "");
  char buffer[16] = {};
  EXPECT_EQ(read(writer, buffer, sizeof buffer),
            static_cast<ssize_t>(data.size()));
  close(writer);
}

TEST(read_first_word, socket_is_empty) {
  scratch_dir dir;
  const int listener = socket(AF_UNIX, SOCK_STREAM, 0);
  ASSERT_GE(listener, 0);
  sockaddr_un address{};
  address.sun_family = AF_UNIX;
  const std::string path = dir / "socket";
  ASSERT_LT(path.size(), sizeof address.sun_path);
  std::memcpy(address.sun_path, path.c_str(), path.size() + 1);
  ASSERT_EQ(bind(listener, reinterpret_cast<const sockaddr*>(&address),
                 sizeof address),
            0);
  ASSERT_EQ(listen(listener, 1), 0);
  const deadline guard;
  captured_stderr err;
  EXPECT_EQ(fs::read_first_word(path), "");
  EXPECT_EQ(err.text(), "");
  close(listener);
}

// A character device never ends: /dev/zero would give NUL bytes for ever.
TEST(read_first_word, character_devices_are_empty) {
  const deadline guard;
  for (const char* device : {"/dev/null", "/dev/zero", "/dev/urandom"}) {
    EXPECT_EQ(fs::read_first_word(device), "") << device;
  }
}

TEST(word_file, reads_from_the_start_every_time) {
  scratch_dir dir;
  tree::write_file(dir / "file", "  2019c rest");
  const fs::word_file file(dir / "file");
  EXPECT_EQ(file.first_word(), "2019c");
  EXPECT_EQ(file.first_word(), "2019c");
}

TEST(word_file, sets_errno_when_opened_not_when_read) {
  scratch_dir dir;
  errno = EAGAIN;
  const fs::word_file missing(dir / "missing");
  EXPECT_EQ(errno, ENOENT);
  errno = EAGAIN;
  EXPECT_EQ(missing.first_word(), "");
  EXPECT_EQ(errno, EAGAIN);
}
