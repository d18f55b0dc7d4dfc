// LogCodeKey: the decimal text of a log code, the key under which class indexes keep subscriptions.
// Built on the stack, so dispatch looks a code up without allocating.
#pragma once

#include <array>
#include <charconv>
#include <cstdint>
#include <string_view>

namespace velmar {

class LogCodeKey {
  public:
    explicit LogCodeKey(std::int32_t code) {
        const auto result = std::to_chars(text_.data(), text_.data() + text_.size(), code);
        length_ = static_cast<std::size_t>(result.ptr - text_.data());
    }
    std::string_view view() const { return std::string_view(text_.data(), length_); }

  private:
    std::array<char, 12> text_{};
    std::size_t length_ = 0;
};

}  // namespace velmar
