#include "host/pieces/JsonName.h"

#include <cctype>
#include <cstddef>
#include <filesystem>
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

std::string PathFromJson(const Json& json) {
    std::string text = NameFromJson(json);
    const std::filesystem::path path(text);
    if (!path.is_absolute() || path.lexically_normal() != path || text.find('\0') != std::string::npos)
        throw std::invalid_argument(fmt::format("\"{}\" is not an absolute path without detours", text));
    return text;
}

int64_t Natural(const Json& json, const char* name) {
    const Json& value = json.at(name);
    if (!value.is_number_integer() || value.get<int64_t>() < 0)
        throw std::invalid_argument(fmt::format("\"{}\" is not a number from 0 on", name));
    return value.get<int64_t>();
}

} // namespace movieconv
