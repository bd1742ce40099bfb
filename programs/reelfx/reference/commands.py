"""The commands, options and effects of reelfx, as the man page and the completions need them."""


class Option:
    def __init__(self, json):
        self.names = json["names"]
        self.positional = json["positional"]  # the name, else empty
        self.required = json["required"]
        self.value = json["value"]  # what it takes: "FILE", "EFFECT", "one|other"; empty for a flag
        self.repeats = json["repeats"]
        self.default = json["default"]
        self.environment = json["environment"]
        self.help = json["help"]

    @property
    def short(self):
        return next((n for n in self.names if not n.startswith("--")), None)

    @property
    def long(self):
        return next((n for n in self.names if n.startswith("--")), None)


class Command:
    """A command that can be run, such as "preset show", but not "preset" by itself."""

    def __init__(self, words, json):
        self.words = words
        self.help = json["help"]
        every = [Option(option) for option in json["options"]]
        self.options = [option for option in every if option.names]
        self.positionals = [option for option in every if not option.names]


class Program:
    def __init__(self, json, effects):
        self.help = json["help"]
        self.version = json["version"]
        self.exits = json["exits"]
        self.interrupt = json["interrupt"]
        self.effects = effects
        self.options = [Option(option) for option in json["options"]]
        self.commands = []
        self.groups = {}  # a word that needs a second word: its help and the possible second words
        self._add([], json)

    def _add(self, words, json):
        for child in json["commands"]:
            path = words + [child["name"]]
            if child["commands"]:
                self.groups[" ".join(path)] = child["help"], [c["name"] for c in child["commands"]]
                self._add(path, child)
            else:
                self.commands.append(Command(path, child))

    def first_words(self):
        """The first words of all commands, with their help."""
        words = {}
        for command in self.commands:
            first = command.words[0]
            words[first] = self.groups[first][0] if first in self.groups else command.help
        return words

    def options_taking(self, value):
        """The names of all options that take this kind of value."""
        return sorted({n for c in self.commands for o in c.options if o.value == value for n in o.names})

    def valued_options(self):
        """The kind of value by the names of the option, for all options that take one."""
        found = {}
        for command in self.commands:
            for option in command.options:
                if option.value:
                    found[tuple(option.names)] = option.value
        return found

    def environment(self):
        found = {}
        for command in self.commands:
            for option in command.options:
                if option.environment:
                    found[option.environment] = option
        return sorted(found.items())


def settings_of(effect):
    """What can follow --set; words that end in "=" need a value."""
    words = []
    for parameter in effect["parameters"]:
        name = parameter["name"] + "="
        if parameter["kind"] == "menu":
            words += [name + item for item in parameter["items"]]
        elif parameter["kind"] == "check box":
            words += [name + "on", name + "off"]
        elif name not in words:
            words.append(name)
    return words


# Commonly used ones; the options take any that FFmpeg has.
WORDS = {
    "CODEC": ("ffv1", "libaom-av1", "libsvtav1", "libvpx-vp9", "libx264", "libx265", "mjpeg", "mpeg4", "png", "prores_ks",
              "qtrle"),
    "FORMAT": ("avi", "gif", "image2", "matroska", "mov", "mp4", "mpegts", "mxf", "nut", "ogg", "webm", "yuv4mpegpipe"),
    "PIXELS": ("bgra", "gbrp", "gray", "rgb24", "rgb48le", "rgba", "rgba64le", "yuv420p", "yuv420p10le", "yuv422p",
               "yuv422p10le", "yuv444p", "yuv444p10le", "yuva420p", "yuva444p10le"),
}
