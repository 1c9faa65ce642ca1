#include "tools/report/report.h"

#include <openssl/evp.h>

#include <array>
#include <stdexcept>
#include <utility>

#include "tools/report/html.h"
#include "tools/report/report_assets.h"
#include "tools/report/sections.h"

namespace SecPolicyTool {

namespace {

// What a content security policy calls the text of a script or a style by.
std::string HashSource(const std::string& text) {
  std::array<unsigned char, EVP_MAX_MD_SIZE> hash{};
  unsigned int size = 0;
  if (EVP_Digest(text.data(), text.size(), hash.data(), &size, EVP_sha256(), nullptr) != 1) {
    throw std::runtime_error("the report cannot be made: SHA-256 is not available");
  }
  std::array<unsigned char, EVP_MAX_MD_SIZE * 2> encoded{};
  const int length = EVP_EncodeBlock(encoded.data(), hash.data(), static_cast<int>(size));
  return "'sha256-" + std::string(encoded.begin(), encoded.begin() + length) + "'";
}

// Nothing is fetched and nothing runs but these two, should a mistake ever let markup through.
std::string ContentPolicy() {
  return "default-src 'none'; style-src " + HashSource(kReportCss) + "; script-src " +
         HashSource(kReportJs) + "; img-src data:; base-uri 'none'; form-action 'none'";
}

Html Head(const Report& report) {
  return Element("head",
                 VoidElement("meta", {{"charset", "utf-8"}}) +
                     VoidElement("meta", {{"http-equiv", "Content-Security-Policy"},
                                          {"content", ContentPolicy()}}) +
                     VoidElement("meta", {{"name", "viewport"},
                                          {"content", "width=device-width, initial-scale=1"}}) +
                     VoidElement("meta", {{"name", "color-scheme"}, {"content", "light dark"}}) +
                     VoidElement("link", {{"rel", "icon"}, {"href", "data:,"}}) +
                     Element("title", "Security policy: " + report.source) +
                     Element("style", Html::TrustedMarkup(kReportCss)));
}

Html Navigation(const ReportContext& context) {
  Html links;
  const auto add = [&](const char* id, const char* title) {
    links += Element("a", {{"href", std::string("#") + id}}, title);
  };
  if (context.report.findings) add("findings", "Findings");
  add("graph", "Transitions");
  add("domains", "Domains");
  add("labels", "Labels");
  add("files", "Files");
  add("tardisks", "Tardisks");
  return Element("nav", {{"aria-label", "Sections"}}, links);
}

// Hidden until the script can answer it.
Html SearchBox() {
  return Element("form", {{"id", "search"}, {"role", "search"}, {"hidden", ""}},
                 Element("label", {{"for", "query"}}, "Search") +
                     VoidElement("input", {{"id", "query"},
                                           {"type", "search"},
                                           {"autocomplete", "off"},
                                           {"spellcheck", "false"},
                                           {"placeholder", "Domain, rule, label, path"}}) +
                     Element("output", {{"id", "matches"}, {"for", "query"}}, {}));
}

Html Body(const ReportContext& context) {
  const Html bar = Element("div", {{"class", "bar"}},
                           Element("div", {{"class", "wide"}}, SearchBox() + Navigation(context)));
  // In the order of the navigation; each is gone once it is a part of the page.
  Html sections = OverviewSection(context);
  for (const auto section : {FindingsSection, GraphSection, DomainsSection, LabelsSection,
                             FilesSection, TardisksSection}) {
    sections += section(context);
  }
  return Element("body", bar + Element("main", {{"class", "wide"}}, std::move(sections)) +
                             Element("script", Html::TrustedMarkup(kReportJs)));
}

}  // namespace

std::string ReportPage(const Report& report) {
  const TransitionGraph graph(report.policy);
  const Anchors anchors(report.policy, graph);
  const ReportContext context{report, graph, anchors};
  const Html page = Element("html", {{"lang", "en"}}, Head(report) + Body(context));
  return "<!DOCTYPE html>\n" + page.Markup() + "\n";
}

}  // namespace SecPolicyTool
