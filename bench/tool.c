/* A tool that does nothing: prints the text that was laid down for its name, if any, and succeeds.
   A text that begins with a line "exit N" is for one that ends with that status. */
#include "answers.h"

#include <fcntl.h>
#include <stdio.h>
#include <stdlib.h>
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
    const ssize_t length = read(answer, text, sizeof text - 1);
    if (length < 0 || write(STDOUT_FILENO, text, (size_t)length) != length)
        return 1;
    text[length] = '\0';
    return strncmp(text, "exit ", 5) == 0 ? atoi(text + 5) : 0;
}
