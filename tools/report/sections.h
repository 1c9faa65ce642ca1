// The sections of a report, in the order in which they stand.
#pragma once

#include "tools/report/html.h"
#include "tools/report/report.h"
#include "tools/report/report_parts.h"

namespace SecPolicyTool {

// What everything is drawn from.
struct ReportContext {
  const Report& report;
  const TransitionGraph& graph;
  const Anchors& anchors;
};

Html OverviewSection(const ReportContext& context);
Html FindingsSection(const ReportContext& context);
Html GraphSection(const ReportContext& context);
// The drawing of that section; its domains link to their entries.
Html DrawingSvg(const ReportContext& context);
Html DomainsSection(const ReportContext& context);
Html LabelsSection(const ReportContext& context);
Html FilesSection(const ReportContext& context);
Html TardisksSection(const ReportContext& context);

}  // namespace SecPolicyTool
