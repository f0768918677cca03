#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {

const TuningBlock* ZelTuningBundle::GetBlock(std::string_view name) const {
  const auto found = blocks_.find(name);
  return found == blocks_.end() ? nullptr : found->second.get();
}

Status ZelTuningBundle::AddBlock(std::shared_ptr<const TuningBlock> block) {
  if (block == nullptr) return InvalidArgumentError("Null tuning block");
  std::string name = block->GetName();
  blocks_.try_emplace(std::move(name), std::move(block));
  return OkStatus();
}

ZelTuningPoint::ZelTuningPoint(UseCase use_case, TuningInfo tuning_info,
                               TuningCoordinates tuning_coordinates, bool use_bringup_tuning)
    : TuningPoint(std::make_shared<SoftwareFence>()),
      use_case(std::move(use_case)),
      tuning_info(std::move(tuning_info)),
      tuning_coordinates(tuning_coordinates),
      use_bringup_tuning(use_bringup_tuning) {}

}  // namespace tavik
