#include "tools/tavik-tune/tuning_files.h"

#include <dirent.h>
#include <sys/stat.h>

#include "tavik/base/file_path.h"
#include "tavik/iq/tuning_provider_base.h"
#include "tavik/iq/zel/protos/tuning_tree_set.pb.h"
#include "tools/tavik-tune/proto_files.h"

namespace tavik::tune {

std::vector<std::string> ExpandPaths(const std::vector<std::string>& paths) {
  std::vector<std::string> files;
  for (const std::string& path : paths) {
    struct stat info;
    DIR* directory = nullptr;
    if (stat(path.c_str(), &info) != 0 || !S_ISDIR(info.st_mode) ||
        (directory = opendir(path.c_str())) == nullptr) {
      files.push_back(path);
      continue;
    }
    while (const dirent* item = readdir(directory)) {
      const std::string name = item->d_name;
      if (name.empty() || name == "." || name == "..") continue;
      files.push_back(JoinPath(path, name));
    }
    closedir(directory);
  }
  return files;
}

bool IsBinarypb(const std::string& path) { return Extension(path) == "binarypb"; }

bool IsGoldenCalibrationPath(const std::string& path) {
  return path.find(kGoldenCalibrationMarker) != std::string::npos;
}

const std::vector<BlockType>& AllBlockTypes() {
  static const std::vector<BlockType>* const blocks = [] {
    auto* list = new std::vector<BlockType>();
    const auto* tree_set = vosbrine::zelmondrake::TuningTreeSet::descriptor();
    const auto* pool = tree_set->file()->pool();
    for (int i = 0; i < tree_set->field_count(); ++i) {
      const google::protobuf::FieldDescriptor* field = tree_set->field(i);
      // The message whose field name this is: "rgb_yuv_conversion" -> RgbYuvConversionTuning.
      std::string stem;
      bool capital = true;
      for (char c : field->name()) {
        if (c == '_') {
          capital = true;
          continue;
        }
        stem.push_back(capital && c >= 'a' && c <= 'z' ? static_cast<char>(c - 'a' + 'A') : c);
        capital = false;
      }
      const std::string package = "vosbrine.zelmondrake.";
      const auto* message = pool->FindMessageTypeByName(package + stem + "Tuning");
      if (message == nullptr || vosbrine::FieldNameFromMessageName(message->full_name()) !=
                                    field->name()) {
        continue;
      }
      list->push_back(BlockType{field, message,
                                pool->FindMessageTypeByName(package + stem + "StaticParam"),
                                pool->FindMessageTypeByName(package + stem + "DynamicParam")});
    }
    return list;
  }();
  return *blocks;
}

const BlockType* FindBlockType(const std::string& name) {
  for (const BlockType& block : AllBlockTypes()) {
    if (block.message->name() == name || block.tree_field->name() == name) return &block;
  }
  return nullptr;
}

}  // namespace tavik::tune
