// Writes seeds for translator_table_fuzzer: for every form of the table, a few leaves of its block
// from the sample tuning set, under plain frame facts, one file each.
//   make_translator_seeds SAMPLE_TUNING_DIR OUT_DIR
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <string>

#include "fuzz/translator_input.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"
#include "tavik/iq/read_binary_proto.h"
#include "tavik/iq/tuning_provider_base.h"
#include "tavik/iq/zel/protos/tuning_tree_set.pb.h"

int main(int argc, char** argv) {
  namespace fs = std::filesystem;
  using namespace tavik;
  if (argc != 3) {
    std::fprintf(stderr, "usage: make_translator_seeds SAMPLE_TUNING_DIR OUT_DIR\n");
    return 2;
  }
  fs::create_directories(argv[2]);
  int written = 0;
  for (const fs::directory_entry& entry : fs::directory_iterator(argv[1])) {
    vosbrine::TuningUsecaseData data;
    vosbrine::zelmondrake::TuningTreeSet tree_set;
    if (entry.path().extension() != ".binarypb" ||
        !ReadBinaryProto(entry.path().string(), data).ok() ||
        !data.tuning_tree_set().UnpackTo(&tree_set)) {
      continue;
    }
    const auto table = TranslatorTable();
    for (size_t row = 0; row < table.size(); ++row) {
      ForEachZelBlockType([&]<size_t Position, typename T>() {
        if (Position != table[row]->block) return;
        const auto* field = tree_set.GetDescriptor()->FindFieldByName(
            vosbrine::FieldNameFromMessageName(T::descriptor()->name()));
        if (field == nullptr || !tree_set.GetReflection()->HasField(tree_set, field)) return;
        const auto& tree = static_cast<const vosbrine::TuningTree&>(
            tree_set.GetReflection()->GetMessage(tree_set, field));
        vosbrine::Level level = tree.dynamic_top_level();
        std::vector<google::protobuf::Any*> leaves;
        if (!vosbrine::TuningProviderBase::FindMutableDynamicParams(&level, &leaves).ok()) return;
        // The first and last leaf of each file: enough variety, a small corpus.
        for (size_t i : {size_t{0}, leaves.size() - 1}) {
          if (i >= leaves.size()) continue;
          T tuning;
          tuning.set_enable(tree.enable());
          if (!tree.static_param().UnpackTo(tuning.mutable_static_param()) ||
              !leaves[i]->UnpackTo(tuning.mutable_dynamic_param())) {
            continue;
          }
          fuzz::TranslatorInputHeader header = {static_cast<uint8_t>(row), 0, 1, 10, 1.0f, 2};
          const std::string bytes = fuzz::WriteHeader(header) + tuning.SerializeAsString();
          std::ofstream(fs::path(argv[2]) / (std::to_string(written++) + ".seed"), std::ios::binary)
              << bytes;
        }
      });
    }
  }
  std::printf("%d seeds in %s\n", written, argv[2]);
  return 0;
}
