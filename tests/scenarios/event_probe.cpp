// Runs on the simulated appliance: puts events into the driver's queue and takes them out, through
// the library. The device has one holder at a time, so a refused call is made again.
//   push WHO COUNT      COUNT whole records, numbered WHO * 1000 on
//   end                 one record that ends one taker
//   take                prints the number of each record, or "torn", until it meets an end
//   poll | wait         one event: its type, number and state
//   private             the same for a private event
//   led                 an alarm to the driver and back
#include "zav_api.h"
#include "zav_led.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <unistd.h>

namespace {

constexpr useconds_t pause = 500;
constexpr int nothing_pending = 0x1201;
constexpr int end_state = -1;

// The records are as long as the longest kind; the number makes every byte of them.
struct Bytes {
    unsigned char at[sizeof(zavSystemEvent)];
};

Bytes numbered_bytes(int number) {
    Bytes bytes;
    size_t place = 0;
    for (unsigned char &byte : bytes.at)
        byte = static_cast<unsigned char>((static_cast<size_t>(number) * 7 + place++) % 251);
    const int head[] = {ZAV_EVENT_INIT, number};
    memcpy(bytes.at, head, sizeof head);
    return bytes;
}

zavSystemEvent numbered_event(int number) {
    zavSystemEvent event;
    memcpy(static_cast<void *>(&event), numbered_bytes(number).at, sizeof event);
    return event;
}

bool is_whole(const zavSystemEvent &event) {
    Bytes bytes;
    memcpy(bytes.at, &event, sizeof event);
    return memcmp(bytes.at, numbered_bytes(event.init.state).at, sizeof event) == 0;
}

// The queue may be full, and the device somebody else's.
void push(zavSystemEvent event) {
    while (zavPushEvent(&event) != ZAV_RC_OK)
        usleep(pause);
}

int push_numbered(int who, int count) {
    for (int i = 0; i < count; ++i)
        push(numbered_event(who * 1000 + i));
    return 0;
}

int take() {
    for (;;) {
        zavSystemEvent event = {};
        if (zavPollEvent(&event) != ZAV_RC_OK) {
            usleep(pause);
        } else if (event.init.state == end_state) {
            return 0;
        } else if (is_whole(event)) {
            printf("%d\n", event.init.state);
        } else {
            printf("torn\n");
        }
    }
}

int print_event(int rc, const zavSystemEvent &event) {
    if (rc == nothing_pending)
        printf("nothing\n");
    else
        printf("%d: %d %d %d\n", rc, event.type, event.fan.id, event.fan.state);
    return 0;
}

int led() {
    zavLEDEvent event = {};
    printf("pending %x\n", static_cast<unsigned>(zavLEDPollAlarm(&event)));
    printf("alarm %d\n", zavLEDAlarm(1, 2, 3));
    const int rc = zavLEDPollAlarm(&event);
    printf("poll %d: %d %d %d\n", rc, event.priority, event.ledcode, event.state);
    return 0;
}

bool is(const char *word, const char *wanted) {
    return strcmp(word, wanted) == 0;
}

int number_of(const char *word) {
    return static_cast<int>(strtol(word, nullptr, 10));
}

int run_word(const char *word) {
    zavSystemEvent event = {};
    if (is(word, "end"))
        return push(numbered_event(end_state)), 0;
    if (is(word, "take"))
        return take();
    if (is(word, "led"))
        return led();
    const int rc = is(word, "wait")      ? zavWaitEvent(&event)
                   : is(word, "private") ? zavPollPrivateEvent(&event)
                                         : zavPollEvent(&event);
    return print_event(rc, event);
}

} // namespace

int main(int argc, char **argv) {
    if (argc == 4 && is(argv[1], "push"))
        return push_numbered(number_of(argv[2]), number_of(argv[3]));
    if (argc == 2)
        return run_word(argv[1]);
    fprintf(stderr, "event_probe: a word is wanted\n");
    return 2;
}
