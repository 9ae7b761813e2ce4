#include "data/set_archive.h"

#include <zlib.h>

#include <memory>
#include <stdexcept>

#include "data/manifest.h"
#include "data/tar_header.h"

namespace {

// Far more than any file of a data set; a header claiming more is corrupt.
constexpr std::uint64_t kLargestMember = 64U << 20U;

using gz_file = std::unique_ptr<gzFile_s, int (*)(gzFile)>;

std::uint64_t padded(std::uint64_t size) {
  return (size + tar_header::kBlock - 1) / tar_header::kBlock *
         tar_header::kBlock;
}

void write_all(gzFile out, const char* data, std::uint64_t size) {
  if (size != 0 && gzwrite(out, data, static_cast<unsigned>(size)) !=
                       static_cast<int>(size)) {
    throw std::runtime_error("cannot write the archive");
  }
}

void write_member(gzFile out, const std::string& path, char type, unsigned mode,
                  const std::string& data) {
  const bool has_bytes = type == '0';
  const tar_header::block header = tar_header::make(
      path, type, mode, has_bytes ? data.size() : 0, has_bytes ? "" : data);
  write_all(out, header.data(), header.size());
  if (has_bytes) {
    write_all(out, data.data(), data.size());
    const std::string padding(padded(data.size()) - data.size(), '\0');
    write_all(out, padding.data(), padding.size());
  }
}

void read_exactly(gzFile in, char* into, std::uint64_t size) {
  if (size != 0 &&
      gzread(in, into, static_cast<unsigned>(size)) != static_cast<int>(size)) {
    throw std::runtime_error("the archive is truncated or corrupt");
  }
}

set_member::kind kind_of(const tar_header& header) {
  switch (header.type) {
    case '0':
      return set_member::kind::file;
    case '5':
      return set_member::kind::directory;
    case '2':
      return set_member::kind::link;
    case '1':
      return set_member::kind::hard_link;
    case '3':
    case '4':
      throw std::runtime_error("the archive holds a device file: " +
                               header.path);
    case '6':
      throw std::runtime_error("the archive holds a FIFO: " + header.path);
    default:
      throw std::runtime_error("the archive holds " + header.path +
                               ", which is neither a directory, a regular "
                               "file nor a symbolic link");
  }
}

}  // namespace

void write_set_archive(const set_image& image, const std::string& path) {
  gz_file out(gzopen(path.c_str(), "wb9"), gzclose);
  if (!out) {
    throw std::runtime_error("cannot create " + path);
  }
  write_member(out.get(), kManifestName, '0', 0644, make_manifest(image));
  for (const set_member& member : image.members()) {
    const char type = member.type == set_member::kind::directory   ? '5'
                      : member.type == set_member::kind::link      ? '2'
                      : member.type == set_member::kind::hard_link ? '1'
                                                                   : '0';
    write_member(out.get(), member.path, type, member.mode, member.data);
  }
  const tar_header::block end{};
  write_all(out.get(), end.data(), end.size());
  write_all(out.get(), end.data(), end.size());
  // gzclose frees the stream whatever it returns.
  if (gzclose(out.release()) != Z_OK) {
    throw std::runtime_error("cannot write " + path);
  }
}

set_image read_set_archive(const std::string& path) {
  const gz_file in(gzopen(path.c_str(), "rb"), gzclose);
  if (!in) {
    throw std::runtime_error("cannot read " + path);
  }
  set_image image;
  std::string manifest;
  bool first = true;
  tar_header::block block{};
  for (read_exactly(in.get(), block.data(), block.size());
       !tar_header::is_end(block);
       read_exactly(in.get(), block.data(), block.size())) {
    tar_header header(block);
    std::string path_in_set = header.path;
    while (path_in_set.ends_with('/')) {
      path_in_set.pop_back();
    }
    const set_member::kind type = kind_of(header);
    if (header.size > kLargestMember) {
      throw std::runtime_error("the archive claims a member of " +
                               std::to_string(header.size) + " bytes");
    }
    std::string data(type == set_member::kind::file ? header.size : 0, '\0');
    read_exactly(in.get(), data.data(), data.size());
    std::string padding(padded(data.size()) - data.size(), '\0');
    read_exactly(in.get(), padding.data(), padding.size());
    if (first && path_in_set == kManifestName) {
      manifest = std::move(data);
    } else {
      image.add(
          {path_in_set, type, header.mode,
           type == set_member::kind::link || type == set_member::kind::hard_link
               ? header.link_target
               : data});
    }
    first = false;
  }
  if (first || manifest.empty()) {
    throw std::runtime_error("the archive has no manifest " +
                             std::string(kManifestName));
  }
  check_manifest(image, manifest);
  return image;
}
