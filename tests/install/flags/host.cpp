// Fails unless the host's own flags are the ones that the library reads.

#include <VornJsonDbApi.h>

#include <syslog.h>
#include <unistd.h>

#include <cstdarg>
#include <cstdio>
#include <string>

void OwnerSetsFlags(bool blStdout, bool blDebug);

namespace {

int g_nSystemLines = 0;
int g_nFailures = 0;

void Expect(bool blTrue, const char* szWhat) {
    if (!blTrue) {
        std::fprintf(stderr, "failed: %s\n", szWhat);
        ++g_nFailures;
    }
}

// Standard output of one refused record check: an error line and, when asked for, a debug line.
std::string Printed(VornJsonDbApi& handle) {
    std::fflush(stdout);
    const int nSaved = dup(STDOUT_FILENO);
    std::FILE* pFile = std::tmpfile();
    dup2(fileno(pFile), STDOUT_FILENO);
    Json::Value jNothing(Json::objectValue);
    handle.fillDefaultValue(jNothing, true);
    std::fflush(stdout);
    dup2(nSaved, STDOUT_FILENO);
    close(nSaved);
    std::rewind(pFile);
    char szText[4096] = {};
    const size_t nLength = std::fread(szText, 1, sizeof(szText) - 1, pFile);
    std::fclose(pFile);
    return std::string(szText, nLength);
}

bool Holds(const std::string& strText, const char* szPart) {
    return strText.find(szPart) != std::string::npos;
}

}  // namespace

// In the place of the system log.
extern "C" {
void syslog(int, const char*, ...) {
    ++g_nSystemLines;
}
void __syslog_chk(int, int, const char*, ...);
void __syslog_chk(int, int, const char*, ...) {
    ++g_nSystemLines;
}
}

int main() {
#ifdef OWNER_COMES_LATE
    Expect(!blLogToStdout && !blDebugOutput, "the first definition is the one that counts");
    OwnerSetsFlags(true, true);
#endif
    Expect(blLogToStdout && blDebugOutput, "the flags are the host's, with the host's values");

    sqlite3* pDb = nullptr;
    sqlite3_open(":memory:", &pDb);
    std::string strName = "t";
    std::string strCreate = "CREATE TABLE t(a)";
    Json::Value jDefinition;
    jDefinition["t"]["member"]["a"]["cpptype"] = "string";
    VornJsonDbApi handle(pDb, strName, jDefinition, strCreate);

    const std::string strBoth = Printed(handle);
    Expect(Holds(strBoth, "lost data member=a"), "an error line goes to standard output");
    Expect(Holds(strBoth, "jParam={}"), "a debug line goes to standard output");
    OwnerSetsFlags(true, false);
    const std::string strError = Printed(handle);
    Expect(Holds(strError, "lost data member=a"), "without debug lines the error line stays");
    Expect(!Holds(strError, "jParam="), "the debug line is gone");
    Expect(g_nSystemLines == 0, "nothing went to the system log");
    OwnerSetsFlags(false, true);
    Expect(Printed(handle).empty(), "nothing goes to standard output any more");
    Expect(g_nSystemLines == 2, "both lines went to the system log");
    sqlite3_close(pDb);
    return g_nFailures == 0 ? 0 : 1;
}
