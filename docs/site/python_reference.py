"""The reference of the Python package, by Sphinx's autodoc."""

import ast

from documents import SiteError

PACKAGE = "bindings/python/secpolicy"

# The page's groups. Each name of the package's __all__ is in one of them.
GROUPS = {
    "Hosts and policies": ["Host", "Policy", "version"],
    "Results": ["LoadResult", "LoadMessage", "CheckReport", "Finding", "Severity", "HeldPolicy",
                "Domain", "Object", "Tardisk", "Answer", "Match", "Rule", "Decision", "Place"],
    "Exceptions": ["SecPolicyError", "LibraryError", "InvalidArgumentError", "BadRequestError",
                   "HostError", "LoadError", "LoadTerminatedError", "OutOfMemoryError",
                   "SystemFailure"],
}

TOP = """# Python package

`import secpolicy`: the names of the package. [Bindings](../docs/bindings.md) shows how they are used.
"""


def exported(package):
    """The names in __all__."""
    for node in ast.parse((package / "__init__.py").read_text()).body:
        if isinstance(node, ast.Assign) and node.targets[0].id == "__all__":
            return ast.literal_eval(node.value)
    raise SiteError(f"{package}/__init__.py: there is no __all__")


def definitions(package):
    """Classes and functions of the package's modules, by their names."""
    kinds = (ast.ClassDef, ast.FunctionDef)
    return {node.name: node for file in sorted(package.glob("_*.py"))
            for node in ast.parse(file.read_text()).body if isinstance(node, kinds)}


def undocumented(name, node):
    """The node and its public members, as far as they have no docstring."""
    if not ast.get_docstring(node):
        yield name
    for member in node.body if isinstance(node, ast.ClassDef) else []:
        if isinstance(member, (ast.ClassDef, ast.FunctionDef)) and not member.name.startswith("_"):
            yield from undocumented(f"{name}.{member.name}", member)


def check(repository):
    """Throws SiteError for a public name without a docstring or without a place on the page."""
    package = repository / PACKAGE
    names = exported(package)
    known = definitions(package)
    bare = [each for name in names for each in undocumented(name, known[name])]
    if bare:
        raise SiteError(f"{PACKAGE}: names are not documented: {', '.join(bare)}")
    grouped = [name for group in GROUPS.values() for name in group]
    if sorted(grouped) != sorted(names):
        different = sorted(set(grouped) ^ set(names))
        raise SiteError(f"docs/site/python_reference.py: in GROUPS or in __all__ of {PACKAGE}, but "
                        f"not in both: {', '.join(different)}")


def directive(name):
    if name == "version":
        return ".. autofunction:: secpolicy.version\n"
    kind = "autoexception" if name in GROUPS["Exceptions"] else "autoclass"
    return f".. {kind}:: secpolicy.{name}\n   :members:\n   :undoc-members:\n   :show-inheritance:\n"


def stage(repository, source):
    """Writes the page."""
    check(repository)
    parts = [TOP, "```{eval-rst}\n.. py:module:: secpolicy\n```\n"]
    for title, names in GROUPS.items():
        parts.append(f"## {title}\n")
        parts += [f"```{{eval-rst}}\n{directive(name)}```\n" for name in names]
    (source / "reference/python.md").write_text("\n".join(parts))
