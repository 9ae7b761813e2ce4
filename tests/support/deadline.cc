#include "deadline.h"

#include <unistd.h>

namespace {

constexpr unsigned kSeconds = 10;

}  // namespace

deadline::deadline() { alarm(kSeconds); }

deadline::~deadline() { alarm(0); }
