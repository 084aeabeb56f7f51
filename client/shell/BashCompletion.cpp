#include <sstream>

#include "client/shell/Completion.h"

namespace vexa::client {

namespace {

// Bash splits words at characters such as the colon, and replaces only what stands behind the last of them or
// behind an open quote. So the line is taken apart here, and what bash leaves standing is cut off the names.
constexpr const char* kBashFunctions = R"bash(
# Takes $1 apart: `words` without quotes, the last one unfinished; `open`, the quote that it stands in; `kept`, what
# bash leaves standing of it.
_vexa_split() {
    local text=$1 char plain='' started='' i
    words=() open='' kept=''
    for ((i = 0; i < ${#text}; i++)); do
        char=${text:i:1}
        if [[ $open && $char == "$open" ]]; then
            open=''
        elif [[ $open == \' ]]; then
            plain+=$char
        elif [[ $char == \\ ]]; then
            ((++i))
            char=${text:i:1}
            [[ $open && $char != [\"\\\$\`] ]] && plain+=\\
            plain+=$char started=1
        elif [[ $open ]]; then
            plain+=$char
        elif [[ $char == [\'\"] ]]; then
            open=$char kept=$plain started=1
        elif [[ $char == [[:space:]] ]]; then
            [[ $started ]] && words+=("$plain")
            plain='' started='' kept=''
        else
            plain+=$char started=1
            [[ $char == [:=@] && $COMP_WORDBREAKS == *"$char"* ]] && kept=$plain
        fi
    done
    words+=("$plain")
}

# Prints $1 as it has to stand in a line, within the open quote $2.
_vexa_quoted() {
    local special=$' \t\'"\\$`&|;<>()*?[]{}!#~=:' text='' i
    [[ $2 == \" ]] && special='"\$`'
    if [[ $2 == \' ]]; then
        printf '%s' "${1//\'/\'\\\'\'}"
        return
    fi
    for ((i = 0; i < ${#1}; i++)); do
        [[ $special == *"${1:i:1}"* ]] && text+=\\
        text+=${1:i:1}
    done
    printf '%s' "$text"
}

# Sets what can stand in the last of `words`: `kind`, `names`, and `lead`, which goes before all of them.
_vexa_expected() {
    local path='' place=1 option='' word last=${words[-1]}
    lead='' names=()
    for word in "${words[@]:1:${#words[@]}-2}"; do
        if [[ $option ]]; then
            option=''
        elif [[ $word == -* ]]; then
            _vexa_kind "$path $word" && option=$word
        elif [[ " $(_vexa_words "$path") " == *" $word "* ]]; then
            path="${path:+$path }$word"
        else
            ((++place))
        fi
    done
    if [[ $option ]]; then
        _vexa_kind "$path $option"
    elif [[ $last == --*=* ]]; then
        lead=${last%%=*}=
        _vexa_kind "$path ${last%%=*}"
    elif [[ $last == -* ]]; then
        kind="words $(_vexa_options "$path")"
    else
        _vexa_kind "$path $place" || kind="words $(_vexa_words "$path")"
    fi
}

_vexa() {
    local words open kept kind names lead name
    COMPREPLY=()
    _vexa_split "${COMP_LINE:0:COMP_POINT}"
    _vexa_expected
    case $kind in
        words\ *) read -ra names <<<"${kind#words }" ;;
        directories | files)
            compopt -o filenames -o default 2>/dev/null
            [[ $kind == directories ]] && compopt -o dirnames 2>/dev/null
            return ;;
        ?*) while IFS= read -r name; do names+=("$name"); done \
            < <("$1" __complete "$kind" "${words[@]:1:${#words[@]}-2}" 2>/dev/null) ;;
    esac
    for name in "${names[@]}"; do
        name=$lead$name
        [[ $name == "${words[-1]}"* ]] && COMPREPLY+=("$(_vexa_quoted "${name:${#kept}}" "$open")")
    done
}

complete -F _vexa vexa
)bash";

std::string bashKind(const OptionText& option) {
    if (option.kind == ValueKind::Choice) return "words " + joined(option.choices, " ");
    if (option.kind == ValueKind::Directory) return "directories";
    if (option.kind == ValueKind::File) return "files";
    return askedNames(option.kind);
}

/// A function that prints words for each command.
template <typename Words>
void appendWords(std::ostream& out, const std::string& name, const CommandText& program, Words words) {
    out << '\n' << name << "() {\n    case $1 in\n";
    for (const CommandText* command : allCommands(program)) {
        const std::string list = words(*command);
        if (!list.empty()) out << "        '" << command->path << "') echo '" << list << "' ;;\n";
    }
    out << "    esac\n}\n";
}

std::string commandNames(const CommandText& command) {
    std::vector<std::string> names;
    for (const CommandText& below : command.commands)
        names.push_back(below.name());
    return joined(names, " ");
}

std::string optionNames(const CommandText& command) {
    std::vector<std::string> names;
    for (const OptionText& option : command.options)
        names.push_back(joined(option.names, " "));
    return joined(names, " ");
}

/// Succeeds for each option that takes a value, and each argument.
void appendKinds(std::ostream& out, const CommandText& program) {
    out << "\n_vexa_kind() {\n    kind=''\n    case $1 in\n";
    for (const auto& [words, option] : valuePlaces(program))
        out << "        '" << words << "') kind='" << bashKind(*option) << "' ;;\n";
    out << "        *) return 1 ;;\n    esac\n}\n";
}

}  // namespace

std::string bashCompletion(const CommandText& program) {
    std::ostringstream out;
    out << "# Completes the command line of vexa in bash, made by `vexa completion bash`.\n";
    appendWords(out, "_vexa_words", program, commandNames);
    appendWords(out, "_vexa_options", program, optionNames);
    appendKinds(out, program);
    out << kBashFunctions;
    return out.str();
}

}  // namespace vexa::client
