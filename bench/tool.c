/* A tool that does nothing: prints the text that was laid down for its name, if any, and succeeds.
 */
#include "answers.h"

#include <fcntl.h>
#include <stdio.h>
#include <string.h>
#include <unistd.h>

int main(int argc, char **argv) {
    char path[128];
    char text[4096];
    (void)argc;
    const char *slash = strrchr(argv[0], '/');
    snprintf(path, sizeof path, BENCH_ANSWERS "/%s", slash != NULL ? slash + 1 : argv[0]);
    const int answer = open(path, O_RDONLY);
    if (answer < 0)
        return 0;
    const ssize_t length = read(answer, text, sizeof text);
    return length >= 0 && write(STDOUT_FILENO, text, (size_t)length) == length ? 0 : 1;
}
