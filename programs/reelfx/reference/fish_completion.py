"""reelfx in fish."""

from commands import WORDS, settings_of

HEAD = r'''# fish completion for reelfx; written by its build.

# The effect that the line names, else the one of the environment, in small letters.
function __reelfx_effect
    set -l tokens (commandline -opc)
    set -l effect $REELFX_EFFECT
    for i in (seq (count $tokens))
        switch $tokens[$i]
            case @EFFECT_OPTIONS@
                test $i -lt (count $tokens); and set effect $tokens[(math $i + 1)]
            case '--effect=*'
                set effect (string replace -- --effect= '' $tokens[$i])
        end
    end
    string lower -- "$effect" | string unescape
end

# True when the line's words that are no options begin with these.
function __reelfx_command
    set -l words (string match -v -- '-*' (commandline -opc))[2..-1]
    set -l wanted (count $argv)
    test (count $words) -ge $wanted; or return 1
    test "$words[1..$wanted]" = "$argv"
end
'''


def quoted(word):
    return "'" + word.replace("\\", "\\\\").replace("'", "\\'") + "'"


def printing(words):
    return "printf '%s\\n' " + " ".join(quoted(w) for w in words)


def by_effect(function, effects, words_of):
    every = sorted({word for effect in effects for word in words_of(effect)})
    rows = [f"        case {quoted(effect['name'].lower())}\n            {printing(words_of(effect))}" for effect in effects]
    rows.append(f"        case '*'\n            {printing(every)}")
    return f"\nfunction {function}\n    switch \"$argv[1]\"\n" + "\n".join(rows) + "\n    end\nend\n"


def candidates(value):
    found = {"EFFECT": "(__reelfx_effects)", "PRESET": "(__reelfx_presets (__reelfx_effect))",
             "NAME=VALUE": "(__reelfx_settings (__reelfx_effect))", "FOLDER": "(__fish_complete_directories)",
             **{kind: " ".join(words) for kind, words in WORDS.items()}}
    return value.replace("|", " ") if "|" in value else found.get(value, "")


def option_line(condition, option):
    words = ["complete", "-c", "reelfx"] + (["-n", quoted(condition)] if condition else [])
    for name in option.names:
        words += ["-l", name[2:]] if name.startswith("--") else ["-s", name[1:]]
    if option.value == "FILE":
        words += ["-r", "-F"]
    elif option.value:
        words += ["-x"] + (["-a", quoted(candidates(option.value))] if candidates(option.value) else [])
    return " ".join(words + ["-d", quoted(option.help)])


def command_lines(command):
    condition = "__reelfx_command " + " ".join(command.words)
    lines = [option_line(condition, option) for option in command.options]
    for positional in command.positionals[:1]:
        what = "-F" if positional.value == "FILE" else "-a " + quoted(candidates(positional.value))
        lines.append(f"complete -c reelfx -n {quoted(condition)} {what}")
    return lines


def text(program):
    effects = program.effects
    lines = ["", "complete -c reelfx -f"] + [option_line("test (count (commandline -opc)) -eq 1", o) for o in program.options]
    for word, help in program.first_words().items():
        lines.append(f"complete -c reelfx -n 'test (count (commandline -opc)) -eq 1' -a {word} -d {quoted(help)}")
    for group in program.groups:
        for command in (c for c in program.commands if c.words[0] == group):
            lines.append(f"complete -c reelfx -n '__reelfx_command {group}; and test (count (commandline -opc)) -eq 2'"
                         f" -a {command.words[1]} -d {quoted(command.help)}")
    for command in program.commands:
        lines += command_lines(command)
    head = HEAD.replace("@EFFECT_OPTIONS@", " ".join(program.options_taking("EFFECT")))
    return (head + "\nfunction __reelfx_effects\n    " + printing(e["name"] for e in effects) + "\nend\n"
            + by_effect("__reelfx_presets", effects, lambda e: e["presets"])
            + by_effect("__reelfx_settings", effects, settings_of) + "\n".join(lines) + "\n")
