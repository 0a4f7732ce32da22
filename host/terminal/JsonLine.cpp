#include "host/terminal/JsonLine.h"

#include "text/Printable.h"
#include "text/Utf8.h"

#include <fmt/format.h>
#include <nlohmann/json.hpp>

namespace movieconv {

std::string JsonLine(std::string_view event, const nlohmann::ordered_json& fields) {
    using Json = nlohmann::ordered_json;
    constexpr int kVersion = 1;
    Json object{{"v", kVersion}, {"event", event}};
    object.update(fields);
    return EscapeCommands(object.dump(-1, ' ', false, Json::error_handler_t::replace)) + "\n";
}

std::string EscapeCommands(std::string_view json) {
    std::string escaped;
    for (const wchar_t character : text::FromUtf8(json)) {
        if (character >= 0x7F && text::IsCommand(character))
            escaped += fmt::format("\\u{:04x}", static_cast<unsigned>(character));
        else
            escaped += text::ToUtf8({&character, 1});
    }
    return escaped;
}

} // namespace movieconv
