"""The reference of the headers that programs and platforms include."""

import itertools
import pathlib
import re
import subprocess
import xml.etree.ElementTree as ElementTree

from documents import SiteError

# Folders of headers in the order in which they are shown, and where they are installed.
FOLDERS = {
    "include/secpolicy": "secpolicy",
    "include/secpolicy/host": "secpolicy/host",
    "src/platform": "secpolicy/platform",
}

# Headers with a page of their own, which have no namespace to be found by.
TITLES = {"secpolicy/secpolicy_c.h": "C interface"}

# "---- Title ----" in a comment of C, on a line of its own.
TITLE_IN_C = re.compile(r"^/\* -{4,} (.*?) -{2,} \*/$")


def undocumented_enumerators(xml):
    """Those that Doxygen lets pass."""
    for file in sorted(xml.glob("*.xml")):
        for value in ElementTree.parse(file).iter("enumvalue"):
            texts = [value.find(part) for part in ("briefdescription", "detaileddescription")]
            if not any("".join(text.itertext()).strip() for text in texts):
                yield value.findtext("name")


def leave_out_private(xml):
    """What stands behind "private:" is nobody's but the class's."""
    for file in [*xml.glob("class*.xml"), *xml.glob("struct*.xml")]:
        tree = ElementTree.parse(file)
        for compound in tree.getroot().iter("compounddef"):
            for section in compound.findall("sectiondef"):
                if section.get("kind", "").startswith("private"):
                    compound.remove(section)
        tree.write(file, encoding="utf-8", xml_declaration=True)


def leave_out_second_names(file):
    """From a header of C: a type that is defined under the name of its tag is shown once."""
    tree = ElementTree.parse(file)
    header = tree.getroot().find("compounddef")
    tags = {inner.text for inner in header.findall("innerclass")}
    tags |= {member.findtext("name") for member in header.iter("memberdef")
             if member.get("kind") == "enum"}
    for section in header.findall("sectiondef"):
        for member in section.findall("memberdef"):
            if member.get("kind") == "typedef" and member.findtext("name") in tags:
                section.remove(member)
    tree.write(file, encoding="utf-8", xml_declaration=True)


def described(repository, out):
    """Has Doxygen read the headers; its XML, in `out`. Throws SiteError for what it complains of."""
    settings = (repository / "docs/site/Doxyfile").read_text()
    pathlib.Path(out).mkdir(parents=True, exist_ok=True)
    try:
        made = subprocess.run(["doxygen", "-"], input=f"{settings}\nOUTPUT_DIRECTORY = {out}\n",
                              cwd=repository, capture_output=True, text=True)
    except FileNotFoundError:
        raise SiteError("doxygen is not installed") from None
    if made.returncode != 0 or made.stderr:
        raise SiteError(f"Doxygen:\n{made.stderr}")
    xml = pathlib.Path(out) / "xml"
    bare = sorted(set(undocumented_enumerators(xml)))
    if bare:
        raise SiteError(f"enumerators are not documented: {', '.join(bare)}")
    return xml


# ---- Pages ---------------------------------------------------------------------------------------


def compound(file):
    return ElementTree.parse(file).getroot().find("compounddef")


def line_of(described):
    return int(described.find("location").get("line"))


def directive(kind, name, *options):
    return f"```{{eval-rst}}\n.. doxygen{kind}:: {name}\n{''.join(options)}```\n"


class CHeader:
    """A header of C, in its own order and with its own titles."""

    def __init__(self, file, path):
        found = compound(file)
        parts = [(number, f"## {title[1]}\n")
                 for number, line in enumerate(path.read_text().splitlines(), 1)
                 if (title := TITLE_IN_C.match(line))]
        for inner in found.findall("innerclass"):
            one = compound(file.parent / f"{inner.get('refid')}.xml")
            parts.append((line_of(one), directive(one.get("kind"), inner.text, "   :members:\n")))
        for member in found.iter("memberdef"):
            parts.append((line_of(member), directive(member.get("kind"), member.findtext("name"))))
        self.parts = [part for _, part in sorted(parts)]


class Namespace:
    """A namespace's types, and its other names by their titles in the headers."""

    def __init__(self, file, xml):
        found = compound(file)
        self.name = found.findtext("compoundname")
        texts = [found.find(part) for part in ("briefdescription", "detaileddescription")]
        self.purpose = " ".join("".join(text.itertext()).strip() for text in texts).strip()
        self.places = set()
        self.parts = []
        types = [compound(xml / f"{inner.get('refid')}.xml") for inner in found.findall("innerclass")]
        if types:
            self.parts.append("## Types\n")
        for one in sorted(types, key=line_of):
            self.add(one, one.get("kind"), one.findtext("compoundname"), "   :members:\n")
        for section in found.findall("sectiondef"):
            if section.find("header") is not None:
                text = "".join(section.find("description").itertext()) if section.find(
                    "description") is not None else ""
                self.parts.append(f"## {section.findtext('header')}\n\n{text}\n")
            for member in section.findall("memberdef"):
                self.add(member, member.get("kind"), f"{self.name}::{member.findtext('name')}")

    def add(self, described, kind, name, *options):
        self.places.add(described.find("location").get("file"))
        self.parts.append(directive(kind, name, *options))

    def is_shown(self):
        return bool(self.parts) and not self.name.endswith("::Internal")


def top_of(header):
    """The comment that a header begins with, as text."""
    text = header.read_text()
    if text.startswith("/*"):
        return re.sub(r"^ \*? ?", "", text[2:text.index("*/")], flags=re.MULTILINE).strip()
    lines = itertools.takewhile(lambda line: line.startswith("//"), text.splitlines())
    return "\n".join(re.sub("^// ?", "", line) for line in lines)


def headers(repository):
    """All headers in their order: what one writes to include them, and their files."""
    for folder, installed in FOLDERS.items():
        for path in sorted((repository / folder).glob("*.h")):
            yield f"{installed}/{path.name}", path


def stage(repository, xml, source):
    """Writes a page for each namespace and each header without one, and one that lists them."""
    leave_out_private(xml)
    for file in xml.glob("*_8h.xml"):
        leave_out_second_names(file)
    namespaces = [Namespace(file, xml) for file in sorted(xml.glob("namespace*.xml"))
                  if not file.name.endswith("_8dox.xml")]
    texts = {}
    for header, path in headers(repository):
        # Doxygen's places begin below the folders that its settings strip.
        place = str(path.relative_to(repository)).partition("/")[2]
        top = f"`<{header}>`: {top_of(path)}\n"
        shown = [one for one in namespaces if place in one.places and one.is_shown()]
        for one in shown:
            texts.setdefault(one.name, [[], one.parts])[0].append(top)
        if not shown:
            file = xml / f"{path.name.replace('_', '__').replace('.', '_8')}.xml"
            texts[TITLES[header]] = [[top], CHeader(file, path).parts]
    (source / "reference").mkdir()
    index = [(repository / "docs/site/reference.md").read_text(), ""]
    names = []
    purposes = {one.name: f": {one.purpose}" for one in namespaces}
    for title, (tops, parts) in texts.items():
        names.append(title.replace("::", "-").replace(" ", "-"))
        (source / f"reference/{names[-1]}.md").write_text(
            "\n".join([f"# {title}\n", *tops, *parts]))
        index.append(f"- [{title}]({names[-1]}.md){purposes.get(title, '')}")
    names.append("python")
    index += ["- [Python package](python.md)", "", "```{toctree}", ":hidden:", "", *names, "```", ""]
    (source / "reference/index.md").write_text("\n".join(index))
