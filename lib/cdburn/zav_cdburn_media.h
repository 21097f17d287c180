// What the media tools and the drive say of a disc: text or bytes in, the record's fields out.
#pragma once

#include "zav_api.h"

namespace zav {

// What a line of dvd+rw-mediainfo says when it ends without success.
enum class NoDvd { other, no_medium, cd };

// One line of dvd+rw-mediainfo's report of a DVD, at most 79 characters of it. The capacity line
// counts from the state that was read before it.
void read_dvd_line(char *line, zavMediaInfo &info);

NoDvd read_refusal_line(const char *line);

// One line of "cdrecord -atip".
void read_atip_line(char *line, zavMediaInfo &info);

// Byte 2 of the drive's disc information. True for a disc whose room stands in its session offsets.
bool read_disc_status(unsigned char status, zavMediaInfo &info);

// The last line of "cdrecord -msinfo": "0,11702".
void read_session_offsets(char *line, zavMediaInfo &info);

// The first line of "du -sL" over the mounted disc.
void read_used_space(char *line, zavMediaInfo &info);

// The number at the start of a word; false if there is none, or it is negative.
bool read_count(const char *word, int &count);

// What both the query and the burn ask before anything else.
bool is_overwritable(int disc_type);

} // namespace zav
