#include "tools/tavik-tune/keys.h"

#include <map>

#include "tavik/base/strings.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"
#include "tavik/iq/read_binary_proto.h"
#include "tavik/iq/tuning_provider_base.h"
#include "tavik/iq/zel/protos/tuning_tree_set.pb.h"
#include "tools/tavik-tune/tuning_files.h"

namespace tavik::tune {

Status RunKeys(const std::vector<std::string>& paths, std::ostream& out) {
  struct Files {
    std::string winner;
    std::vector<std::string> dropped;
  };
  // Byte order, as the forest sorts its keys.
  std::map<std::string, Files> keys;
  for (const std::string& file : ExpandPaths(paths)) {
    if (!IsBinarypb(file) || IsGoldenCalibrationPath(file)) continue;
    vosbrine::TuningUsecaseData data;
    vosbrine::zelmondrake::TuningTreeSet tree_set;
    // A file whose tree set doesn't unpack never makes it into the forest.
    if (!ReadBinaryProto(file, data).ok() || !data.tuning_tree_set().UnpackTo(&tree_set)) continue;
    Files& files = keys[vosbrine::EncodeUsecaseKey(data.tuning_usecase())];
    if (files.winner.empty()) {
      files.winner = file;
    } else {
      files.dropped.push_back(file);
    }
  }
  if (keys.empty()) return NotFoundError("no tuning file yields a key");
  for (const auto& [key, files] : keys) {
    out << key << "\t" << files.winner << "\n";
    for (const std::string& dropped : files.dropped) {
      out << "  dropped, read after the winner:\t" << dropped << "\n";
    }
  }
  return OkStatus();
}

}  // namespace tavik::tune
