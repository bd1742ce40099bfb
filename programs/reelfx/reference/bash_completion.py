"""reelfx in bash: candidates may hold spaces and "=", and may be typed with quotes or backslashes."""

from commands import WORDS, settings_of

BODY = r'''
# The effect that the line names, else the one of the environment, in small letters.
_reelfx_effect()
{
    local i effect=${REELFX_EFFECT-}
    for ((i = 1; i < cword; ++i)); do
        case ${words[i]} in
            @EFFECT_OPTIONS@) effect=${words[i + 1]} ;;
            --effect=*) effect=${words[i]#*=} ;;
        esac
    done
    effect=${effect//[\"\'\\]/}
    printf '%s' "${effect,,}"
}

# Offers those of the lines on standard input that begin as `cur` does, in any case of the letters.
_reelfx_offer()
{
    local quote= typed=${cur//\\/} before= candidate
    [[ $cur == [\"\']* ]] && quote=${cur:0:1} typed=${cur:1}
    # Outside quotes a word of readline's begins behind each "=".
    [[ -z $quote ]] && before=${typed%"${typed##*=}"}
    while IFS= read -r candidate; do
        [[ ${candidate,,} == "${typed,,}"* ]] || continue
        [[ $candidate == *= ]] && compopt -o nospace
        [[ -n $quote ]] || printf -v candidate %q "${candidate:${#before}}"
        COMPREPLY+=("$candidate")
    done
}

_reelfx()
{
    local cur prev words cword i command= value=
    _get_comp_words_by_ref -n := cur prev words cword || return
    for ((i = 1; i < cword; ++i)); do
        case "$command ${words[i]}" in
@FIND_COMMAND@
        esac
    done
    [[ $cur == --*=* ]] && prev=${cur%%=*} cur=${cur#*=}
    case $prev in
@VALUES@
    esac
    [[ -z $value && $cur != -* ]] && case $command in
@POSITIONALS@
    esac
    case $value in
        FILE) compopt -o default ;;
        EFFECT) _reelfx_offer < <(_reelfx_effects) ;;
        PRESET) _reelfx_offer < <(_reelfx_presets "$(_reelfx_effect)") ;;
        NAME=VALUE) _reelfx_offer < <(_reelfx_settings "$(_reelfx_effect)") ;;
        FOLDER) _filedir -d ;;
@WORDS@
        *\|*) _reelfx_offer < <(tr '|' '\n' <<< "$value") ;;
        '') _reelfx_offer < <(_reelfx_words "$command") ;;
    esac
}
complete -F _reelfx reelfx
'''


def quoted(word):
    return "'" + word.replace("'", "'\\''") + "'"


def lines(words):
    return "printf '%s\\n' " + " ".join(quoted(w) for w in words)


def by_effect(function, effects, words_of):
    """A function that prints the words of the effect that it is given, or of all."""
    every = sorted({word for effect in effects for word in words_of(effect)})
    rows = [f"        {quoted(effect['name'].lower())}) {lines(words_of(effect))} ;;" for effect in effects]
    rows.append(f"        *) {lines(every)} ;;")
    return f"{function}()\n{{\n    case $1 in\n" + "\n".join(rows) + "\n    esac\n}\n"


def words_of_commands(program):
    rows = []
    for command in program.commands:
        names = [name for option in command.options for name in option.names]
        rows.append(f"        {quoted(' '.join(command.words))}) {lines(names)} ;;")
    for group, (_, following) in program.groups.items():
        rows.append(f"        {quoted(group)}) {lines(following)} ;;")
    rows.append(f"        *) {lines([*program.first_words(), *(n for o in program.options for n in o.names)])} ;;")
    return "_reelfx_words()\n{\n    case $1 in\n" + "\n".join(rows) + "\n    esac\n}\n"


def text(program):
    known = sorted({" ".join(c.words[:n]) for c in program.commands for n in range(1, len(c.words) + 1)})
    finding = []
    for path in known:
        before, _, word = path.rpartition(" ")
        finding.append(f"            {quoted(before + ' ' + word)}) command={quoted(path)} ;;")
    values = [f"        {'|'.join(names)}) value={quoted(value)} ;;" for names, value in program.valued_options().items()]
    places = [f"        {quoted(' '.join(c.words))}) value={c.positionals[0].value} ;;" for c in program.commands
              if c.positionals]
    words = [f"        {kind}) _reelfx_offer < <({lines(known)}) ;;" for kind, known in WORDS.items()]
    body = BODY
    for mark, replacement in (("@EFFECT_OPTIONS@", "|".join(program.options_taking("EFFECT"))),
                              ("@FIND_COMMAND@", "\n".join(finding)), ("@VALUES@", "\n".join(values)),
                              ("@POSITIONALS@", "\n".join(places)), ("@WORDS@", "\n".join(words))):
        body = body.replace(mark, replacement)
    effects = program.effects
    return "\n".join((
        "# bash completion for reelfx; written by its build.\n",
        "_reelfx_effects()\n{\n    " + lines(e["name"] for e in effects) + "\n}\n",
        by_effect("_reelfx_presets", effects, lambda e: e["presets"]),
        by_effect("_reelfx_settings", effects, settings_of),
        words_of_commands(program))) + body
