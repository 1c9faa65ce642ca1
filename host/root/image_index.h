// The content of image.json: which archive brought which path of the root file system.
#pragma once

#include <string>
#include <vector>

#include "host/json/text_reader.h"

namespace StandIn {

// Where the root file system has the archives themselves.
inline constexpr char kArchivesPath[] = "/tardisks";
// Where it has the policies that tardisks bring.
inline constexpr char kTardiskPolicyDir[] = "/etc/olvane/secpolicy/tardisks";

// An archive and the paths in the root file system that are its own, in byte order. They begin with
// "/" and are as EntryPath makes them.
struct TardiskContent {
  std::string name;
  std::vector<std::string> paths;

  bool operator==(const TardiskContent&) const = default;
};

// All archives, in byte order of their names. "/", kArchivesPath and the archives below it are in
// the root file system as well, but belong to none.
struct ImageIndex {
  std::vector<TardiskContent> tardisks;

  bool operator==(const ImageIndex&) const = default;
};

// An index as JSON:
//
//   {"tardisks": [{"name": "base.tar", "paths": ["/etc", "/etc/motd"]}, ...]}
//
// Names and paths are written by EncodeBytes.
std::string FormatImageIndex(const ImageIndex& index);

// Reads that again. Throws HostError "FILE:LINE:COLUMN: ..." or "FILE: PLACE: ..." for anything
// else: other members, names and paths that Assemble would not write, and whatever stands twice.
ImageIndex ParseImageIndex(const TextReader& text, const std::string& file);
ImageIndex ParseImageIndex(const std::string& text, const std::string& file);

}  // namespace StandIn
