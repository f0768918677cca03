// String building of the platform: Abseil's, under the platform's names. Debian builds Abseil with
// its own string_view type rather than std's, so the names here also take std::string_view, which
// is what the rest of the tree speaks.
#ifndef TAVIK_BASE_STRINGS_H_
#define TAVIK_BASE_STRINGS_H_

#include <string>
#include <string_view>

#include "absl/strings/str_cat.h"
#include "absl/strings/string_view.h"

namespace tavik {

inline absl::string_view ToAbslStringView(std::string_view text) {
  return absl::string_view(text.data(), text.size());
}
inline std::string_view ToStdStringView(absl::string_view text) {
  return std::string_view(text.data(), text.size());
}

// One piece of a StrCat: everything absl::AlphaNum takes, and std::string_view.
class AlphaNum : public absl::AlphaNum {
 public:
  using absl::AlphaNum::AlphaNum;
  AlphaNum(std::string_view text) : absl::AlphaNum(ToAbslStringView(text)) {}  // NOLINT
  AlphaNum(const std::string& text) : absl::AlphaNum(text) {}                   // NOLINT
  AlphaNum(const char* text) : absl::AlphaNum(text) {}                          // NOLINT
};

template <typename... Pieces>
std::string StrCat(const Pieces&... pieces) {
  return absl::StrCat(static_cast<const absl::AlphaNum&>(AlphaNum(pieces))...);
}

template <typename... Pieces>
void StrAppend(std::string* destination, const Pieces&... pieces) {
  absl::StrAppend(destination, static_cast<const absl::AlphaNum&>(AlphaNum(pieces))...);
}

}  // namespace tavik

#endif  // TAVIK_BASE_STRINGS_H_
