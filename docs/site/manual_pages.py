"""The manual pages, as pages of the site."""

import re
import subprocess

from documents import SiteError

SECTION = re.compile(r'<section class="Sh">\s*<h1[^>]*>(?:<a[^>]*>)?(.*?)(?:</a>)?</h1>(.*?)'
                     r'</section>(?=\s*(?:<section class="Sh">|</div>\s*$))', re.DOTALL)
TITLES = {"1": "Commands", "3": "Library functions", "5": "File formats",
          "7": "Overviews", "8": "Commands"}


def sections(page):
    """The page's sections, as titles and HTML."""
    made = subprocess.run(["mandoc", "-T", "html", "-O", "fragment", page], capture_output=True,
                          text=True)
    if made.returncode != 0:
        raise SiteError(f"mandoc: {page}: {made.stderr}")
    text = re.sub(r'<table class="(head|foot)">.*?</table>', "", made.stdout, flags=re.DOTALL)
    # An empty paragraph is a gap too many, and a section's parts stand one level below its title.
    text = re.sub(r'<p class="Pp">\s*</p>\n?', "", text.strip())
    text = re.sub(r"<(/?)h2\b", r"<\1h3", text)
    found = SECTION.findall(text)
    if not found:
        raise SiteError(f"{page}: no section was found")
    return found


def linked(text, names):
    """`text` with a link where it names another page or a document."""
    def link(found):
        name = names.get(f"{found[1]}.{found[2]}")
        return f'<a href="{place(name)}.html">{found[0]}</a>' if name else found[0]
    text = re.sub(r"<[bi]>([\w:.-]+)</[bi]>\((\d)\)", link, text)
    return re.sub(r"<i>(docs/[\w-]+)\.md</i>", r'<a href="../\1.html">\g<0></a>', text)


def place(name):
    """Where a page lies: a link that begins with a word and a colon leads to another kind of address."""
    return name.replace("::", ".")


def other_name(page):
    """The page that this one is only another name of; None for a page of its own."""
    if page.is_symlink():
        return page.resolve().name
    found = re.match(r"\.so\s+(\S+)", page.read_text())
    return found[1].rpartition("/")[2] if found else None


def written(page, names):
    """The page's source and the line that says what it is."""
    parts = [(title, linked(text.strip(), names)) for title, text in sections(page)]
    lines = [f"# {page.stem}({page.suffix[1:]})\n"]
    for title, text in parts:
        lines.append(f'## {title}\n\n```{{raw}} html\n<div class="manual-text">{text}</div>\n```\n')
    purpose = re.sub(r"<[^>]*>", "", parts[0][1]).partition(" - ")[2]
    return "\n".join(lines), " ".join(purpose.split())


def stage(directory, source):
    """Writes a page for each manual page of `directory`, and one that lists them."""
    pages = sorted((path for path in directory.glob("*.[1-9]") if path.is_file()),
                   key=lambda path: (path.suffix, path.name))
    if not pages:
        raise SiteError(f"there are no manual pages in {directory}")
    names = {page.name: other_name(page) or page.name for page in pages}
    (source / "man").mkdir()
    index = ["# Manual pages\n"]
    section = ""
    for page in pages:
        if names[page.name] != page.name:
            continue
        text, purpose = written(page, names)
        (source / f"man/{place(page.name)}.md").write_text(text)
        if page.suffix != section:
            section = page.suffix
            index.append(f"\n## {section[1:]}: {TITLES.get(section[1:], 'Others')}\n")
        index.append(f"- [{page.stem}({page.suffix[1:]})]({place(page.name)}.md): {purpose}")
    index.append("\n```{toctree}\n:hidden:\n")
    index += [place(name) for name in names if names[name] == name]
    (source / "man/index.md").write_text("\n".join([*index, "```\n"]))
