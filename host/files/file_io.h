// Reading and replacing of whole files.
#pragma once

#include <functional>
#include <optional>
#include <string>
#include <string_view>

#include "host/files/directory.h"
#include "host/json/text_reader.h"

namespace StandIn {

// Opens the regular file `name` in `dir` for reading; the result is closed when there is no such
// file. Never waits, whatever has the name. Throws HostError "DIR/NAME: cannot be opened: REASON"
// or "DIR/NAME: not a regular file".
UniqueFd OpenFileIfThere(const DirectoryRef& dir, const std::string& name);

// The content of that file; nothing when there is none. Throws HostError as above, or "DIR/NAME:
// cannot be read: REASON".
std::optional<std::string> ReadFileIfThere(const DirectoryRef& dir, const std::string& name);

// As above for a file that has to be there: its absence is HostError "DIR/NAME: cannot be opened:
// No such file or directory".
std::string ReadFile(const DirectoryRef& dir, const std::string& name);

// Hands over the open file `fd`, which messages call `file`, from its current position to its end.
// Throws HostError "FILE: cannot be read: REASON".
void ReadBlocks(int fd, const std::string& file,
                const std::function<void(std::string_view block)>& sink);

// The same as one text.
std::string ReadAll(int fd, const std::string& file);

// The same file, to be read as often as needed; `fd` must stay open meanwhile. The reader throws
// the same error.
TextReader ReaderOf(int fd, const std::string& file);

// Who else may be replacing the same file.
enum class Writers {
  kSeveral,  // anybody, at the same time: the later one wins
  kOne,      // nobody: a lock sees to that
};

// Who may read the new file.
enum class Readers {
  kByMask,     // whom the process's mask leaves
  kEverybody,  // everybody, whatever the mask: mode 0644
};

// Makes the file `name` in `dir`, whole and synced as below; false when something has that name
// already, which stays. Throws HostError as below.
bool MakeFileIfMissing(const DirectoryRef& dir, const std::string& name, const std::string& text);

// Gives the file `name` in `dir` the content `text`: as a new file, which is synced and then takes
// the name, whereupon the directory is synced. Whoever reads the name sees the old content or the
// new one whole, also when this process or the machine stops at any moment. What a process that was
// stopped half-way left, nobody reads; where there is one writer at a time, it goes with the next
// replacement.
//
// Throws HostError "DIR/NAME: cannot be written: REASON". The old file is then untouched and
// nothing of the new one remains (except when the last step, syncing the directory, failed: the new
// content has the name then, but may not survive a power failure).
void ReplaceFile(const DirectoryRef& dir, const std::string& name, const std::string& text,
                 Writers writers = Writers::kSeveral, Readers readers = Readers::kByMask);

// As above with a text of which `write` hands one part after another to its sink. What `write`
// throws, this throws; the old file is then untouched and nothing of the new one remains.
void ReplaceFile(const DirectoryRef& dir, const std::string& name, const TextWriter& write,
                 Writers writers = Writers::kSeveral, Readers readers = Readers::kByMask);

}  // namespace StandIn
