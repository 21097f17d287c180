/* A caller with functions of its own that are called like the library's: neither may replace the
 * other's. */
#include "zav_event.h"

#include <string.h>

int trans_mdname(char *metaname, char *zavname);
int get_diskcount(int *diskcount);

void trim(char *s);
void trim(char *s) {
    s[0] = '!';
}

int main(void) {
    char own[] = " a ";
    int count = -1;
    trim(own);
    if (strcmp(own, "!a ") != 0)
        return 1;
    /* The library trims what it reads with its own function. */
    return get_diskcount(&count) == ZAV_RC_OK && count == 0 ? 0 : 2;
}
