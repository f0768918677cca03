// The tuning of one hardware block for one frame, and the set of blocks handed out for a frame.
// Blocks are immutable once shared; bundles are read by every pipeline thread without a lock.
#ifndef TAVIK_BASE_TUNING_BLOCK_H_
#define TAVIK_BASE_TUNING_BLOCK_H_

#include <memory>
#include <string>
#include <string_view>

#include "tavik/base/status.h"

namespace vosbrine {
class LscTables;
}  // namespace vosbrine

namespace tavik {

class TuningBlock {
 public:
  virtual ~TuningBlock() = default;
  // The block's name: the short name of its tuning message, such as "GtnrTuning".
  virtual std::string GetName() const = 0;
};

// The shading block, whose tables the shading controller reads directly.
class LscTuningBlock : public TuningBlock {
 public:
  virtual const vosbrine::LscTables& GetLscTables() const = 0;
};

class TuningBundle {
 public:
  virtual ~TuningBundle() = default;
  // The block of that name, or null. The pointer lives as long as the bundle.
  virtual const TuningBlock* GetBlock(std::string_view name) const = 0;
  virtual Status AddBlock(std::shared_ptr<const TuningBlock> block) = 0;
};

}  // namespace tavik

#endif  // TAVIK_BASE_TUNING_BLOCK_H_
