// The verbs of the command, one file each.
#pragma once

#include "tools/command_line/command_line.h"

namespace SecPolicyTool {

// Each describes its verb. What a verb throws is reported by main and ends the command with
// kFailed.
CommandLine CheckVerb();
CommandLine DiffVerb();
CommandLine DigestVerb();
CommandLine DomainVerb();
CommandLine FilesVerb();
CommandLine GraphVerb();
CommandLine HostAssembleVerb();
CommandLine HostInfoVerb();
CommandLine HostInitVerb();
CommandLine LabelVerb();
CommandLine LoadVerb();
CommandLine MayVerb();
CommandLine PathsVerb();
CommandLine ReportVerb();
CommandLine SearchVerb();
CommandLine ShowVerb();
CommandLine TestVerb();
CommandLine WhoVerb();

// `line` is the description of the whole command, and has to live as long as the verb's.
CommandLine CompletionVerb(const CommandLine& line);

}  // namespace SecPolicyTool
