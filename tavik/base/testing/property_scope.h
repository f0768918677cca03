// Sets a system property for the life of a scope and puts the old value back after it.
#ifndef TAVIK_BASE_TESTING_PROPERTY_SCOPE_H_
#define TAVIK_BASE_TESTING_PROPERTY_SCOPE_H_

#include <string>
#include <string_view>

namespace tavik::test {

class ScopedProperty {
 public:
  ScopedProperty(std::string_view name, std::string_view value);
  ~ScopedProperty();

  ScopedProperty(const ScopedProperty&) = delete;
  ScopedProperty& operator=(const ScopedProperty&) = delete;

 private:
  std::string name_;
  std::string previous_;
};

}  // namespace tavik::test

#endif  // TAVIK_BASE_TESTING_PROPERTY_SCOPE_H_
