#include <sstream>

#include "client/shell/Completion.h"

namespace vexa::client {

namespace {

constexpr const char* kPowerShellHead =
    R"ps(# Completes the command line of vexa in PowerShell, made by `vexa completion powershell`.

Register-ArgumentCompleter -Native -CommandName vexa, vexa.exe -ScriptBlock {
    param($wordToComplete, $commandAst, $cursorPosition)
)ps";

constexpr const char* kPowerShellTail = R"ps(
    $all = @($commandAst.CommandElements | Where-Object { $_.Extent.EndOffset -lt $cursorPosition } | ForEach-Object {
            if ($_ -is [System.Management.Automation.Language.StringConstantExpressionAst]) { $_.Value }
            else { $_.Extent.Text }
        })
    $words = @($all | Select-Object -Skip 1)
    $path = ''
    $place = 1
    $option = ''
    foreach ($word in $words) {
        if ($option) { $option = '' }
        elseif ($word.StartsWith('-', 'Ordinal')) { if ($values.ContainsKey("$path $word")) { $option = $word } }
        elseif ($commands[$path] -and $commands[$path].Contains($word)) { $path = "$path $word".Trim() }
        else { $place++ }
    }
    $key = if ($option) { "$path $option" } else { "$path $place" }
    # Not [ordered], which takes CAFE for Cafe.
    $found = [System.Collections.Specialized.OrderedDictionary]::new()
    if (-not $option -and $wordToComplete.StartsWith('-', 'Ordinal')) { $found = $options[$path] }
    elseif ($values.ContainsKey($key)) {
        $kind, $rest = $values[$key]
        if ($kind -eq 'words') { foreach ($name in $rest) { $found[$name] = $name } }
        elseif ($kind) {
            $encoding = [Console]::OutputEncoding
            try {
                [Console]::OutputEncoding = [System.Text.UTF8Encoding]::new($false)
                foreach ($name in @(& $all[0] __complete $kind @words 2>$null)) { $found[$name] = $name }
            }
            finally { [Console]::OutputEncoding = $encoding }
        }
    }
    elseif ($commands[$path]) { $found = $commands[$path] }
    $typed = $wordToComplete.Trim([char[]]"'""")
    # Not .Keys, which would be the value of a name that reads so.
    foreach ($one in $found.GetEnumerator()) {
        $name = $one.Key
        if (-not $name -or -not $name.StartsWith($typed, 'OrdinalIgnoreCase')) { continue }
        # Curly apostrophes end a text, too.
        $quoted = [System.Management.Automation.Language.CodeGeneration]::EscapeSingleQuotedStringContent($name)
        $text = if ($name -match '^[\w./-]+$') { $name } else { "'$quoted'" }
        [System.Management.Automation.CompletionResult]::new($text, $name, 'ParameterValue', $one.Value)
    }
}
)ps";

std::string powerShellQuoted(const std::string& text) {
    return "'" + escapedText(text, "'", "'") + "'";
}

std::string powerShellKind(const OptionText& option) {
    if (option.kind != ValueKind::Choice) return "@(" + powerShellQuoted(askedNames(option.kind)) + ")";
    std::string text = "@('words'";
    for (const std::string& choice : option.choices)
        text += ", " + powerShellQuoted(choice);
    return text + ")";
}

/// Tables of what can be chosen from at each command.
template <typename Append>
void appendTable(std::ostream& out, const char* name, const CommandText& program, Append append) {
    out << "    $" << name << " = @{\n";
    for (const CommandText* command : allCommands(program)) {
        out << "        " << powerShellQuoted(command->path) << " = [ordered]@{";
        append(*command);
        out << " }\n";
    }
    out << "    }\n";
}

void appendValues(std::ostream& out, const CommandText& program) {
    out << "    $values = @{\n";
    for (const auto& [words, option] : valuePlaces(program))
        out << "        " << powerShellQuoted(words) << " = " << powerShellKind(*option) << '\n';
    out << "    }\n";
}

}  // namespace

std::string powerShellCompletion(const CommandText& program) {
    std::ostringstream out;
    out << kPowerShellHead;
    const auto append = [&out](const std::string& word, const std::string& description) {
        out << " " << powerShellQuoted(word) << " = " << powerShellQuoted(description) << ";";
    };
    appendTable(out, "commands", program, [&](const CommandText& command) {
        for (const CommandText& below : command.commands)
            append(below.name(), below.description);
    });
    appendTable(out, "options", program, [&](const CommandText& command) {
        for (const OptionText& option : command.options) {
            for (const std::string& name : option.names)
                append(name, option.description);
        }
    });
    appendValues(out, program);
    out << kPowerShellTail;
    return out.str();
}

}  // namespace vexa::client
