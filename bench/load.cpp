// vornjsondb_load LIBRARY: prints, as one JSON object, how long dlopen takes and how many
// relocations it applies, for libsqlite3 and for the library. The library's dependencies are loaded
// before it, so that its figure is its own.

#include <dlfcn.h>
#include <elf.h>
#include <link.h>

#include <cstdio>
#include <cstdlib>
#include <ctime>

namespace {

double Microseconds() {
    timespec Now{};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &Now);
    return static_cast<double>(Now.tv_sec) * 1e6 + static_cast<double>(Now.tv_nsec) / 1e3;
}

struct Loaded {
    double dMicroseconds;
    size_t nRelocations;
    const char* szFile;
};

size_t CountRelocations(const link_map& Map) {
    size_t nTable = 0;
    size_t nEntry = 0;
    size_t nJumps = 0;
    for (const ElfW(Dyn)* pEntry = Map.l_ld; pEntry->d_tag != DT_NULL; ++pEntry) {
        switch (pEntry->d_tag) {
            case DT_RELASZ:
            case DT_RELSZ:
                nTable = pEntry->d_un.d_val;
                break;
            case DT_RELAENT:
            case DT_RELENT:
                nEntry = pEntry->d_un.d_val;
                break;
            case DT_PLTRELSZ:
                nJumps = pEntry->d_un.d_val;
                break;
            default:
                break;
        }
    }
    return nEntry == 0 ? 0 : (nTable + nJumps) / nEntry;
}

Loaded Load(const char* szName) {
    const double dStart = Microseconds();
    void* pLibrary = dlopen(szName, RTLD_NOW | RTLD_GLOBAL);
    const double dTime = Microseconds() - dStart;
    link_map* pMap = nullptr;
    if (pLibrary == nullptr || dlinfo(pLibrary, RTLD_DI_LINKMAP, &pMap) != 0) {
        std::fprintf(stderr, "%s\n", dlerror());
        std::exit(1);
    }
    return {dTime, CountRelocations(*pMap), pMap->l_name};
}

void Print(const char* szName, const Loaded& One) {
    std::printf("\"%s\": {\"microseconds\": %.1f, \"relocations\": %zu, \"file\": \"%s\"}", szName,
                One.dMicroseconds, One.nRelocations, One.szFile);
}

}  // namespace

int main(int argc, char** argv) {
    if (argc != 2) {
        std::fprintf(stderr, "usage: vornjsondb_load LIBRARY\n");
        return 2;
    }
    Load("libm.so.6");  // SQLite's own dependency is not its cost
    const Loaded Sqlite = Load(VORN_BENCH_SQLITE);
    Load(VORN_BENCH_JSONCPP);
    const Loaded Library = Load(argv[1]);
    std::printf("{");
    Print("sqlite", Sqlite);
    std::printf(", ");
    Print("library", Library);
    std::printf("}\n");
    return 0;
}
