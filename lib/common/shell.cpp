#include "shell.h"

#include <utility>

namespace zav {

void CommandOutput::close() {
    if (pipe_ != nullptr)
        pclose(std::exchange(pipe_, nullptr));
}

// The C library waits for the child here too, so that no zombie is left.
void CommandOutput::close_plain() {
    if (pipe_ != nullptr)
        fclose(std::exchange(pipe_, nullptr));
}

} // namespace zav
