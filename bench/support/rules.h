// Rules that do not decide on the same words twice, as many as are wanted.
#pragma once

#include <cstddef>
#include <string>
#include <vector>

namespace SecPolicyBench {

// The rule types that consist of words; "-r" is measured by itself.
inline constexpr char kRuleTypes[] = {'a', 'c', 'd', 'f', 'p', 's', 'u'};

// How many domains a policy has, and how many objects.
inline constexpr std::size_t kDomains = 100;
inline constexpr std::size_t kObjects = 100;

// The names: the three domains that every policy needs, and others.
std::vector<std::string> DomainNames();
std::vector<std::string> ObjectNames();

// The line of the rule `number` of this type, from 0; nothing where the words of its type give no
// more. Parameters of capabilities ("-p") have no end.
std::string RuleLine(char type, std::size_t number);

// `count` different lines of all the types above, in the order of a policy file.
std::vector<std::string> RuleLines(std::size_t count);

// A policy directory below `dir` with `count` rules, the same for each of its domains. Gives its
// path.
std::string WritePolicy(const std::string& dir, std::size_t count);

// A policy directory at `path` with one domain, appDom, whose file has these lines.
void WriteDomain(const std::string& path, const std::string& lines);

}  // namespace SecPolicyBench
