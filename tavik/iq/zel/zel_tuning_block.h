// Typed tuning blocks of this processor generation, the bundle that carries them, and the tuning
// point of a frame. One template serves all 25 block messages; the shading block alone is an
// LscTuningBlock, whose tables the shading controller reads.
#ifndef TAVIK_IQ_ZEL_ZEL_TUNING_BLOCK_H_
#define TAVIK_IQ_ZEL_ZEL_TUNING_BLOCK_H_

#include <memory>
#include <string>
#include <string_view>
#include <type_traits>
#include <utility>

#include "tavik/base/camera_types.h"
#include "tavik/base/containers.h"
#include "tavik/base/logging.h"
#include "tavik/base/status.h"
#include "tavik/base/tuning_block.h"
#include "tavik/base/tuning_point.h"
#include "tavik/iq/export.h"
#include "tavik/iq/zel/protos/lsc_param.pb.h"

namespace tavik {

template <typename T>
class ZelTuningBlock;

namespace zel_tuning_block_internal {

// The base of ZelTuningBlock<T>: TuningBlock, or LscTuningBlock for the shading block.
template <typename T>
class Base : public TuningBlock {};

template <>
class Base<vosbrine::zelmondrake::LscTuning> : public LscTuningBlock {
 public:
  // The block's base tables; default instances where a submessage is unset.
  const vosbrine::LscTables& GetLscTables() const override;
};

}  // namespace zel_tuning_block_internal

// One block's filled message. Shared as std::shared_ptr<const ...> and never changed after that.
template <typename T>
class ZelTuningBlock final : public zel_tuning_block_internal::Base<T> {
 public:
  ZelTuningBlock() = default;
  explicit ZelTuningBlock(T message) : message(std::move(message)) {}

  std::string GetName() const override { return T::descriptor()->name(); }

  T message;
};

inline const vosbrine::LscTables&
zel_tuning_block_internal::Base<vosbrine::zelmondrake::LscTuning>::GetLscTables() const {
  return static_cast<const ZelTuningBlock<vosbrine::zelmondrake::LscTuning>*>(this)
      ->message.dynamic_param()
      .lsc_tables();
}

// Blocks by name. Adding a name that is there already keeps the first block and returns OK; a
// null block is refused.
class TAVIK_EXPORT ZelTuningBundle : public TuningBundle {
 public:
  ZelTuningBundle() = default;
  // Room for `expected_blocks` without growing.
  explicit ZelTuningBundle(size_t expected_blocks) { Reserve(expected_blocks); }

  const TuningBlock* GetBlock(std::string_view name) const override;
  Status AddBlock(std::shared_ptr<const TuningBlock> block) override;

  // AddBlock of a non-null block whose name the caller knows to be `name`, without composing it.
  void AddNamedBlock(std::string_view name, std::shared_ptr<const TuningBlock> block);

  // Room for `expected_blocks` without growing.
  void Reserve(size_t expected_blocks) { blocks_.reserve(expected_blocks); }

  // Empties the bundle for another frame, letting its blocks go. The names stay as empty slots, so
  // that a bundle filled with the same blocks again composes no text.
  void ReleaseBlocks();

 private:
  // An entry with a null block is an empty slot: absent to GetBlock and AddBlock.
  FlatHashMap<std::string, std::shared_ptr<const TuningBlock>> blocks_;
};

// A frame's request: what the frame is for, its sensor mode and module, and its camera state.
// Copies share the fence.
class TAVIK_EXPORT ZelTuningPoint : public TuningPoint {
 public:
  ZelTuningPoint(UseCase use_case, TuningInfo tuning_info, TuningCoordinates tuning_coordinates,
                 bool use_bringup_tuning);
  ZelTuningPoint(const ZelTuningPoint&) = default;

  UseCase use_case;
  TuningInfo tuning_info;
  TuningCoordinates tuning_coordinates;
  bool use_bringup_tuning;
};

// The message of `block` when it is a ZelTuningBlock<T>; null, logged, when it is another block.
template <typename T>
const T* GetTuningProto(const TuningBlock& block) {
  if (const auto* typed = dynamic_cast<const ZelTuningBlock<T>*>(&block)) return &typed->message;
  TAVIK_LOG(ERROR) << "Incorrect tuning block type: " << block.GetName()
                   << ", expected: " << T::descriptor()->name();
  return nullptr;
}

// The message of the bundle's block `block_name`; null, logged, when absent or of another type.
template <typename T>
const T* GetTuningProtoFromBundle(const TuningBundle& bundle, std::string_view block_name) {
  const TuningBlock* block = bundle.GetBlock(block_name);
  if (block == nullptr) {
    TAVIK_LOG(ERROR) << "Proto " << T::descriptor()->name() << " not found in tuning bundle";
    return nullptr;
  }
  return GetTuningProto<T>(*block);
}

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_ZEL_TUNING_BLOCK_H_
