// The word lists that words of rules are judged by: their names, and what stands in them unless a
// host file says otherwise.
#pragma once

#include <array>
#include <string>
#include <vector>

#include "host/module/security_module.h"

namespace StandIn {

// A list's key under "words" in a host file, and what one of its words is called in messages.
struct WordListInfo {
  WordList list;
  const char* key;
  const char* title;
};

// All lists, in the order of their numbers. The object labels are not a host file's to list.
inline constexpr std::array<WordListInfo, 8> kWordLists{{
    {WordList::kObjects, nullptr, "object label"},
    {WordList::kCapabilities, "capabilities", "capability"},
    {WordList::kParamCapabilities, "paramCapabilities", "capability with parameter"},
    {WordList::kObjectAccesses, "objectAccesses", "object access"},
    {WordList::kTransitionEvents, "transitionEvents", "transition event"},
    {WordList::kFileTypes, "fileTypes", "file type"},
    {WordList::kSocketTypes, "socketTypes", "socket type"},
    {WordList::kSyscalls, "systemCalls", "system call"},
}};

// The entry of a list; nullptr for a number that is no list.
const WordListInfo* InfoOf(WordList list);

// The words of a list on this machine: its architecture's system calls in the order of their
// numbers, the capabilities known here in the order of theirs, fixed words for the rest. Empty for
// the object labels.
std::vector<std::string> DefaultWords(WordList list);

// `unknown TITLE "WORD" (nearest: NEAREST)`, or without the bracket when no word of the list is
// near.
std::string UnknownWordText(WordList list, const std::string& word,
                            const std::vector<std::string>& words);

}  // namespace StandIn
