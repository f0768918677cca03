// Evaluation of a tuning tree at a camera state. At each level the coordinate of the level's type
// falls inside a region (whose value holds flat) or in the gap between two regions (whose values
// are blended linearly). The blend knows no block schema: it walks the messages by reflection and
// blends every float field, which is why it lives beside a generic message traversal.
#ifndef TAVIK_IQ_PRIVATE_INTERPOLATOR_H_
#define TAVIK_IQ_PRIVATE_INTERPOLATOR_H_

#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "google/protobuf/message.h"
#include "tavik/base/status.h"
#include "tavik/iq/export.h"
#include "tavik/iq/private/prepared_tree.h"
#include "tavik/iq/protos/camera_state.pb.h"
#include "tavik/iq/protos/tuning_tree.pb.h"

namespace tavik {

// One step of the path from the root message to the field being visited.
struct MutableTraversalPathNode {
  google::protobuf::Message* message;  // The message that holds `field`.
  const google::protobuf::FieldDescriptor* field;
  // Index of `message` within the repeated field that holds it; unset when it is not a repeated
  // element. It therefore stands one node below the repeated field's own node.
  std::optional<int> index;
};

// Called for every field; `field_path` is the dotted name of the field ("a.b"), `path` the nodes
// from the root through this field. Returns whether to go into a message field.
using MutableTraversalVisitor = std::function<bool(
    const std::string* field_path, std::vector<MutableTraversalPathNode>* path,
    const google::protobuf::FieldDescriptor* field, google::protobuf::Message* message)>;

// Evaluates `tree`'s dynamic levels at `state` into `out_dynamic_msg`, a message of the type that
// the leaves pack. On failure `out_dynamic_msg` holds what was reached.
TAVIK_EXPORT Status InterpolateTree(const vosbrine::TuningTree& tree,
                                    const vosbrine::CameraState& state,
                                    google::protobuf::Message* out_dynamic_msg);

// The same evaluation of a prepared tree: leaves are copied rather than parsed, and blends follow
// the leaves' blend plan (or the reflection walk while verbose logging is on, for its lines).
// Results, statuses and error lines are those of the evaluation of tree.tree().
Status InterpolateTree(const PreparedTree& tree, const vosbrine::CameraState& state,
                       google::protobuf::Message* out_dynamic_msg);

// out = blend of msg1 (at x1) and msg2 (at x2) at x: every float field that is not deprecated
// becomes (1 - t) * a + t * b with t = (x - x1) / (x2 - x1) clamped to [0, 1]; every other field
// keeps msg1's value. Returns false only for a null `out` or messages of different types; a field
// that can't be blended is logged and keeps msg1's value. `out` may be `&msg1`.
TAVIK_EXPORT bool LinearInterpolateMessage(const google::protobuf::Message& msg1,
                                           const google::protobuf::Message& msg2, float x1,
                                           float x2, float x, google::protobuf::Message* out);

// The blend of LinearInterpolateMessage for 0 < t < 1, by the reflection walk: out = (1 - t) * out
// + t * msg2 on every float field. BlendPlan::Blend gives the same bits and lines.
void BlendMessagesByReflection(const google::protobuf::Message& msg2, float t,
                               google::protobuf::Message* out);

// Visits every field of `message` depth first, in declaration order, set or not (then the set
// extensions), going into set submessages where the visitor asks for it.
TAVIK_EXPORT void TraverseMutableMessageWithPath(google::protobuf::Message* message,
                                                 const MutableTraversalVisitor& visitor);

}  // namespace tavik

#endif  // TAVIK_IQ_PRIVATE_INTERPOLATOR_H_
