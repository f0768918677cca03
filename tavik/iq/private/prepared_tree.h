// A tuning tree with its packed messages unpacked once. The forest never changes after loading,
// so the static parameters and every leaf of a tree are unpacked when the tree is first evaluated
// and copied from then on, instead of being parsed again on every frame. A packed message that
// does not unpack is left packed: the request that reaches it unpacks it, and fails, as it always
// did, with the same status at the same moment.
#ifndef TAVIK_IQ_PRIVATE_PREPARED_TREE_H_
#define TAVIK_IQ_PRIVATE_PREPARED_TREE_H_

#include <atomic>
#include <memory>
#include <vector>

#include "google/protobuf/any.pb.h"
#include "google/protobuf/descriptor.h"
#include "google/protobuf/message.h"
#include "tavik/base/containers.h"
#include "tavik/iq/private/blend_plan.h"
#include "tavik/iq/protos/tuning_tree.pb.h"

namespace tavik {

class PreparedTree {
 public:
  // Unpacks the static parameters and the leaves of `tree`, which must outlive this object. Types
  // are taken from the packed messages' type URLs, among the generated messages.
  explicit PreparedTree(const vosbrine::TuningTree& tree);

  PreparedTree(const PreparedTree&) = delete;
  PreparedTree& operator=(const PreparedTree&) = delete;

  const vosbrine::TuningTree& tree() const { return tree_; }

  // What `packed`, a message of this tree, unpacks to when unpacked into a message of `type`;
  // null when it wasn't unpacked (another tree's message, a type other than `type`, or bytes that
  // don't parse).
  const google::protobuf::Message* Unpacked(const google::protobuf::Any& packed,
                                            const google::protobuf::Descriptor* type) const;

  // The blend plan of the leaves of `type`; null when they have none.
  const BlendPlan* PlanFor(const google::protobuf::Descriptor* type) const;

 private:
  void Unpack(const google::protobuf::Any& packed);
  void UnpackLevel(const vosbrine::Level& level);

  const vosbrine::TuningTree& tree_;
  FlatHashMap<const google::protobuf::Any*, std::unique_ptr<google::protobuf::Message>> unpacked_;
  // The distinct types of the leaves, with their plans; one in any real tree.
  std::vector<std::pair<const google::protobuf::Descriptor*, const BlendPlan*>> plans_;
};

// Any::UnpackTo of `packed` into `out`, through the copy that `prepared` holds when there is one:
// the same result and the same success, without parsing. `prepared` may be null.
bool UnpackFromPrepared(const google::protobuf::Any& packed, const PreparedTree* prepared,
                        google::protobuf::Message* out);
// The same, for a caller that knows `out_type`, the type of `out`.
bool UnpackFromPrepared(const google::protobuf::Any& packed, const PreparedTree* prepared,
                        const google::protobuf::Descriptor* out_type,
                        google::protobuf::Message* out);

// The prepared trees of one tree set, each made on its first use. Lock-free: threads that race on
// a first use may each prepare the tree; one of them is kept and shared by all.
class PreparedTreeSet {
 public:
  // `tree_set` must outlive this object.
  explicit PreparedTreeSet(const google::protobuf::Message& tree_set);
  ~PreparedTreeSet();

  PreparedTreeSet(const PreparedTreeSet&) = delete;
  PreparedTreeSet& operator=(const PreparedTreeSet&) = delete;

  const google::protobuf::Message& tree_set() const { return tree_set_; }
  // The tree set's, found once: a frame asks for them for every block.
  const google::protobuf::Descriptor* type() const { return type_; }
  const google::protobuf::Reflection* reflection() const { return reflection_; }

  // The prepared tree of `tree`, the TuningTree held by the tree set's field `field`.
  const PreparedTree& Get(const google::protobuf::FieldDescriptor* field,
                          const vosbrine::TuningTree& tree) const;

 private:
  const google::protobuf::Message& tree_set_;
  const google::protobuf::Descriptor* const type_;
  const google::protobuf::Reflection* const reflection_;
  // By field index.
  std::unique_ptr<std::atomic<const PreparedTree*>[]> trees_;
};

}  // namespace tavik

#endif  // TAVIK_IQ_PRIVATE_PREPARED_TREE_H_
