// Symbol visibility: the library is built with hidden visibility; TARNSTATS_EXPORT marks what it
// exports.
#pragma once

#define TARNSTATS_EXPORT __attribute__((visibility("default")))
