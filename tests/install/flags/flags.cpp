// What a host's own logging library holds. It does not know the header of the library under test.

bool blLogToStdout = true;
bool blDebugOutput = true;

void OwnerSetsFlags(bool blStdout, bool blDebug) {
    blLogToStdout = blStdout;
    blDebugOutput = blDebug;
}
