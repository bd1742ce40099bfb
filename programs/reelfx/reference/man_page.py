"""The man page of reelfx."""

import textwrap

# The date of the last change of the text.
DATE = "2026-11-22"

DESCRIPTION = """\
reelfx makes video look like old film: shake, dust, scratches, worn emulsion, flicker, faded colours and glow. It reads
everything that FFmpeg can read and keeps sound, subtitles, chapters, size, frame rate, times and colours. What OUT cannot hold
is converted or left out, and said on one line on standard error.

The same settings, seed and frames give the same bytes on every machine and with any number of threads, whether a part of a
clip or the whole clip is rendered. Another seed gives other shake, flicker, wear, spots and scratches. With seed 0, flicker
and scratches are those that the effects have in Windows editors.

Only letters and digits count in names of effects, presets and parameters, in either case. A slider takes a number in its range, a colour
#RRGGBB, a menu the text of an item or its number from 0, a check box on or off. Settings are applied in this order: built-in
preset, preset file, each --set.

A setting can change over time: --set "Wear=10@0 60@125" goes evenly from 10 in frame 0 to 60 in frame 125 of the clip. With an s,
positions are seconds since the first frame: "Wear=10@0 60@5s". Before the first point and after the last their values are held.
Menus and check boxes change at their points. A colour goes from one to the other. Positions count from the start of the clip, also
where only a part of it is rendered. Scratches and flicker stay where the largest values of the fade put them.

--then begins another effect, which is applied to the result of those before. Options of an effect (--effect, --preset,
--preset-file, --set, --mix, --seed) belong to the effect in whose place they are typed. --mix 30 makes 30 per cent of an effect's
picture and 70 per cent of the picture before it. With --matte, the damage of all effects is drawn, and effects without damage do
nothing.

With --into, many clips are rendered with the same options, each to a file of its own name in the folder. Names that meet, and
results that would replace a clip, are refused before anything is rendered. A clip that fails is reported, the others are
rendered, and the exit status is that of the first that failed.

With --progress json, each line on standard error that begins with a brace is an object with the fields frame (frames done),
frames (their total number, if known), seconds and fps (since the start), and progress: continue, or end when everything has
been written. A command that fails writes one line of text instead of end. With --into, an object with the fields clip, clips, input
and output comes before each clip.

An image sequence is a pattern with a number (frames-%03d.png), a pattern in quotes ("frames-*.png") or a folder. It begins with
the first number that exists. Images of a sequence that is written are numbered from 1, or from the frame after A with --frames
A:B; where a clip has a variable frame rate, frames are repeated so that images come at a constant rate.

With --hash, a line is printed on standard output for each frame: the word frame, its number in the clip from 0, the word md5,
and the MD5 of its rows of blue, green, red and alpha bytes. FFmpeg's framemd5 gives the same MD5 for the pixel format bgra.
"""

EXAMPLES = (
    ("Render a whole clip with a preset, keeping its sound:",
     'reelfx render in.mp4 out.mp4 --effect "Film Pro" --preset "Super 8" --seed 7'),
    ("Render ten seconds with your own settings:",
     'reelfx render in.mp4 out.mp4 -e "Film Camera" -s "X Jitter=4" -s Flicker=20 --start 1:30 --duration 10'),
    ("Colours and damage in one pass, the damage growing for five seconds:",
     'reelfx render in.mp4 out.mp4 -e "Film Look" -p Sepia --mix 60 --then -e "Film Damage" -s "Wear=0@0 60@5s"'),
    ("Render all clips of a folder:", 'reelfx render clips/*.mp4 --into old -e "Film Express" -p Newsreel'),
    ("Show all presets of an effect on one frame:", 'reelfx sheet in.mp4 sheet.png -e "Film Damage" -n 20'),
    ("Show how scratches move, in one picture:",
     'reelfx strip in.mp4 strip.png -e "Film Damage" -p Shredded --crop 150x500+600+0'),
    ("Use reelfx between two other programs:",
     'ffmpeg -i in.mov -f yuv4mpegpipe - | reelfx render - - -e "Film Look" -p Sepia | ffplay -'),
    ("Send MP4 with sound to another program:",
     'reelfx render in.mkv - -e "Film Look" -p Sepia --format mp4 | ffplay -'),
    ("Render all scans of a folder as a film:", 'reelfx render scans out.mov -e "Film Pro" -p "Super 8" --rate 24'),
)


def escaped(text):
    text = text.replace("\\", "\\e").replace("-", "\\-").replace("'", "\\(aq")
    return "\\&" + text if text.startswith(".") else text


def paragraphs(text):
    return "\n.PP\n".join(escaped(" ".join(part.split())) for part in text.strip().split("\n\n"))


def wrapped(line):
    """Wraps text; requests are not wrapped."""
    return line if line.startswith(".") else textwrap.fill(line, 78, break_long_words=False, break_on_hyphens=False)


def synopsis(command):
    words = [r"[\fIOPTION\fR]..."] if command.options else []
    for positional in command.positionals:
        name = rf"\fI{positional.positional}\fR" + ("..." if positional.repeats else "")
        words.append(name if positional.required else f"[{name}]")
    return rf"\fBreelfx {' '.join(command.words)}\fR " + " ".join(words)


def option_names(option):
    names = ", ".join(rf"\fB{escaped(name)}\fR" for name in option.names)
    return names + (rf" \fI{escaped(option.value)}\fR" if option.value else "")


def sentence(text):
    text = text[0].upper() + text[1:]
    return escaped(text if text.endswith(".") else text + ".")


def option_entry(option):
    more = [f"Default: {escaped(option.default)}."] if option.default else []
    more += [rf"The environment variable \fB{option.environment}\fR sets the default."] if option.environment else []
    return "\n".join([".TP", option_names(option), sentence(option.help), *more])


def same(one, other):
    return (one.names, one.help) == (other.names, other.help)


def command_section(command, render):
    """Options that are documented for `render` are only named."""
    parts = [f'.SS "{synopsis(command)}"', sentence(command.help)]
    for positional in command.positionals:
        parts += [".TP", rf"\fI{positional.positional}\fR", sentence(positional.help)]
    known = [o for o in command.options if command is not render and any(same(o, r) for r in render.options)]
    parts += [option_entry(option) for option in command.options if option not in known and option.short != "-h"]
    names = [rf"\fB{escaped(option.long)}\fR" for option in known if option.short != "-h"]
    if names:
        listed = ", ".join(names[:-1]) + " and " + names[-1] if len(names) > 1 else names[0]
        parts += [".PP", f"Also, as for \\fBrender\\fR: {listed}."]
    return parts


def effect_entry(effect):
    names = []
    for parameter in effect["parameters"]:
        if parameter["name"] not in names:
            names.append(parameter["name"])
    return [".TP", rf"\fB{escaped(effect['name'])}\fR", "Parameters: " + escaped(", ".join(names)) + ".", ".IP",
            "Presets: " + escaped(", ".join(effect["presets"])) + "."]


def text(program):
    render = next(c for c in program.commands if c.words == ["render"])
    lines = [r'.\" Written by the build of reelfx.', f'.TH REELFX 1 {DATE} "reelfx {program.version}" "User Commands"']
    lines += [".SH NAME", "reelfx \\- " + escaped(program.help[0].lower() + program.help[1:].rstrip("."))]
    lines += [".SH SYNOPSIS", ".nf", *(synopsis(command) for command in program.commands), ".fi"]
    lines += [".SH DESCRIPTION", paragraphs(DESCRIPTION), ".SH COMMANDS"]
    for command in sorted(program.commands, key=lambda c: c is not render):
        lines += command_section(command, render)
    lines += [".PP", r"Every command has \fB\-h\fR, \fB\-\-help\fR, which prints its options."]
    lines += [".SH EFFECTS", *(line for effect in program.effects for line in effect_entry(effect))]
    lines.append(".SH ENVIRONMENT")
    for name, option in program.environment():
        lines += [".TP", rf"\fB{name}\fR", rf"Default of \fB{escaped(option.long)}\fR."]
    lines.append(".SH EXIT STATUS")
    for code in program.exits:
        lines += [".TP", rf"\fB{code['code']}\fR", sentence(code["detail"])]
    lines += [".PP", escaped(program.interrupt), ".SH EXAMPLES"]
    for what, command in EXAMPLES:
        lines += [escaped(what), ".PP", ".RS 4", ".nf", escaped(command), ".fi", ".RE", ".PP"]
    lines.pop()
    lines += [".SH SEE ALSO", r"\fBreelfx\-farm\-join\fR(1), \fBreelfx\-farm\-slurm\fR(1), \fBffmpeg\fR(1), \fBmelt\fR(1)"]
    text = "\n".join(lines)
    kept = text.split(".nf\n")  # unfilled lines end at ".fi"
    filled = ["\n".join(wrapped(line) for line in part.split("\n")) for part in kept[:1]]
    for part in kept[1:]:
        shown, _, rest = part.partition("\n.fi")
        filled.append(shown + "\n.fi" + "\n".join(wrapped(line) for line in rest.split("\n")))
    return ".nf\n".join(filled) + "\n"
