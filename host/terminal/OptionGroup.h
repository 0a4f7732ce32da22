// One vocabulary for the options of the command line: each has its names, what --help calls its value, where
// the value goes, how it is read, and a help text.
#ifndef MOVIECONV_HOST_TERMINAL_OPTIONGROUP_H
#define MOVIECONV_HOST_TERMINAL_OPTIONGROUP_H

#include "host/presets/Notation.h"

#include <CLI/CLI.hpp>
#include <fmt/format.h>
#include <functional>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace movieconv {

/// Adds options under one heading of --help. What they refer to is written while the command line is parsed;
/// a value that cannot be read ends that with CLI::ParseError.
class OptionGroup {
public:
    OptionGroup(CLI::App& app, std::string heading) : app_(app), heading_(std::move(heading)) {}

    void Flag(const std::string& names, bool& target, const std::string& help) {
        app_.add_flag(names, target, help)->group(heading_);
    }

    /// A flag that does more than to set something true.
    void Action(const std::string& names, const std::function<void()>& act, const std::string& help) {
        app_.add_flag_callback(names, act, help)->group(heading_);
    }

    /// A value that is read as its type says.
    template <class Target>
    void Value(const std::string& names, const std::string& type, Target& target, const std::string& help) {
        app_.add_option(names, target, help)->type_name(type)->group(heading_);
    }

    /// Likewise, handed to `take`.
    template <class Type>
    void Taken(const std::string& names, const std::string& type,
               const std::function<void(const Type&)>& take, const std::string& help) {
        app_.add_option_function<Type>(names, take, help)->type_name(type)->group(heading_);
    }

    /// A text for `read`, which returns false where it is not `notation`: so the message calls that.
    void Read(const std::string& names, const std::string& type,
              const std::function<bool(const std::string&)>& read, const std::string& notation,
              const std::string& help) {
        Taken<std::string>(
            names, type, [=](const std::string& text) { Require(read(text), names, text, notation); }, help);
    }

    /// A text that `parse` turns into a value; nothing where it is not `notation`.
    template <class Type, class Target>
    void Parsed(const std::string& names, const std::string& type,
                std::optional<Type> (*parse)(std::string_view), Target& target, const std::string& notation,
                const std::string& help) {
        const auto read = [parse, &target](const std::string& text) {
            const std::optional<Type> value = parse(text);
            if (value)
                target = *value;
            return value.has_value();
        };
        Read(names, type, read, notation, help);
    }

    /// A whole number from `least` to `most`, handed to `take`.
    void Number(const std::string& names, const std::string& type, int least, int most,
                const std::function<void(int)>& take, const std::string& help) {
        const auto read = [=](const std::string& text) {
            const std::optional<int> number = ParseWhole(text, least, most);
            if (number)
                take(*number);
            return number.has_value();
        };
        Read(names, type, read, fmt::format("a whole number from {} to {}", least, most), help);
    }
    void Number(const std::string& names, const std::string& type, int least, int most,
                std::optional<int>& target, const std::string& help) {
        Number(
            names, type, least, most, [&target](int number) { target = number; }, help);
    }

    /// One of some words, which are also what --help calls the value unless `type` says otherwise.
    template <class Type, class Target>
    void Choice(const std::string& names, Target& target, const std::map<std::string, Type>& choices,
                const std::string& help, const std::string& type = "") {
        std::string words;
        for (const auto& [word, value] : choices)
            words += (words.empty() ? "" : "|") + word;
        const auto read = [&target, choices](const std::string& text) {
            const auto choice = choices.find(text);
            if (choice != choices.end())
                target = choice->second;
            return choice != choices.end();
        };
        Read(names, type.empty() ? words : type, read, words, help);
    }

    /// An option that may be repeated: a text for `read`, as above, each time.
    void Each(const std::string& names, const std::string& type,
              const std::function<bool(const std::string&)>& read, const std::string& notation,
              const std::string& help) {
        const auto take = [=](const std::vector<std::string>& texts) {
            for (const std::string& text : texts)
                Require(read(text), names, text, notation);
        };
        app_.add_option_function<std::vector<std::string>>(names, take, help)
            ->type_name(type)
            ->allow_extra_args(false) // another value needs the option again: INPUT may follow
            ->take_all()
            ->group(heading_);
    }

private:
    static void Require(bool understood, const std::string& names, const std::string& text,
                        const std::string& notation) {
        if (!understood)
            throw CLI::ValidationError(names, fmt::format("\"{}\" is not {}", text, notation));
    }

    CLI::App& app_;
    const std::string heading_;
};

} // namespace movieconv

#endif
