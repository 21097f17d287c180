#include "zav_nic_parse.h"

#include "common/text.h"

namespace zav {

namespace {

struct Word {
    const char *text;
    int value;
};

// In the order in which they are looked for. Ports are no faster: 10000Mb is in none of them.
constexpr Word kSpeeds[] = {{"1000Mb", 1000}, {"100Mb", 100}, {"10Mb", 10}, {"Unknown!", 0}};
constexpr Word kLinks[] = {{"yes", ZAV_NET_UP}, {"no", ZAV_NET_DOWN}};
constexpr Word kPorts[] = {{"eth0", 1}, {"eth1", 2}, {"eth2", 3}, {"eth3", 4}, {"None", kNoPort}};

template <class Words>
const Word *word_in(const char *line, const Words &words) {
    for (const Word &word : words)
        if (contains(line, word.text))
            return &word;
    return nullptr;
}

template <class Words>
bool take(const char *line, const Words &words, int &value) {
    const Word *word = word_in(line, words);
    if (word != nullptr)
        value = word->value;
    return word != nullptr;
}

} // namespace

bool read_port_line(const char *line, zavNetState &info) {
    if (contains(line, "Speed"))
        return take(line, kSpeeds, info.value);
    if (contains(line, "Link detected"))
        return take(line, kLinks, info.state);
    return true;
}

int active_port(const char *line) {
    int port = kUnknownPort;
    take(line, kPorts, port);
    return port;
}

} // namespace zav
