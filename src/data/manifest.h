#ifndef KESTREL_DATA_MANIFEST_H_
#define KESTREL_DATA_MANIFEST_H_

#include <string>
#include <string_view>

#include "data/set_image.h"

// The manifest an archive of a data set carries as its first member, in the
// format of sha256sum(1): one line "SUM  PATH" for every regular file of the
// set and every hard link to one, so that `sha256sum -c SHA256SUMS` also
// checks an unpacked set.
inline constexpr char kManifestName[] = "SHA256SUMS";

// The SHA-256 of bytes in lower-case hexadecimal, by OpenSSL's libcrypto.
std::string sha256_hex(std::string_view bytes);

std::string make_manifest(const set_image& image);

// Raises std::runtime_error unless the manifest lists every regular file and
// hard link of the image exactly once with its sum, and nothing else.
void check_manifest(const set_image& image, const std::string& manifest);

#endif  // KESTREL_DATA_MANIFEST_H_
