"""reelfx in zsh, through _arguments."""

from commands import WORDS, settings_of

HEAD = """#compdef reelfx
# Written by the build of reelfx.
"""

# In any case of the letters, as reelfx takes the names.
MATCH = "-M 'm:{a-zA-Z}={A-Za-z}'"

BODY = r'''
# The effect that the line names, else the one of the environment, in small letters.
_reelfx_effect() {
    local effect=${opt_args[--effect]-${opt_args[-e]-${REELFX_EFFECT-}}}
    effect=${effect##*:}  # of several effects, the one typed last
    print -r -- ${(L)${(Q)effect}}
}

_reelfx_preset() {
    local -a found=(${(f)"$(_reelfx_presets "$(_reelfx_effect)")"})
    compadd @MATCH@ -- $found
}

_reelfx_setting() {
    local -a found=(${(f)"$(_reelfx_settings "$(_reelfx_effect)")"})
    if compset -P '*='; then
        local name=${(Q)IPREFIX##*--set=}
        found=(${(M)found:#(#i)${(b)name}?*})
        compadd @MATCH@ -- ${found#*=}
    else
        compadd @MATCH@ -S '' -- ${(u)found/%=*/=}
    fi
}

_reelfx() {
    setopt localoptions extendedglob
    local context state line
    local -A opt_args
    local -a commands=(@FIRST@) common=(@COMMON@)
    _arguments -C $common '1:command:->command' '*::argument:->arguments' && return
    case $state in
        command) _describe -t commands command commands ;;
        arguments) _reelfx_arguments ${line[1]} ;;
    esac
}
'''


def quoted(word):
    return "'" + word.replace("'", "'\\''") + "'"


def action(value):
    simple = {"FILE": "_files", "EFFECT": "_reelfx_effects", "PRESET": "_reelfx_preset", "NAME=VALUE": "_reelfx_setting",
              "FOLDER": "_files -/", **{kind: "(" + " ".join(words) + ")" for kind, words in WORDS.items()}}
    if "|" in value:
        return "(" + value.replace("|", " ") + ")"
    return simple.get(value, "")


def escaped(text):
    for letter in "\\:[]":
        text = text.replace(letter, "\\" + letter)
    return text


def spec(option):
    """The words of an option for _arguments."""
    rest = "[" + escaped(option.help) + "]"
    if option.value:
        rest += ":" + escaped(option.value) + ":" + action(option.value)
    names = [name + "=" if option.value and name.startswith("--") else name for name in option.names]
    others = "*" if option.repeats else "(" + " ".join(option.names) + ")"
    return [quoted(others + name + rest) for name in names]


def place(positional):
    return quoted(f"{'*' if positional.repeats else ''}:{escaped(positional.positional)}:{action(positional.value)}")


def arguments(command, indent):
    words = [w for option in command.options for w in spec(option)] + [place(p) for p in command.positionals]
    return f"{indent}_arguments -s \\\n" + " \\\n".join(f"{indent}    {w}" for w in words)


def printing(words):
    return "print -rl -- " + " ".join(quoted(w) for w in words)


def by_effect(function, effects, words_of):
    every = sorted({word for effect in effects for word in words_of(effect)})
    rows = [f"        {quoted(effect['name'].lower())}) {printing(words_of(effect))} ;;" for effect in effects]
    rows.append(f"        *) {printing(every)} ;;")
    return f"{function}() {{\n    case $1 in\n" + "\n".join(rows) + "\n    esac\n}\n"


def described(words):
    return " ".join(quoted(f"{word}:{escaped(help)}") for word, help in words.items())


def command_cases(program):
    rows = []
    for command in program.commands:
        if len(command.words) == 1:
            rows.append(f"        {command.words[0]})\n{arguments(command, ' ' * 12)} ;;")
    for group, (_, following) in program.groups.items():
        inner = {c.words[1]: c for c in program.commands if c.words[0] == group}
        cases = "\n".join(f"                {word})\n{arguments(c, ' ' * 20)} ;;" for word, c in inner.items())
        first = described({word: c.help for word, c in inner.items()})
        rows.append(f"        {group})\n"
                    "            _arguments -C '1:command:->command' '*::argument:->arguments' && return\n"
                    "            if [[ $state == command ]]; then\n"
                    f"                local -a inner=({first})\n"
                    "                _describe -t commands command inner\n"
                    "                return\n"
                    "            fi\n"
                    f"            case ${{line[1]}} in\n{cases}\n            esac ;;")
    return ("_reelfx_arguments() {\n    local context state line\n    local -A opt_args\n    case $1 in\n"
            + "\n".join(rows) + "\n    esac\n}\n")


def text(program):
    body = BODY.replace("@MATCH@", MATCH)
    body = body.replace("@COMMON@", " ".join(w for option in program.options for w in spec(option)))
    body = body.replace("@FIRST@", described(program.first_words()))
    effects = program.effects
    return "\n".join((
        HEAD,
        f"_reelfx_effects() {{\n    compadd {MATCH} -- " + " ".join(quoted(e["name"]) for e in effects) + "\n}\n",
        by_effect("_reelfx_presets", effects, lambda e: e["presets"]),
        by_effect("_reelfx_settings", effects, settings_of),
        command_cases(program))) + body + "\n_reelfx \"$@\"\n"
