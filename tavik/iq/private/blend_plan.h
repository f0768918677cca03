// The blend of two tuning messages of one type, compiled once per type: the float fields to blend
// and the submessages to enter, resolved from the descriptor so that a blend on the frame path
// walks a short list instead of discovering the schema by reflection each time. It gives the
// reflection walk's results bit for bit, and its error lines; types whose walk has quirks that a
// list can't follow (oneofs, maps, extensions, messages nested in repeated messages, recursion)
// get no plan and stay with the walk.
#ifndef TAVIK_IQ_PRIVATE_BLEND_PLAN_H_
#define TAVIK_IQ_PRIVATE_BLEND_PLAN_H_

#include <memory>
#include <string>
#include <vector>

#include "google/protobuf/descriptor.h"
#include "google/protobuf/message.h"

namespace tavik {

// (1 - t) * a + t * b as two single-precision products and one sum. The library is built with
// -ffp-contract=off, so the compiler may not fuse them into a multiply-add.
inline float BlendFloat(float a, float b, float t) {
  const float weight_a = (1.0f - t) * a;
  const float weight_b = t * b;
  return weight_a + weight_b;
}

// out[i] = BlendFloat(out[i], source[i], t); vectorises when the two don't overlap.
inline void BlendFloats(float* out, const float* source, int size, float t) {
  for (int i = 0; i < size; ++i) out[i] = BlendFloat(out[i], source[i], t);
}

class BlendPlan {
 public:
  // The plan of `type`, or null when only the reflection walk blends it as required.
  static std::unique_ptr<BlendPlan> Compile(const google::protobuf::Descriptor* type);

  // The plan of a generated message type, compiled on first use and kept for the process; null
  // as Compile, and for types of other pools (whose descriptors may go away).
  static const BlendPlan* ForGeneratedType(const google::protobuf::Descriptor* type);

  ~BlendPlan();

  const google::protobuf::Descriptor* type() const { return type_; }

  // out = (1 - t) * out + t * source on every float field that is not deprecated, going into the
  // submessages that `out` has. `out` and `source` are of type(); 0 < t < 1.
  void Blend(google::protobuf::Message* out, const google::protobuf::Message& source,
             float t) const;

 private:
  struct Step;
  struct Node;

  explicit BlendPlan(const google::protobuf::Descriptor* type);

  // The steps of `type` at `prefix`; null when the walk does something there that steps can't
  // follow. `open` holds the types being compiled, to refuse recursion.
  static std::unique_ptr<Node> CompileNode(const google::protobuf::Descriptor* type,
                                           const std::string& prefix,
                                           std::vector<const google::protobuf::Descriptor*>* open);

  const google::protobuf::Descriptor* type_;
  std::unique_ptr<Node> root_;
};

}  // namespace tavik

#endif  // TAVIK_IQ_PRIVATE_BLEND_PLAN_H_
