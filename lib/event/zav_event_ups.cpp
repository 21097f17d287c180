// The UPS, from the status file of its daemon or from what the appliance's own hook wrote.
#include "common/diag.h"
#include "common/owner.h"
#include "common/text.h"
#include "zav_api.h"

#include <cerrno>
#include <cstring>
#include <ctime>
#include <sys/stat.h>

namespace {

constexpr const char *kStatus = "/var/log/apcupsd.status";
constexpr const char *kEvent = "/var/log/zavapcupsd.event";
constexpr time_t kFreshSeconds = 90;
constexpr int kIncomplete = 42;
constexpr const char *kBlanks = " \t\n";

struct Texts {
    char whole[4096];
    char copy[4096]; // splitting destroys
};

int refuse(int number, const char *format, const char *word) {
    zavlogd(const_cast<char *>("zavGetStateUPS"), zav::kAlert, number, format, word);
    return number;
}

int not_running() {
    return refuse(ZAV_RC_ERR_ENODEV, "%s", "apcupsd don't be enable!");
}

struct Modified {
    bool exists;
    time_t at;

    explicit Modified(const char *path) {
        struct stat file = {};
        exists = stat(path, &file) == 0;
        at = file.st_mtime;
    }
    bool fresh(time_t now) const { return exists && now - at <= kFreshSeconds; }
};

int read_text(const char *path, Texts &texts) {
    const zav::File file(path, "re");
    if (!file) {
        const int error = errno;
        refuse(error, "%s", strerror(error));
        return ZAV_RC_ERR_EACCES;
    }
    const size_t length = fread(texts.whole, 1, sizeof texts.whole - 1, file.get());
    texts.whole[length] = '\0';
    return length != 0 ? ZAV_RC_OK : refuse(ZAV_RC_ERR_EACCES, "%s is NULL", path);
}

int read_event(Texts &texts, zavUpsState &state) {
    if (const int rc = read_text(kEvent, texts); rc != ZAV_RC_OK)
        return rc;
    zav::Fields fields(texts.whole);
    const char *number = fields.next(kBlanks);
    const char *charge = fields.next(kBlanks);
    if (number == nullptr || charge == nullptr)
        return refuse(ZAV_RC_ERR_EACCES, "%s is NULL", kEvent);
    state.state = zav::to_int(number);
    state.charge = static_cast<float>(zav::to_double(charge));
    return ZAV_RC_OK;
}

// From the key on, in a fresh copy; null without it.
char *find_key(Texts &texts, const char *key) {
    memcpy(texts.copy, texts.whole, sizeof texts.copy);
    return strstr(texts.copy, key);
}

// The third field: key, colon, number.
bool read_value(Texts &texts, const char *key, float &value) {
    char *line = find_key(texts, key);
    if (line == nullptr)
        return false;
    zav::Fields fields(line);
    fields.next(kBlanks);
    fields.next(kBlanks);
    const char *field = fields.next(kBlanks);
    if (field == nullptr)
        return false;
    value = static_cast<float>(zav::to_double(field));
    return true;
}

// Both words stand there while the battery is tested: ONBATT goes first.
bool read_status(Texts &texts, int &state) {
    char *line = find_key(texts, "STATUS");
    if (line == nullptr)
        return false;
    line[strcspn(line, "\n")] = '\0';
    state = ZAV_UPS_OTHER;
    if (zav::contains(line, "ONBATT"))
        state = ZAV_UPS_ONBATT;
    else if (zav::contains(line, "ONLINE"))
        state = ZAV_UPS_ONLINE;
    return true;
}

int read_daemon_status(Texts &texts, zavUpsState &state) {
    if (const int rc = read_text(kStatus, texts); rc != ZAV_RC_OK)
        return rc;
    float line_voltage = 0; // has to be there, and is not told
    if (!read_value(texts, "LINEV", line_voltage) || !read_value(texts, "BCHARGE", state.charge) ||
        !read_status(texts, state.state))
        return refuse(kIncomplete, "%s isn't correct!", kStatus);
    return ZAV_RC_OK;
}

int read_current(Texts &texts, zavUpsState &state) {
    const Modified status(kStatus);
    if (!status.exists)
        return not_running();
    const Modified event(kEvent);
    const time_t now = time(nullptr);
    if (!status.fresh(now) && !event.fresh(now))
        return not_running();
    return event.exists && event.at >= status.at ? read_event(texts, state)
                                                 : read_daemon_status(texts, state);
}

} // namespace

int zavGetStateUPS(zavUpsState *info) {
    if (info == nullptr)
        return ZAV_RC_ERR_EINVAL;
    const zav::HeapRecord<Texts> texts;
    if (!texts) {
        const int error = errno;
        refuse(error, "%s", strerror(error));
        return ZAV_RC_ERR_ENOMEM;
    }
    zavUpsState state = {.type = ZAV_EVENT_UPS, .charge = 0.0F, .state = ZAV_UPS_OTHER};
    const int rc = read_current(*texts, state);
    if (rc == ZAV_RC_OK)
        *info = state;
    return rc;
}
