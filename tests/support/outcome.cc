#include "outcome.h"

#include <cstring>

std::string warning(const std::string& message, int error) {
  return "kestrel: " + message + ": " + std::strerror(error) + "\n";
}
