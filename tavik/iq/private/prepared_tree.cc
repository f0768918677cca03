#include "tavik/iq/private/prepared_tree.h"

#include <string>
#include <utility>

namespace tavik {

using google::protobuf::Any;
using google::protobuf::Descriptor;
using google::protobuf::FieldDescriptor;
using google::protobuf::Message;

PreparedTree::PreparedTree(const vosbrine::TuningTree& tree) : tree_(tree) {
  Unpack(tree.static_param());
  if (tree.has_dynamic_top_level()) UnpackLevel(tree.dynamic_top_level());
}

void PreparedTree::Unpack(const Any& packed) {
  // Any::UnpackTo accepts a message whose full name follows the URL's last '/'.
  const std::string& url = packed.type_url();
  const size_t slash = url.rfind('/');
  if (slash == std::string::npos) return;
  const Descriptor* type =
      google::protobuf::DescriptorPool::generated_pool()->FindMessageTypeByName(
          url.substr(slash + 1));
  if (type == nullptr) return;
  const Message* prototype =
      google::protobuf::MessageFactory::generated_factory()->GetPrototype(type);
  if (prototype == nullptr) return;
  std::unique_ptr<Message> message(prototype->New());
  // As Any::UnpackTo parses.
  if (!message->ParseFromString(packed.value())) return;
  unpacked_.try_emplace(&packed, std::move(message));
}

void PreparedTree::UnpackLevel(const vosbrine::Level& level) {
  for (const vosbrine::Node& node : level.nodes()) {
    if (node.has_child_level()) {
      UnpackLevel(node.child_level());
    } else if (node.has_dynamic_param()) {
      Unpack(node.dynamic_param());
      const auto leaf = unpacked_.find(&node.dynamic_param());
      if (leaf == unpacked_.end()) continue;
      const Descriptor* type = leaf->second->GetDescriptor();
      bool known = false;
      for (const auto& [planned_type, plan] : plans_) known = known || planned_type == type;
      if (!known) plans_.emplace_back(type, BlendPlan::ForGeneratedType(type));
    }
  }
}

const Message* PreparedTree::Unpacked(const Any& packed, const Descriptor* type) const {
  const auto found = unpacked_.find(&packed);
  if (found == unpacked_.end() || found->second->GetDescriptor() != type) return nullptr;
  return found->second.get();
}

const BlendPlan* PreparedTree::PlanFor(const Descriptor* type) const {
  for (const auto& [planned_type, plan] : plans_) {
    if (planned_type == type) return plan;
  }
  return nullptr;
}

bool UnpackFromPrepared(const Any& packed, const PreparedTree* prepared, Message* out) {
  return UnpackFromPrepared(packed, prepared, out->GetDescriptor(), out);
}

bool UnpackFromPrepared(const Any& packed, const PreparedTree* prepared, const Descriptor* out_type,
                        Message* out) {
  if (prepared != nullptr) {
    if (const Message* unpacked = prepared->Unpacked(packed, out_type)) {
      // Clears `out` first, as parsing does, and copies bit for bit. Not CopyFrom, which first
      // walks the whole source to check that it isn't part of `out`.
      out->Clear();
      out->MergeFrom(*unpacked);
      return true;
    }
  }
  return packed.UnpackTo(out);
}

PreparedTreeSet::PreparedTreeSet(const Message& tree_set)
    : tree_set_(tree_set),
      type_(tree_set.GetDescriptor()),
      reflection_(tree_set.GetReflection()),
      trees_(new std::atomic<const PreparedTree*>[type_->field_count()]) {
  for (int i = 0; i < type_->field_count(); ++i) trees_[i] = nullptr;
}

PreparedTreeSet::~PreparedTreeSet() {
  for (int i = 0; i < type_->field_count(); ++i) delete trees_[i].load();
}

const PreparedTree& PreparedTreeSet::Get(const FieldDescriptor* field,
                                         const vosbrine::TuningTree& tree) const {
  std::atomic<const PreparedTree*>& slot = trees_[field->index()];
  const PreparedTree* prepared = slot.load(std::memory_order_acquire);
  if (prepared != nullptr) return *prepared;
  auto fresh = std::make_unique<PreparedTree>(tree);
  if (slot.compare_exchange_strong(prepared, fresh.get(), std::memory_order_acq_rel,
                                   std::memory_order_acquire)) {
    return *fresh.release();
  }
  // Another thread published first; its tree is the one everybody uses.
  return *prepared;
}

}  // namespace tavik
