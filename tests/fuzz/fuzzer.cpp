// One target, chosen by --target=NAME, in libFuzzer's loop.
#include "targets.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>

namespace {

const fuzz::Target *chosen = nullptr;

[[noreturn]] void list_targets() {
    for (const fuzz::Target &target : fuzz::targets())
        std::printf("%s ", target.name);
    std::puts("");
    std::exit(0);
}

[[noreturn]] void usage() {
    std::fputs("usage: zav-fuzz --targets\n"
               "       zav-fuzz --target=NAME [libFuzzer options] [directories]\n",
               stderr);
    std::exit(64);
}

} // namespace

extern "C" int LLVMFuzzerInitialize(int *argc, char ***argv) {
    constexpr const char *option = "--target=";
    if (*argc == 2 && std::strcmp((*argv)[1], "--targets") == 0)
        list_targets();
    for (int i = 1; i < *argc; ++i)
        if (std::strncmp((*argv)[i], option, std::strlen(option)) == 0)
            chosen = fuzz::target_named((*argv)[i] + std::strlen(option));
    if (chosen == nullptr)
        usage();
    std::freopen("/dev/null", "w", stdout); // traces
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size) {
    chosen->run({data, size});
    return 0;
}
