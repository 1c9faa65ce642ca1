#include "host/root/image_index.h"

#include <nlohmann/json.hpp>

#include <unordered_set>

#include "host/archives/entry_path.h"
#include "host/json/json_stream.h"
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
  // An archive without its paths.
  TardiskContent Read(const JsonCursor& place) {
    place.AllowOnly({"name", "paths"});
    place.Member("paths").ExpectArray();
    return {ReadName(place.Member("name")), {}};
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

  std::unordered_set<std::string> names_;
  std::unordered_set<std::string> paths_;
};

}  // namespace

std::string FormatImageIndex(const ImageIndex& index) {
  JsonWriter writer;
  writer.Begin(JsonWriter::Kind::kObject);
  writer.Begin("tardisks", JsonWriter::Kind::kArray);
  for (const TardiskContent& content : index.tardisks) {
    writer.Begin(JsonWriter::Kind::kObject);
    writer.Member("name", EncodeBytes(content.name));
    writer.Begin("paths", JsonWriter::Kind::kArray);
    for (const std::string& path : content.paths) writer.String(EncodeBytes(path));
    writer.End();
    writer.End();
  }
  writer.End();
  writer.End();
  return writer.Text();
}

// There may be millions of paths.
ImageIndex ParseImageIndex(const TextReader& text, const std::string& file) {
  IndexReader reader;
  std::vector<std::vector<std::string>> paths;
  const auto takePath = [&](const JsonCursor& place, std::span<const std::size_t> indexes) {
    if (paths.size() <= indexes[0]) paths.resize(indexes[0] + 1);
    paths[indexes[0]].push_back(reader.ReadPath(place));
  };
  const JsonDocument document = ParseJsonBut({{{"tardisks", "*", "paths"}, takePath}}, text, file);
  const JsonCursor whole(document.Value(), file);
  whole.AllowOnly({"tardisks"});
  ImageIndex index;
  for (const JsonCursor& place : whole.Member("tardisks").Items()) {
    index.tardisks.push_back(reader.Read(place));
  }
  for (std::size_t i = 0; i < paths.size(); ++i) index.tardisks[i].paths = std::move(paths[i]);
  return index;
}

ImageIndex ParseImageIndex(const std::string& text, const std::string& file) {
  return ParseImageIndex(ReaderOf(text), file);
}

}  // namespace StandIn
