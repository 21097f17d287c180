/* The optical drive's requests, answered from what the model says of its disc. */
#include "shim.h"

#include <errno.h>
#include <fcntl.h>
#include <linux/cdrom.h>
#include <string.h>
#include <sys/stat.h>
#include <unistd.h>

enum { read_disc_information = 0x51, information_size = 34, not_ready = 2, no_medium = 0x3A };

static int refuse(int error) {
    errno = error;
    return -1;
}

/* Without a disc there is no information. */
static size_t read_information(unsigned char *information) {
    const int fd = shim_real_open("/run/zavsim/disc-information", O_RDONLY | O_CLOEXEC, 0);
    if (fd < 0)
        return 0;
    const ssize_t length = read(fd, information, information_size);
    shim_real_close(fd);
    return length > 0 ? (size_t)length : 0;
}

static int refuse_without_medium(const struct cdrom_generic_command *command) {
    if (command->sense != NULL) {
        unsigned char sense[18] = {0x70, 0, not_ready, 0, 0, 0, 0, 10, 0, 0, 0, 0, no_medium};
        memcpy(command->sense, sense, sizeof sense);
    }
    return refuse(ENOMEDIUM);
}

static int send_packet(const struct cdrom_generic_command *command) {
    unsigned char information[information_size];
    if (command == NULL)
        return refuse(EFAULT);
    if (command->cmd[0] != read_disc_information)
        return refuse(EOPNOTSUPP);
    size_t length = read_information(information);
    if (length == 0)
        return refuse_without_medium(command);
    const size_t asked = (size_t)(command->cmd[7] << 8 | command->cmd[8]);
    length = length < asked ? length : asked;
    length = length < command->buflen ? length : command->buflen;
    memcpy(command->buffer, information, length);
    return 0;
}

int shim_is_drive(int fd) {
    struct stat own;
    struct stat node;
    return fstat(fd, &own) == 0 && S_ISREG(own.st_mode) && stat("/dev/sr0", &node) == 0 &&
           own.st_dev == node.st_dev && own.st_ino == node.st_ino;
}

int shim_serve_drive(unsigned long request, void *argument) {
    if (request == CDROM_SEND_PACKET)
        return send_packet(argument);
    return request == CDROMRESET ? 0 : refuse(ENOTTY);
}
