#ifndef KESTREL_TESTS_GENERATED_TEXT_H_
#define KESTREL_TESTS_GENERATED_TEXT_H_

#include <cstdint>
#include <random>
#include <string>
#include <vector>

// Deterministic texts for comparing a matcher with std::regex: each text is
// a few pieces drawn from pieces, so that near misses of a pattern (a piece
// left out, doubled, swapped or followed by a stray byte) are as common as
// matches. The same seed gives the same texts on every machine.
class generated_text {
 public:
  generated_text(std::vector<std::string> pieces, std::uint32_t seed);

  // A text of at most max_pieces pieces, possibly empty.
  std::string next(std::size_t max_pieces);

  // A text shaped like slots, one alternative of each slot in turn, where
  // now and then a slot is left out, doubled, or has a piece put before it
  // or in its place, and a piece may trail: mostly matches and near misses.
  std::string near(const std::vector<std::vector<std::string>>& slots);

 private:
  std::size_t below(std::size_t bound);
  const std::string& any_of(const std::vector<std::string>& choices);

  std::vector<std::string> pieces;
  std::mt19937 engine;
};

// Pieces that every pattern of the tool's file names and versions is made
// of, and the bytes that must never pass for them: single digits and runs of
// digits, lower- and upper-case letters, '.', blanks, '/', a newline, NUL and
// non-ASCII bytes.
std::vector<std::string> common_pieces();

#endif  // KESTREL_TESTS_GENERATED_TEXT_H_
