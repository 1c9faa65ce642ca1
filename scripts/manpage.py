"""What the scripts that make manual pages share: scdoc's mark-up, and the call of scdoc."""

import pathlib
import re
import subprocess
import sys

TEXTS = pathlib.Path(__file__).resolve().parent.parent / "docs" / "man"

# Stands for the name in the preamble: scdoc takes no colons there.
PLACEHOLDER = "page"


def escaped(text):
    """`text` where scdoc would take some of it for mark-up."""
    return re.sub(r"([\\_*<>|#~`])", r"\\\1", text)


# What stands between fences is literal, but for backslashes, which scdoc would still interpret.
LITERAL = re.compile(r"^```\n.*?^```$", re.MULTILINE | re.DOTALL)


def literal(text):
    """`text` with the backslashes of its literal blocks doubled."""
    return LITERAL.sub(lambda block: block[0].replace("\\", "\\\\"), text)


def split(text):
    """The first section of a text, and the others."""
    second = re.search(r"^# ", text[1:], re.MULTILINE)
    return (text, "") if second is None else (text[:second.start() + 1], text[second.start() + 1:])


def see_also(pages):
    """The last section of a page, with (name, section) of others."""
    return "# SEE ALSO\n\n" + ", ".join(f"*{name}*({section})" for name, section in pages) + "\n"


def write_page(directory, name, section, body):
    """Typesets a page, without its preamble, into `directory`; ends the program when scdoc can't."""
    source = f"{PLACEHOLDER}({section})\n\n{literal(body)}"
    made = subprocess.run(["scdoc"], input=source.encode(), capture_output=True)
    if made.returncode != 0:
        sys.exit(f"{name}: {made.stderr.decode()}\n{source}")
    page = made.stdout.replace(f'.TH "{PLACEHOLDER}"'.encode(), f'.TH "{name}"'.encode(), 1)
    (directory / f"{name}.{section}").write_bytes(page)
