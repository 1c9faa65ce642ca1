"""Makes whole what the distribution's package of the theme lacks in a site of its own."""

import pathlib
import re
import shutil

DARK = re.compile(r'body\[data-theme="dark"\]([^{}]*)\{([^{}]*)\}')


def with_styles(text, directory):
    """A style that refers to another one by a path of a web server takes it from beside it."""
    def beside(found):
        original = pathlib.Path("/usr/share", found[1])
        shutil.copyfile(original, directory / original.name)
        return f"@import url({original.name});"
    return re.sub(r"@import url\(/(javascript/[^)]*)\);", beside, text)


def with_scripts(text, directory):
    """A script that imports another one as a module does, but is loaded as an ordinary one, holds it."""
    return re.sub(r'^import \w+ from "\./([^"]+)";', lambda found: (directory / found[1]).read_text(),
                  text, flags=re.MULTILINE)


def with_dark_colours(text):
    """What is said for readers who chose dark holds too for those whose system is dark."""
    if "prefers-color-scheme" in text:
        return text
    rules = "\n".join(f'body:not([data-theme="light"]){found[1]}{{{found[2]}}}'
                      for found in DARK.finditer(text) if "theme-toggle" not in found[1])
    return f"{text}\n@media screen and (prefers-color-scheme: dark) {{\n{rules}\n}}\n"


def make_whole(static):
    for file in (static / "styles").glob("furo.css"):
        file.write_text(with_dark_colours(with_styles(file.read_text(), file.parent)))
    for file in (static / "scripts").glob("furo.js"):
        file.write_text(with_scripts(file.read_text(), file.parent))
