#include "host/image/image_index.h"

#include <nlohmann/json.hpp>
#include <unordered_set>

#include "host/image/entry_path.h"
#include "host/json/json_cursor.h"
#include "host/json/json_writer.h"
#include "host/text/quoted_name.h"

namespace StandIn {

namespace {

bool IsPathOfArchives(const std::string& path) {
  return IsPathBelowRoot(path) && path != kArchivesPath &&
         !path.starts_with(std::string(kArchivesPath) + "/");
}

bool IsFileName(const std::string& name) {
  return IsPathBelowRoot("/" + name) && name.find('/') == std::string::npos;
}

// Reads the archives one after another, refusing what another one has.
class IndexReader {
 public:
  TardiskContent Read(const JsonCursor& place) {
    place.AllowOnly({"name", "paths"});
    TardiskContent content;
    content.name = ReadName(place.Member("name"));
    for (const JsonCursor& path : place.Member("paths").Items()) {
      content.paths.push_back(ReadPath(path));
    }
    return content;
  }

 private:
  std::string ReadName(const JsonCursor& place) {
    std::string name = DecodeBytes(place);
    if (!IsFileName(name)) {
      place.Fail(QuotedName(name) + " is not a file name");
    }
    if (!names_.insert(name).second) {
      place.Fail(QuotedName(name) + " stands twice");
    }
    return name;
  }

  std::string ReadPath(const JsonCursor& place) {
    std::string path = DecodeBytes(place);
    if (!IsPathOfArchives(path)) {
      place.Fail(QuotedName(path) + " is not a path that an archive can bring");
    }
    if (!paths_.insert(path).second) {
      place.Fail(QuotedName(path) + " stands twice");
    }
    return path;
  }

  std::unordered_set<std::string> names_;
  std::unordered_set<std::string> paths_;
};

}  // namespace

// Not as a document tree, which would take several times the memory of the index, and needs more to
// be destroyed.
std::string FormatImageIndex(const ImageIndex& index) {
  JsonWriter writer;
  writer.Begin(JsonWriter::Kind::kObject);
  writer.Begin("tardisks", JsonWriter::Kind::kArray);
  for (const TardiskContent& content : index.tardisks) {
    writer.Begin(JsonWriter::Kind::kObject);
    writer.Member("name", EncodeBytes(content.name));
    writer.Begin("paths", JsonWriter::Kind::kArray);
    for (const std::string& path : content.paths) writer.Item(EncodeBytes(path));
    writer.End();
    writer.End();
  }
  writer.End();
  writer.End();
  return writer.Text();
}

ImageIndex ParseImageIndex(const std::string& text, const std::string& file) {
  const nlohmann::json document = ParseJson(text, file);
  const JsonCursor whole(document, file);
  whole.AllowOnly({"tardisks"});
  ImageIndex index;
  IndexReader reader;
  for (const JsonCursor& place : whole.Member("tardisks").Items()) {
    index.tardisks.push_back(reader.Read(place));
  }
  return index;
}

}  // namespace StandIn
