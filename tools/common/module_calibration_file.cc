#include "tools/common/module_calibration_file.h"

#include <fstream>
#include <sstream>

#include "google/protobuf/io/tokenizer.h"
#include "google/protobuf/text_format.h"
#include "tavik/base/strings.h"
#include "tools/common/module_calibration.pb.h"

namespace tavik::tools {
namespace {

class ErrorCollector : public google::protobuf::io::ErrorCollector {
 public:
  explicit ErrorCollector(const std::string& path) : path_(path) {}
  void AddError(int line, google::protobuf::io::ColumnNumber column,
                const std::string& message) override {
    if (first_.empty()) first_ = StrCat(path_, ":", line + 1, ":", column + 1, ": ", message);
  }
  const std::string& first() const { return first_; }

 private:
  const std::string& path_;
  std::string first_;
};

}  // namespace

StatusOr<ModuleCalibrationMap> ReadModuleCalibrationFile(const std::string& path) {
  std::ifstream in(path);
  if (!in) return NotFoundError(StrCat(path, ": cannot open"));
  std::ostringstream text;
  text << in.rdbuf();

  ModuleCalibrationSet set;
  ErrorCollector errors(path);
  google::protobuf::TextFormat::Parser parser;
  parser.RecordErrorsTo(&errors);
  if (!parser.ParseFromString(text.str(), &set)) {
    return InvalidArgumentError(errors.first().empty() ? StrCat(path, ": not valid text format")
                                                       : errors.first());
  }

  ModuleCalibrationMap map;
  for (const ModuleCalibration& module : set.modules()) {
    TuningSensorKey key{module.sensor_name(),
                        {module.facing(), module.lens_type(), module.sensor_kind()}};
    tavik_api::LensShadingCalibrationData data;
    data.width = module.width();
    data.height = module.height();
    data.grid_gain_r.assign(module.grid_gain_r().begin(), module.grid_gain_r().end());
    data.grid_gain_gr.assign(module.grid_gain_gr().begin(), module.grid_gain_gr().end());
    data.grid_gain_gb.assign(module.grid_gain_gb().begin(), module.grid_gain_gb().end());
    data.grid_gain_b.assign(module.grid_gain_b().begin(), module.grid_gain_b().end());
    data.full_width = module.full_width();
    data.full_height = module.full_height();
    data.crop_width = module.crop_width();
    data.crop_height = module.crop_height();
    data.crop_left = module.crop_left();
    data.crop_top = module.crop_top();
    if (!map.try_emplace(std::move(key), std::move(data)).second) {
      return InvalidArgumentError(
          StrCat(path, ": two modules of sensor ", module.sensor_name(), " facing ",
                 module.facing(), " lens_type ", module.lens_type()));
    }
  }
  return map;
}

}  // namespace tavik::tools
