#include "host/terminal/Completion.h"

#include <fmt/format.h>
#include <fmt/ranges.h>
#include <iterator>

namespace movieconv {
namespace {

using Value = OptionEntry::Value;

constexpr const char* kPresets = "movieconv --list-presets --quiet 2>/dev/null";

/// Every character of `text` that is in `special` behind a backslash.
std::string Escape(const std::string& text, const std::string& special) {
    std::string escaped;
    for (const char c : text) {
        if (special.find(c) != std::string::npos)
            escaped += '\\';
        escaped += c;
    }
    return escaped;
}

/// For single quotes, as all three shells read them behind an escape of their own.
std::string Quoted(const std::string& text) {
    std::string quoted = "'";
    for (const char c : text)
        quoted += c == '\'' ? "'\\''" : std::string(1, c);
    return quoted + "'";
}

std::vector<std::string> Names(const OptionEntry& option) {
    std::vector<std::string> names{"--" + option.longName};
    if (!option.shortName.empty())
        names.insert(names.begin(), "-" + option.shortName);
    return names;
}

std::string BashCase(const OptionEntry& option) {
    switch (option.value) {
    case Value::kFile:
        return "compgen -f -- \"$word\"";
    case Value::kChoice:
        return fmt::format("compgen -W {} -- \"$word\"",
                           Quoted(fmt::format("{}", fmt::join(option.choices, " "))));
    case Value::kPreset:
        return fmt::format("compgen -f -W \"$({})\" -- \"$word\"", kPresets);
    case Value::kNone:
    case Value::kFree:
        break;
    }
    return ":";
}

std::string Bash(const std::vector<OptionEntry>& options) {
    std::string cases;
    std::vector<std::string> names;
    for (const OptionEntry& option : options) {
        const std::vector<std::string> own = Names(option);
        names.insert(names.end(), own.begin(), own.end());
        if (option.value != Value::kNone)
            fmt::format_to(std::back_inserter(cases), "    {}) mapfile -t COMPREPLY < <({}) ;;\n",
                           fmt::join(own, " | "), BashCase(option));
    }
    return fmt::format("# Completion of movieconv for bash.\n"
                       "_movieconv() {{\n"
                       "    local word=$2\n"
                       "    case $3 in\n"
                       "{}"
                       "    *) case $word in\n"
                       "        -*) mapfile -t COMPREPLY < <(compgen -W {} -- \"$word\") ;;\n"
                       "        *) mapfile -t COMPREPLY < <(compgen -f -- \"$word\") ;;\n"
                       "        esac ;;\n"
                       "    esac\n"
                       "}}\n"
                       "complete -o filenames -F _movieconv movieconv\n",
                       cases, Quoted(fmt::format("{}", fmt::join(names, " "))));
}

std::string ZshValue(const OptionEntry& option) {
    switch (option.value) {
    case Value::kFile:
        return ":file:_files";
    case Value::kChoice:
        return fmt::format(":value:({})", fmt::join(option.choices, " "));
    case Value::kPreset:
        return fmt::format(":preset:{{ compadd -- ${{(f)\"$({})\"}}; _files }}", kPresets);
    case Value::kFree:
        return ":value: ";
    case Value::kNone:
        break;
    }
    return "";
}

std::string Zsh(const std::vector<OptionEntry>& options) {
    std::string specs;
    for (const OptionEntry& option : options) {
        const std::vector<std::string> names = Names(option);
        const std::string rest = "[" + Escape(option.help, "[]\\:") + "]" + ZshValue(option);
        const std::string mentions = option.repeatable ? "*" : fmt::format("({})", fmt::join(names, " "));
        for (const std::string& name : names)
            fmt::format_to(std::back_inserter(specs), "    {} \\\n",
                           Quoted(fmt::format("{}{}{}", mentions, name, rest)));
    }
    return fmt::format("#compdef movieconv\n"
                       "# Completion of movieconv for zsh.\n"
                       "_arguments -S \\\n"
                       "{}"
                       "    '*:movie:_files'\n",
                       specs);
}

std::string FishValue(const OptionEntry& option) {
    switch (option.value) {
    case Value::kFile:
        return " -r -F";
    case Value::kChoice:
        return fmt::format(" -x -a {}", Quoted(fmt::format("{}", fmt::join(option.choices, " "))));
    case Value::kPreset:
        return fmt::format(" -r -F -a {}", Quoted(fmt::format("({})", kPresets)));
    case Value::kFree:
        return " -x";
    case Value::kNone:
        break;
    }
    return "";
}

std::string Fish(const std::vector<OptionEntry>& options) {
    std::string script = "# Completion of movieconv for fish.\n";
    for (const OptionEntry& option : options)
        fmt::format_to(std::back_inserter(script), "complete -c movieconv{} -l {}{} -d {}\n",
                       option.shortName.empty() ? "" : " -s " + option.shortName, option.longName,
                       FishValue(option), Quoted(option.help));
    return script;
}

} // namespace

std::string CompletionScript(Shell shell, const std::vector<OptionEntry>& options) {
    switch (shell) {
    case Shell::kBash:
        return Bash(options);
    case Shell::kZsh:
        return Zsh(options);
    case Shell::kFish:
        break;
    }
    return Fish(options);
}

} // namespace movieconv
