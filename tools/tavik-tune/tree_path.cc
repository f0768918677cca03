#include "tools/tavik-tune/tree_path.h"

#include <cstdio>

#include "tavik/base/strings.h"

namespace tavik::tune {
namespace {

std::string FormatBound(float value) {
  char text[32];
  std::snprintf(text, sizeof(text), "%g", value);
  return text;
}

}  // namespace

std::string LevelTypeName(const vosbrine::Level& level) {
  return vosbrine::Level::Type_IsValid(level.type())
             ? vosbrine::Level::Type_Name(level.type())
             : StrCat("type ", static_cast<int>(level.type()));
}

std::string RegionBounds(const vosbrine::Node& node) {
  return StrCat(FormatBound(node.lower()), "..", FormatBound(node.upper()));
}

std::string NodeStep(const vosbrine::Level& level, int index) {
  return StrCat(LevelTypeName(level), "#", index, "(", RegionBounds(level.nodes(index)), ")");
}

std::string JoinStep(const std::string& path, const std::string& step) {
  return path.empty() ? step : StrCat(path, " > ", step);
}

}  // namespace tavik::tune
