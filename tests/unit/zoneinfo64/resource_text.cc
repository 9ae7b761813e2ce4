#include "resource_text.h"

#include <stdexcept>

namespace {

class tokenizer {
 public:
  explicit tokenizer(std::string_view text) : text_(text) {}

  // The next token: "{", "}", a quoted string (with its quotes), a word, or
  // empty at the end. Commas only separate values and are skipped.
  std::string next() {
    skip();
    if (pos_ == text_.size()) return "";
    const char c = text_[pos_];
    if (c == '{' || c == '}') return std::string(1, text_[pos_++]);
    if (c == '"') {
      const size_t close = text_.find('"', pos_ + 1);
      if (close == std::string_view::npos)
        throw std::runtime_error("unterminated string");
      std::string token(text_.substr(pos_, close + 1 - pos_));
      pos_ = close + 1;
      return token;
    }
    const size_t start = pos_;
    while (pos_ < text_.size() &&
           std::string_view(" \t\r\n{},\"").find(text_[pos_]) ==
               std::string_view::npos &&
           !text_.substr(pos_).starts_with("//") &&
           !text_.substr(pos_).starts_with("/*")) {
      ++pos_;
    }
    return std::string(text_.substr(start, pos_ - start));
  }

 private:
  void skip() {
    while (pos_ < text_.size()) {
      if (std::string_view(" \t\r\n,").find(text_[pos_]) !=
          std::string_view::npos) {
        ++pos_;
      } else if (text_.substr(pos_).starts_with("//")) {
        const size_t end = text_.find('\n', pos_);
        pos_ = end == std::string_view::npos ? text_.size() : end;
      } else if (text_.substr(pos_).starts_with("/*")) {
        const size_t end = text_.find("*/", pos_ + 2);
        if (end == std::string_view::npos)
          throw std::runtime_error("unterminated comment");
        pos_ = end + 2;
      } else {
        return;
      }
    }
  }

  std::string_view text_;
  size_t pos_ = 0;
};

// Reads the body of a resource after its "{", up to and including "}".
void read_body(tokenizer& tokens, resource_node& node) {
  std::string pending;  // a word that may be a label or a value
  for (;;) {
    std::string token = tokens.next();
    if (token.empty())
      throw std::runtime_error("unexpected end of resource text");
    if (token == "{") {
      resource_node child;
      child.label = pending;
      pending.clear();
      read_body(tokens, child);
      node.children.push_back(std::move(child));
      continue;
    }
    if (!pending.empty()) node.values.push_back(pending);
    pending.clear();
    if (token == "}") return;
    if (token.front() == '"') {
      node.values.push_back(token.substr(1, token.size() - 2));
    } else {
      pending = token;
    }
  }
}

}  // namespace

const resource_node* resource_node::child(std::string_view key) const {
  for (const resource_node& node : children) {
    if (node.label == key || node.label.starts_with(std::string(key) + ":"))
      return &node;
  }
  return nullptr;
}

resource_node parse_resource_text(std::string_view text) {
  tokenizer tokens(text);
  resource_node root;
  const std::string label = tokens.next();
  if (tokens.next() != "{")
    throw std::runtime_error("resource text does not open a table");
  root.label = label;
  read_body(tokens, root);
  return root;
}
