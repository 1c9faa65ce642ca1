// The files report.css and report.js, as they are built in.
#pragma once

namespace SecPolicyTool {

extern const char* const kReportCss;
extern const char* const kReportJs;

}  // namespace SecPolicyTool
