// A text that most records never set: one word, no allocation while it is empty.
#pragma once

#include <memory>
#include <string>

namespace QLTypeSys {

/// Holds a text that may be absent. Copying is not needed by records and not offered.
class LazyText {
  public:
    /// Stores a copy of the text.
    void operator=(const std::string& text) { text_ = std::make_unique<std::string>(text); }
    /// Whether there is a text.
    bool isSet() const { return text_ != nullptr; }
    /// Forgets the text.
    void clear() { text_.reset(); }
    /// Unchecked: the text must be set.
    const std::string& operator*() const { return *text_; }

  private:
    std::unique_ptr<std::string> text_;
};

} // namespace QLTypeSys
