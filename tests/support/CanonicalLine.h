// Reads log lines as the library writes them and gives their canonical form (see HostExits.h).
#ifndef VORNJSONDB_TESTS_SUPPORT_CANONICALLINE_H
#define VORNJSONDB_TESTS_SUPPORT_CANONICALLINE_H

#include <string>
#include <vector>

#include "HostExits.h"

namespace testhost {

std::string CanonicalSyslog(const SyslogCall& call);

// One printed line with its newlines.
std::string CanonicalPrinted(const std::string& strRaw);

// Cuts printed text into lines. A message may hold newlines of its own, so a line ends where the
// next head begins.
std::vector<std::string> SplitPrinted(const std::string& strText);

}  // namespace testhost

#endif  // VORNJSONDB_TESTS_SUPPORT_CANONICALLINE_H
