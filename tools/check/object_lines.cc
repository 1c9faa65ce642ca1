#include "tools/check/object_lines.h"

#include "host/module/module_error.h"

namespace SecPolicyTool {

using StandIn::LabelType;
using StandIn::ModuleError;

namespace {

// Whether the kernel takes the name.
bool CheckName(const Spot& spot, const std::string& name, CheckContext& context) {
  try {
    context.module.AddLabels({name}, LabelType::kObject);
    return true;
  } catch (const ModuleError& refusal) {
    context.findings.AddError(Kind::kRefusedName, spot, refusal.what(),
                              "Error in defining some objects",
                              "until it is mended, objects behind it are not defined either");
    return false;
  }
}

}  // namespace

DefinedObjects CheckObjectFiles(const CheckedDirectory& objects, CheckContext& context) {
  DefinedObjects defined;
  for (const CheckedFile& file : objects.files) {
    for (const PolicyLine& line : file.text.lines) {
      if (line.words.empty()) continue;
      if (line.words.size() > 1) {
        const std::string cause = "cannot define more than one object per line";
        context.findings.AddError(Kind::kWordCount, SpotFrom(file, line, 1), cause,
                                  AtLine(file.path, line.number, cause),
                                  "put each object on a line of its own");
        continue;
      }
      const std::string& name = line.words.front().text;
      const Spot spot = SpotOf(file, line);
      if (CheckName(spot, name, context)) defined.emplace(name, spot);
    }
  }
  return defined;
}

}  // namespace SecPolicyTool
