// A log sink whose lines go into the recorder's trace, line ends and tabs as \r, \n and \t.
#include "tests/recorder/RecordingWriter.h"

extern "C" __attribute__((visibility("default"))) int Log(const wchar_t* text) {
    constexpr std::string_view kControls = "\r\n\t";
    std::string line = "log ";
    for (; *text; ++text) {
        const char character = *text < 0x80 ? static_cast<char>(*text) : '?';
        const size_t control = kControls.find(character);
        line +=
            control == std::string_view::npos ? std::string{character} : std::string{'\\', "rnt"[control]};
    }
    recorder::Note(line);
    return 1;
}
