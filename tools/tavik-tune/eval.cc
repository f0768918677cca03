#include "tools/tavik-tune/eval.h"

#include <algorithm>
#include <array>
#include <cstdlib>
#include <memory>

#include "google/protobuf/message.h"
#include "tavik/base/strings.h"
#include "tavik/iq/tuning_provider_base.h"
#include "tavik/iq/zel/sensor_eeprom_data.h"
#include "tavik/iq/zel/tuning_provider.h"
#include "tavik/iq/zel/zel_block_list.h"
#include "tavik/iq/zel/zel_tuning_block.h"
#include "tools/common/hardware_values.h"
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
    "  --device NAME  the device, which names the calibration's sensors (default: none)\n"
    "  --translate    also run the block's translators and print their hardware values:\n"
    "                 each field, tables in full, and the raw words of the record in hex\n"
    "  --bayer-pattern P, --sensor-type T, --bit-depth N, --digital-gain G\n"
    "                 the frame facts of the translators (RGGB, SENSOR_TYPE_BAYER, 10, 1.0)\n";

StatusOr<EvalRequest> ParseEvalArgs(const std::vector<std::string>& args) {
  EvalRequest request;
  bool has_sensor = false, has_mode = false, has_usecase = false;
  for (size_t i = 0; i < args.size(); ++i) {
    const std::string& arg = args[i];
    if (arg.rfind("--", 0) != 0) {
      request.paths.push_back(arg);
      continue;
    }
    if (arg == "--translate") {
      request.translate = true;
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
    } else if (flag == "bayer-pattern") {
      if (Status s = ParseEnum(vosbrine::BayerPattern_descriptor(), value,
                               &request.frame_facts.bayer_pattern);
          !s.ok()) {
        return s;
      }
    } else if (flag == "sensor-type") {
      if (Status s =
              ParseEnum(vosbrine::SensorType_descriptor(), value, &request.frame_facts.sensor_type);
          !s.ok()) {
        return s;
      }
    } else if (flag == "bit-depth" || flag == "digital-gain") {
      char* end = nullptr;
      const float number = std::strtof(value.c_str(), &end);
      if (value.empty() || *end != '\0') {
        return InvalidArgumentError(StrCat(arg, " takes a number, not '", value, "'"));
      }
      if (flag == "bit-depth") {
        request.frame_facts.sensor_bit_depth = static_cast<int32_t>(number);
      } else {
        request.frame_facts.digital_gain = number;
      }
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
      return InvalidArgumentError(
          StrCat(request.calibration_path, ": no module of a known sensor with a usable grid"));
    }
  }
  StatusOr<std::unique_ptr<vosbrine::zelmondrake::TuningProvider>> provider =
      // Directories expanded here, in the runtime's order, so that "." and ".." don't show up
      // as rejected files.
      vosbrine::zelmondrake::TuningProvider::Create(ExpandPaths(request.paths), eeprom_data.get());
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
  auto keep_first = [&first_failure](const Status& status) {
    if (!status.ok() && first_failure.ok()) first_failure = status;
  };
  // The blocks of the frame as the controller makes them, typed blocks holding the filled
  // messages: the printed ones, and with --translate all of them, as a translator may also read
  // blocks besides its own.
  std::array<std::unique_ptr<TuningBlock>, kZelBlockCount> blocks;
  std::array<Status, kZelBlockCount> fill_status;
  TranslatorFrame frame;
  frame.facts = request.frame_facts;
  ForEachZelBlockType([&]<size_t Position, typename T>() {
    const bool printed =
        std::any_of(request.blocks.begin(), request.blocks.end(),
                    [](const BlockType* block) { return block->message == T::descriptor(); });
    if (!printed && !request.translate) return;
    auto block = std::make_unique<ZelTuningBlock<T>>();
    fill_status[Position] = (*provider)->FillSubBlockTuning(
        request.usecase, request.state, &block->message, /*fallback=*/true, /*bypassed=*/false);
    if (fill_status[Position].ok()) frame.blocks[Position] = block.get();
    blocks[Position] = std::move(block);
  });
  for (const BlockType* block : request.blocks) {
    ForEachZelBlockType([&]<size_t Position, typename T>() {
      if (T::descriptor() != block->message) return;
      const Status& status = fill_status[Position];
      out << "# " << block->message->name();
      if (!status.ok()) out << " (failed: " << status.message() << ")";
      out << "\n" << ToText(static_cast<const ZelTuningBlock<T>&>(*blocks[Position]).message);
      keep_first(status);
      if (!request.translate || !status.ok()) return;
      for (const TranslatorForm* form : TranslatorTable()) {
        if (form->block != Position) continue;
        TranslatorRecords records(*form);
        const Status translated = records.Translate(frame);
        out << "## " << form->name;
        if (!translated.ok()) out << " (failed: " << translated.message() << ")";
        out << "\n";
        if (translated.ok()) out << tools::HardwareValues::Of(records).ToText();
        keep_first(translated);
      }
    });
  }
  return first_failure;
}

}  // namespace tavik::tune
