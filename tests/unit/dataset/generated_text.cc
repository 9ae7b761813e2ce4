#include "generated_text.h"

#include <utility>

generated_text::generated_text(std::vector<std::string> pieces,
                               std::uint32_t seed)
    : pieces(std::move(pieces)), engine(seed) {}

std::string generated_text::next(std::size_t max_pieces) {
  std::string text;
  const std::size_t count = below(max_pieces + 1);
  for (std::size_t i = 0; i < count; ++i) {
    text += any_of(pieces);
  }
  return text;
}

std::string generated_text::near(
    const std::vector<std::vector<std::string>>& slots) {
  std::string text;
  for (const auto& slot : slots) {
    switch (below(16)) {
      case 0:
        break;
      case 1:
        text += any_of(slot);
        text += any_of(slot);
        break;
      case 2:
        text += any_of(pieces);
        break;
      case 3:
        text += any_of(pieces);
        text += any_of(slot);
        break;
      default:
        text += any_of(slot);
    }
  }
  if (below(8) == 0) {
    text += any_of(pieces);
  }
  return text;
}

const std::string& generated_text::any_of(
    const std::vector<std::string>& choices) {
  return choices[below(choices.size())];
}

// Plain modulo of the engine's output: std::mt19937's sequence is fixed by
// the standard, the distributions' are not.
std::size_t generated_text::below(std::size_t bound) {
  return static_cast<std::size_t>(engine()) % bound;
}

std::vector<std::string> common_pieces() {
  std::vector<std::string> pieces = {
      "0",    "1",    "9",        "2019", "007", "2147483647",
      "a",    "c",    "z",        "ab",   "l",   "b",
      "e",    "A",    "L",        "Z",    ".",   ".",
      ".",    " ",    "\t",       "/",    "\n",  std::string(1, '\0'),
      "\x80", "\xff", "\xc3\xa9", "-",    "_",   "x",
      "0l",   "57",
  };
  return pieces;
}
