#include "host/pieces/JsonName.h"

#include <cctype>
#include <cstddef>
#include <fmt/format.h>
#include <stdexcept>

namespace movieconv {
namespace {

constexpr char kHex[] = "hex";

bool IsUtf8(const std::string& text) {
    try {
        return !Json(text).dump().empty();
    } catch (const Json::exception&) {
        return false;
    }
}

} // namespace

Json NameAsJson(const std::string& name) {
    if (IsUtf8(name))
        return name;
    std::string hex;
    for (const char byte : name)
        hex += fmt::format("{:02x}", static_cast<unsigned char>(byte));
    return {{kHex, hex}};
}

std::string NameFromJson(const Json& json) {
    if (!json.is_object())
        return json.get<std::string>();
    const auto hex = json.at(kHex).get<std::string>();
    std::string name;
    for (std::size_t at = 0; at < hex.size(); at += 2) {
        const std::string byte = hex.substr(at, 2);
        if (byte.size() < 2 || std::isxdigit(static_cast<unsigned char>(byte[0])) == 0 ||
            std::isxdigit(static_cast<unsigned char>(byte[1])) == 0)
            throw std::invalid_argument("\"" + hex + "\" is no name in hexadecimal");
        name += static_cast<char>(std::stoi(byte, nullptr, 16));
    }
    return name;
}

} // namespace movieconv
