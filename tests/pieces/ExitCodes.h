// What the program ends with.
#ifndef MOVIECONV_TESTS_PIECES_EXITCODES_H
#define MOVIECONV_TESTS_PIECES_EXITCODES_H

constexpr int kUsage = 2;
constexpr int kCannotRead = 3;
constexpr int kCannotWrite = 4;
constexpr int kNoSpace = 5;
constexpr int kStopped = 6;

#endif
