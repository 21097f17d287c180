#include "commands.h"

#include "require.h"

#include <cstdio>
#include <cstdlib>
#include <dlfcn.h>

namespace bench {

namespace {

std::vector<Command> *recorded = nullptr;
std::string answer; // in place of running a command, unless empty

void run_piped(const std::string &command) {
    FILE *output = popen(command.c_str(), "re");
    require(output != nullptr, command);
    char text[4096];
    size_t length = 0;
    for (size_t got = 0; (got = fread(text, 1, sizeof text, output)) > 0;)
        length += got;
    require(pclose(output) == 0 && length > 0, command);
}

} // namespace

std::vector<Command> commands_of(const Action &action) {
    std::vector<Command> commands;
    recorded = &commands;
    action();
    recorded = nullptr;
    return commands;
}

Action answered(const std::string &text, const Action &action) {
    return [text, action] {
        answer = text;
        action();
        answer.clear();
    };
}

void run_bare(const std::vector<Command> &commands) {
    for (const Command &command : commands) {
        if (command.piped)
            run_piped(command.text);
        else
            require(system(command.text.c_str()) == command.status, command.text);
    }
}

} // namespace bench

// The library's calls of these come here, as everybody's do.

extern "C" int system(const char *command) {
    using System = int (*)(const char *);
    static const auto real = reinterpret_cast<System>(dlsym(RTLD_NEXT, "system"));
    const int status = real(command);
    if (bench::recorded != nullptr)
        bench::recorded->push_back({command, false, status});
    return status;
}

extern "C" FILE *popen(const char *command, const char *mode) {
    using Popen = FILE *(*)(const char *, const char *);
    static const auto real = reinterpret_cast<Popen>(dlsym(RTLD_NEXT, "popen"));
    if (bench::recorded != nullptr)
        bench::recorded->push_back({command, true, 0});
    if (!bench::answer.empty())
        return fmemopen(bench::answer.data(), bench::answer.size(), "r");
    return real(command, mode);
}
