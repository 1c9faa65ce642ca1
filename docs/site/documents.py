"""The Markdown documents of the repository, made ready for the site."""

import json
import os
import re
import shutil

# Where documents lie. The one in the root is the site's first page.
PATTERNS = ["*.md", "docs/*.md", "examples/*/README.md"]
FIRST = "README.md"

# Files and folders of the sources whose place the reference takes.
INSTEAD = {
    "include/secpolicy/secpolicy.h": "reference/SecPolicy.md",
    "include/secpolicy/secpolicy_c.h": "reference/C-interface.md",
    "bindings/python": "reference/python.md",
    "src/platform": "reference/index.md",
}

# What the pages of folders that documents link to are called.
FOLDER_TITLES = {"abi": "The binary interface", "docs/schemas": "JSON schemas"}

LINK = re.compile(r"(?<!!)\[([^\]]*)\]\(([^)\s]+)\)")


class SiteError(Exception):
    """The site can't be built; the text says why."""


def name_in_site(path):
    return "index.md" if path == FIRST else path


def title_of(file):
    """What a file calls itself, or else its name."""
    if file.suffix == ".json":
        return json.loads(file.read_text()).get("title", file.name)
    return file.name


class Staging:
    def __init__(self, repository, source):
        self.repository = repository
        self.source = source
        self.documents = sorted({str(path.relative_to(repository))
                                 for pattern in PATTERNS for path in repository.glob(pattern)})
        self.folders = []

    def copy(self, path):
        target = self.source / path
        target.parent.mkdir(parents=True, exist_ok=True)
        shutil.copyfile(self.repository / path, target)

    def folder_page(self, folder):
        """A page that lists the files of a folder, for links to the folder."""
        page = f"{folder}/index.md"
        if folder in self.folders:
            return page
        self.folders.append(folder)
        if folder not in FOLDER_TITLES:
            raise SiteError(f"docs/site/documents.py: FOLDER_TITLES has no title for {folder}")
        lines = [f"# {FOLDER_TITLES[folder]}", ""]
        for file in sorted((self.repository / folder).rglob("*")):
            if file.is_file() and file.name != "index.md":
                self.copy(str(file.relative_to(self.repository)))
                name = file.relative_to(self.repository / folder)
                lines.append(f"- [{title_of(file)}]({name})")
        (self.source / page).write_text("\n".join(lines) + "\n")
        return page

    def target(self, document, link):
        """Where a link of a document leads in the site."""
        path, mark, anchor = link.partition("#")
        if not path or re.match(r"[a-z]+:", path):
            return link
        wanted = os.path.normpath(os.path.join(os.path.dirname(document), path))
        if not (self.repository / wanted).exists():
            raise SiteError(f"{document}: there is no {wanted}")
        if wanted in INSTEAD:
            wanted = INSTEAD[wanted]
        elif (self.repository / wanted).is_dir():
            wanted = self.folder_page(wanted)
        elif wanted not in self.documents:
            self.copy(wanted)
        here = os.path.dirname(name_in_site(document))
        return os.path.relpath(name_in_site(wanted), here or ".") + mark + anchor

    def stage(self, document):
        """Writes the document with its links as the site needs them; code is left alone."""
        parts = re.split(r"(^```.*?^```)", (self.repository / document).read_text(),
                         flags=re.MULTILINE | re.DOTALL)
        for number in range(0, len(parts), 2):
            parts[number] = LINK.sub(
                lambda found: f"[{found[1]}]({self.target(document, found[2])})", parts[number])
        target = self.source / name_in_site(document)
        target.parent.mkdir(parents=True, exist_ok=True)
        target.write_text("".join(parts))


def stage(repository, source):
    """Copies every document; the names of the pages, by what they are."""
    staging = Staging(repository, source)
    source.mkdir(parents=True)
    for document in staging.documents:
        staging.stage(document)
    pages = [name_in_site(document) for document in staging.documents]
    return {"documents": [page for page in pages if page != "index.md"],
            "folders": [f"{folder}/index.md" for folder in staging.folders]}


# ---- Navigation ----------------------------------------------------------------------------------


def write_navigation(repository, source, pages):
    """Puts the tables of contents that docs/site/navigation says behind the first page.

    A line with a name in braces stands for the pages of that kind. Documents that no line names
    come last: one that somebody adds is found without a change here.
    """
    sections = re.split(r"^## (.*)$", (repository / "docs/site/navigation").read_text(),
                        flags=re.MULTILINE)[1:]
    named = {line for text in sections[1::2] for line in text.splitlines()}
    pages = {**pages, "others": [page for page in pages["documents"] if page not in named]}
    known = {page for group in pages.values() for page in group}
    known |= {"man/index.md", "reference/index.md"}
    with open(source / "index.md", "a") as first:
        for title, text in zip(sections[::2], sections[1::2]):
            wanted = []
            for line in text.split():
                wanted += pages[line[1:-1]] if line.startswith("{") else [line]
            for page in wanted:
                if page not in known:
                    raise SiteError(f"docs/site/navigation: there is no {page}")
            if wanted:
                lines = "\n".join(page.removesuffix(".md") for page in wanted)
                first.write(f"\n```{{toctree}}\n:hidden:\n:caption: {title}\n\n{lines}\n```\n")
