#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {

namespace {

// Beyond this many names, a released bundle forgets them rather than keep empty slots.
constexpr size_t kMaxEmptySlots = 64;

}  // namespace

const TuningBlock* ZelTuningBundle::GetBlock(std::string_view name) const {
  const auto found = blocks_.find(name);
  return found == blocks_.end() ? nullptr : found->second.get();
}

Status ZelTuningBundle::AddBlock(std::shared_ptr<const TuningBlock> block) {
  if (block == nullptr) return InvalidArgumentError("Null tuning block");
  const std::string name = block->GetName();
  AddNamedBlock(name, std::move(block));
  return OkStatus();
}

void ZelTuningBundle::AddNamedBlock(std::string_view name,
                                    std::shared_ptr<const TuningBlock> block) {
  const auto found = blocks_.find(name);
  if (found == blocks_.end()) {
    blocks_.try_emplace(std::string(name), std::move(block));
  } else if (found->second == nullptr) {
    found->second = std::move(block);
  }
}

void ZelTuningBundle::ReleaseBlocks() {
  if (blocks_.size() > kMaxEmptySlots) {
    blocks_.clear();
    return;
  }
  for (auto& [name, block] : blocks_) block.reset();
}

ZelTuningPoint::ZelTuningPoint(UseCase use_case, TuningInfo tuning_info,
                               TuningCoordinates tuning_coordinates, bool use_bringup_tuning)
    : TuningPoint(std::make_shared<SoftwareFence>()),
      use_case(std::move(use_case)),
      tuning_info(std::move(tuning_info)),
      tuning_coordinates(tuning_coordinates),
      use_bringup_tuning(use_bringup_tuning) {}

}  // namespace tavik
