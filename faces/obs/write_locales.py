"""Writes OBS' locale files from the library's language file:   write_locales.py LANGUAGE-FILE FOLDER"""

import re
import sys
import xml.etree.ElementTree as xml
from pathlib import Path

# OBS names a language with its country. Codes without a row have none of their own in OBS.
LOCALES = {"en": ["en-US"], "de": ["de-DE"], "fr": ["fr-FR"], "es": ["es-ES"], "it": ["it-IT"], "pt": ["pt-BR", "pt-PT"],
           "nl": ["nl-NL"], "sv": ["sv-SE"], "pl": ["pl-PL"], "cs": ["cs-CZ"], "tr": ["tr-TR"], "ru": ["ru-RU"],
           "ja": ["ja-JP"], "zh": ["zh-CN"], "ko": ["ko-KR"]}
# Categories of texts that the filters use; of some only the named ones.
CATEGORIES = {4: ["Preset Files"], 9: ["Camera", "New seed", "Seed"], 10: None, 12: None}


def key_of(english):
    return re.sub("[^A-Za-z0-9]", "", english)


def texts_of(language):
    texts = {}
    for category in language.iter("category"):
        wanted = CATEGORIES.get(int(category.get("id")), [])
        for text in category.iter("text"):
            english = text.get("key")
            if wanted is None or english in wanted:
                key = key_of(english)
                if key in texts and texts[key] != text.text:
                    sys.exit(f"{language.get('code')}: two texts have the key {key}")
                texts[key] = " ".join(text.text.split())
    return texts


def main():
    folder = Path(sys.argv[2])
    folder.mkdir(parents=True, exist_ok=True)
    for language in xml.parse(sys.argv[1]).getroot().iter("language"):
        lines = [f'{key}="{text}"\n' for key, text in texts_of(language).items()]
        if any(line.count('"') != 2 for line in lines):
            sys.exit(f"{language.get('code')}: a text holds a quotation mark")
        for locale in LOCALES.get(language.get("code"), []):
            (folder / f"{locale}.ini").write_text("".join(lines), encoding="utf-8")


main()
