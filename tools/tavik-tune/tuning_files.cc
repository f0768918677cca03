#include "tools/tavik-tune/tuning_files.h"

#include <dirent.h>
#include <sys/stat.h>

#include "tavik/base/file_path.h"
#include "tavik/iq/tuning_provider_base.h"
#include "tavik/iq/zel/protos/tuning_tree_set.pb.h"
#include "tavik/iq/zel/zel_block_list.h"
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
    ForEachZelBlockType([&]<size_t Position, typename T>() {
      list->push_back(BlockType{
          tree_set->FindFieldByName(vosbrine::FieldNameFromMessageName(T::descriptor()->name())),
          T::descriptor(),
          T::descriptor()->FindFieldByName("static_param")->message_type(),
          T::descriptor()->FindFieldByName("dynamic_param")->message_type()});
    });
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
