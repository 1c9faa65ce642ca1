#include "tests/tools/schema.h"

#include "tests/tools/command_fixture.h"

namespace SecPolicyTool {

std::string SchemaProblem(const std::string& text, const std::string& schema) {
  static constexpr char kProgram[] =
      "import json, sys, jsonschema\n"
      "schema = json.load(open(sys.argv[1]))\n"
      "cls = jsonschema.validators.validator_for(schema)\n"
      "cls.check_schema(schema)\n"
      "errors = list(cls(schema).iter_errors(json.load(open(sys.argv[2]))))\n"
      "for error in errors[:5]:\n"
      "  print('/'.join(map(str, error.absolute_path)), error.message[:300])\n"
      "print(len(errors), 'errors', file=sys.stderr)\n";
  const StandIn::TemporaryDirectory directory;
  const std::string file = directory.Path() + "/content.json";
  StandIn::WriteBytes(file, text);
  // The distribution's own Python, which has the distribution's packages.
  const Result result = RunProgram("/usr/bin/python3", {"-c", kProgram, schema, file}, [] {});
  // It has to say that it looked.
  return result.status == 0 && result.err == "0 errors\n" ? "" : result.out + result.err;
}

std::string JsonProblem(const std::string& text, const std::string& verb) {
  return SchemaProblem(text, std::string(SECPOLICY_SCHEMAS) + "/" + verb + ".schema.json");
}

}  // namespace SecPolicyTool
