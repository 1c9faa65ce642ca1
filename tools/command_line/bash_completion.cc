// Completion for bash.
#include <functional>

#include "tools/command_line/command_line.h"

namespace SecPolicyTool {

namespace {

std::string Joined(const std::vector<std::string>& words) {
  std::string text;
  for (const std::string& word : words) text += (text.empty() ? "" : " ") + word;
  return text;
}

// What bash is to offer for a value.
std::string Offer(const CommandOption& option) {
  if (!option.choices.empty()) return "words " + Joined(option.choices);
  if (option.value == "DIR|kernel") return "dirs kernel";
  if (option.value == "DIR") return "dirs";
  if (option.value == "FILE") return "files";
  return "nothing";
}

// Calls `visit` with each command line and the words that lead to it, "host init" for one.
void ForEachVerb(const CommandLine& line, const std::string& path,
                 const std::function<void(const std::string&, const CommandLine&)>& visit) {
  visit(path, line);
  for (const CommandLine& verb : line.verbs) {
    ForEachVerb(verb, path.empty() ? verb.name : path + " " + verb.name, visit);
  }
}

std::string WordsOf(const CommandLine& line) {
  std::vector<std::string> words;
  for (const CommandLine& verb : line.verbs) words.push_back(verb.name);
  for (const CommandOption& option : AllOptions(line)) {
    words.insert(words.end(), option.names.begin(), option.names.end());
  }
  return Joined(words);
}

// A case for each verb of what `text` gives for it.
std::string Cases(const CommandLine& line,
                  const std::function<std::string(const std::string&, const CommandLine&)>& text) {
  std::string cases;
  ForEachVerb(line, "",
              [&](const std::string& path, const CommandLine& verb) { cases += text(path, verb); });
  return cases;
}

std::string Case(const std::string& pattern, const std::string& text) {
  return "    '" + pattern + "') echo '" + text + "' ;;\n";
}

std::string ValueCases(const std::string& path, const CommandLine& verb) {
  std::string cases;
  const std::string start = path + ":";
  for (const CommandOption& option : AllOptions(verb)) {
    if (option.value.empty()) continue;
    for (const std::string& name : option.names) {
      cases += Case(start + name, Offer(option));
    }
  }
  return cases;
}

std::string PositionalCases(const std::string& path, const CommandLine& verb) {
  std::string cases;
  for (std::size_t i = 0; i < verb.operands.size(); ++i) {
    cases += Case(path + ":" + std::to_string(i), Offer(verb.operands[i]));
  }
  return cases;
}

constexpr char kScript[] = R"sh(
# Finds the verb that is being typed, the number of arguments behind it, and the option that waits
# for its value.
_secpolicy_parse() {
  local i word verbs
  verb= arguments=0 waiting=
  for ((i = 1; i < COMP_CWORD; ++i)); do
    word=${COMP_WORDS[i]}
    if [[ -n $waiting ]]; then
      waiting=
    elif [[ $word == -* ]]; then
      [[ -z $(_secpolicy_value "$verb:$word") ]] || waiting=$word
    else
      verbs=" $(_secpolicy_verbs "$verb") "
      if [[ $verbs == *" $word "* ]]; then
        verb=${verb:+$verb }$word
      else
        ((++arguments))
      fi
    fi
  done
}

_secpolicy() {
  local verb arguments waiting offer kind current=${COMP_WORDS[COMP_CWORD]}
  COMPREPLY=()
  _secpolicy_parse
  if [[ -n $waiting ]]; then
    offer=$(_secpolicy_value "$verb:$waiting")
  elif [[ $current == -* || -n $(_secpolicy_verbs "$verb") ]]; then
    offer="words $(_secpolicy_words "$verb")"
  else
    offer=$(_secpolicy_argument "$verb:$arguments")
  fi
  kind=${offer%% *}
  [[ $offer == *' '* ]] && offer=${offer#* } || offer=
  mapfile -t COMPREPLY < <(
    compgen -W "$offer" -- "$current"
    case $kind in
      dirs) compgen -d -- "$current" ;;
      files) compgen -f -- "$current" ;;
    esac
  )
}

complete -o filenames -F _secpolicy secpolicy
)sh";

std::string Function(const std::string& name, const std::string& cases) {
  return name + "() {\n  case $1 in\n" + cases + "  esac\n}\n";
}

}  // namespace

std::string BashCompletion(const CommandLine& line) {
  const auto words = [](const std::string& path, const CommandLine& verb) {
    return Case(path, WordsOf(verb));
  };
  const auto verbs = [](const std::string& path, const CommandLine& verb) {
    std::vector<std::string> names;
    for (const CommandLine& below : verb.verbs) names.push_back(below.name);
    return names.empty() ? std::string() : Case(path, Joined(names));
  };
  return "# Completion of " + line.name + " for bash.\n" +
         Function("_secpolicy_words", Cases(line, words)) +
         Function("_secpolicy_verbs", Cases(line, verbs)) +
         Function("_secpolicy_value", Cases(line, ValueCases)) +
         Function("_secpolicy_argument", Cases(line, PositionalCases)) + kScript;
}

}  // namespace SecPolicyTool
