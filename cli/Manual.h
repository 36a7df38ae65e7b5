// The manual page.

#ifndef VORNJSONDB_CLI_MANUAL_H
#define VORNJSONDB_CLI_MANUAL_H

namespace VORN_JSON_DB::Cli {

void PutManual();  // as mdoc, to standard output

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_MANUAL_H
