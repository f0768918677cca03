#include "tavik/base/camera_types.h"

#include "tavik/base/strings.h"

namespace tavik {

std::string ColorFilterArrangementToString(ColorFilterArrangement arrangement) {
  switch (arrangement) {
    case ColorFilterArrangement::kBggr:
      return "BGGR";
    case ColorFilterArrangement::kGbrg:
      return "GBRG";
    case ColorFilterArrangement::kGrbg:
      return "GRBG";
    case ColorFilterArrangement::kRggb:
      return "RGGB";
    case ColorFilterArrangement::kMono:
      return "MONO";
    case ColorFilterArrangement::kNir:
      return "NIR";
  }
  return StrCat("UNKNOWN(", static_cast<int32_t>(arrangement), ")");
}

}  // namespace tavik
