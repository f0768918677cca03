#include "tools/tavik-tune/eval.h"

#include <cstdlib>
#include <memory>

#include "google/protobuf/message.h"
#include "tavik/base/strings.h"
#include "tavik/iq/tuning_provider_base.h"
#include "tavik/iq/zel/sensor_eeprom_data.h"
#include "tavik/iq/zel/tuning_provider.h"
#include "tools/common/module_calibration_file.h"
#include "tools/tavik-tune/proto_files.h"

namespace tavik::tune {
namespace {

// Command-line names of the coordinates that differ from their field's name with dashes.
std::string CoordinateField(std::string flag) {
  if (flag == "gain") return "real_gain";
  if (flag == "led") return "led_influence";
  for (char& c : flag) {
    if (c == '-') c = '_';
  }
  return flag;
}

template <typename Enum>
Status ParseEnum(const google::protobuf::EnumDescriptor* type, const std::string& name,
                 Enum* value) {
  const google::protobuf::EnumValueDescriptor* found = type->FindValueByName(name);
  if (found == nullptr) {
    return InvalidArgumentError(StrCat("unknown ", type->name(), " '", name, "'"));
  }
  *value = static_cast<Enum>(found->number());
  return OkStatus();
}

}  // namespace

const char kEvalHelp[] =
    "Loads the tuning files of DIR as the controller does and prints each block filled for the\n"
    "use case at the camera state: the nearest use case when it has no file of its own, the\n"
    "tree interpolated when the block is enabled, its first leaf when not.\n"
    "\n"
    "  --sensor S, --mode M, --usecase U   the use case (enum names), all three required\n"
    "  --cct, --gain, --bv, --led, --exp-ratio, --scaler-ratio, --mired-cct,\n"
    "  --pre-scaler-ratio, --frame-count, --exposure-time-msecs   coordinates (default 0)\n"
    "  --block NAME   a block by message (GammaTuning) or tree field (gamma); repeatable;\n"
    "                 all blocks when none is given\n"
    "  --calibration FILE   a device's module calibration (tavik.tools.ModuleCalibrationSet\n"
    "                 in protobuf text), applied to the shading tuning as on the device\n"
    "  --device NAME  the device, which names the calibration's sensors (default: none)\n";

StatusOr<EvalRequest> ParseEvalArgs(const std::vector<std::string>& args) {
  EvalRequest request;
  bool has_sensor = false, has_mode = false, has_usecase = false;
  for (size_t i = 0; i < args.size(); ++i) {
    const std::string& arg = args[i];
    if (arg.rfind("--", 0) != 0) {
      request.paths.push_back(arg);
      continue;
    }
    if (i + 1 >= args.size()) return InvalidArgumentError(StrCat(arg, " needs a value"));
    const std::string& value = args[++i];
    const std::string flag = arg.substr(2);
    vosbrine::TuningUsecase& usecase = request.usecase;
    if (flag == "sensor") {
      vosbrine::CameraSensor sensor = vosbrine::INVALID_CAMERA_SENSOR;
      if (Status s = ParseEnum(vosbrine::CameraSensor_descriptor(), value, &sensor); !s.ok()) {
        return s;
      }
      usecase.set_camera_sensor(sensor);
      has_sensor = true;
    } else if (flag == "mode") {
      vosbrine::SensorMode mode = vosbrine::INVALID_SENSOR_MODE;
      if (Status s = ParseEnum(vosbrine::SensorMode_descriptor(), value, &mode); !s.ok()) return s;
      usecase.set_sensor_mode(mode);
      has_mode = true;
    } else if (flag == "usecase") {
      vosbrine::CameraUsecase camera_usecase = vosbrine::INVALID_CAMERA_USECASE;
      if (Status s = ParseEnum(vosbrine::CameraUsecase_descriptor(), value, &camera_usecase);
          !s.ok()) {
        return s;
      }
      usecase.set_camera_usecase(camera_usecase);
      has_usecase = true;
    } else if (flag == "calibration") {
      request.calibration_path = value;
    } else if (flag == "device") {
      request.device_name = value;
    } else if (flag == "block") {
      const BlockType* block = FindBlockType(value);
      if (block == nullptr) return InvalidArgumentError(StrCat("unknown block '", value, "'"));
      request.blocks.push_back(block);
    } else {
      vosbrine::LevelCoordinates* coordinates = request.state.mutable_level_coordinates();
      const auto* field = coordinates->GetDescriptor()->FindFieldByName(CoordinateField(flag));
      if (field == nullptr) return InvalidArgumentError(StrCat("unknown option ", arg));
      char* end = nullptr;
      const float number = std::strtof(value.c_str(), &end);
      if (value.empty() || *end != '\0') {
        return InvalidArgumentError(StrCat(arg, " takes a number, not '", value, "'"));
      }
      coordinates->GetReflection()->SetFloat(coordinates, field, number);
    }
  }
  if (request.paths.empty()) return InvalidArgumentError("no tuning directory given");
  if (!has_sensor || !has_mode || !has_usecase) {
    return InvalidArgumentError("--sensor, --mode and --usecase are all required");
  }
  if (request.blocks.empty()) {
    for (const BlockType& block : AllBlockTypes()) request.blocks.push_back(&block);
  }
  return request;
}

Status RunEval(const EvalRequest& request, std::ostream& out) {
  std::shared_ptr<vosbrine::SensorEepromDataMap> eeprom_data;
  if (!request.calibration_path.empty()) {
    StatusOr<tools::ModuleCalibrationMap> calibration =
        tools::ReadModuleCalibrationFile(request.calibration_path);
    if (!calibration.ok()) return calibration.status();
    eeprom_data = BuildTuningEepromData(request.device_name, *calibration, /*dump=*/false);
    if (eeprom_data == nullptr) {
      return InvalidArgumentError(StrCat(request.calibration_path,
                                         ": no module of a known sensor with a usable grid"));
    }
  }
  StatusOr<std::unique_ptr<vosbrine::zelmondrake::TuningProvider>> provider =
      // Directories expanded here, in the runtime's order, so that "." and ".." don't show up
      // as rejected files.
      vosbrine::zelmondrake::TuningProvider::Create(ExpandPaths(request.paths),
                                                    eeprom_data.get());
  if (!provider.ok()) return provider.status();

  // Production takes the nearest key; say which one it took.
  const google::protobuf::Message* tree_set =
      (*provider)->GetTuningTreeSet(request.usecase, /*fallback=*/true);
  const std::string wanted = vosbrine::EncodeUsecaseKey(request.usecase);
  for (const auto& [key, message] : (*provider)->forest()) {
    if (message.get() != tree_set) continue;
    out << "# use case: " << key;
    if (key != wanted) out << " (nearest to " << wanted << ")";
    out << "\n";
  }
  out << "# camera state: " << request.state.level_coordinates().ShortDebugString() << "\n";

  Status first_failure;
  for (const BlockType* block : request.blocks) {
    std::unique_ptr<google::protobuf::Message> message(
        google::protobuf::MessageFactory::generated_factory()->GetPrototype(block->message)->New());
    const Status status = (*provider)->FillSubBlockTuning(
        request.usecase, request.state, message.get(), /*fallback=*/true, /*bypassed=*/false);
    out << "# " << block->message->name();
    if (!status.ok()) out << " (failed: " << status.message() << ")";
    out << "\n" << ToText(*message);
    if (!status.ok() && first_failure.ok()) first_failure = status;
  }
  return first_failure;
}

}  // namespace tavik::tune
