#ifndef KESTREL_DATA_USAGE_ERROR_H_
#define KESTREL_DATA_USAGE_ERROR_H_

#include <stdexcept>
#include <string>

// Arguments a subcommand does not take; what holds the subcommand's usage.
class usage_error : public std::runtime_error {
 public:
  explicit usage_error(const std::string& usage)
      : std::runtime_error("usage: kestrel-data " + usage) {}
};

#endif  // KESTREL_DATA_USAGE_ERROR_H_
