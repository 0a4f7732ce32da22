// A log sink whose lines go into the recorder's trace.
#include "tests/recorder/RecordingWriter.h"

extern "C" __attribute__((visibility("default"))) int Log(const wchar_t* text) {
    std::string line = "log ";
    for (; *text; ++text)
        line += *text < 0x80 ? static_cast<char>(*text) : '?';
    recorder::Note(line);
    return 1;
}
