"""What the documentation site is made of; read by Sphinx from scripts/site."""

import pathlib
import re
import sys

REPOSITORY = pathlib.Path(__file__).resolve().parent.parent.parent

project = "libsecpolicy"
release = re.search(r"project\(SecPolicy VERSION (\S+)",
                    (REPOSITORY / "CMakeLists.txt").read_text())[1]
html_title = f"{project} {release}"

extensions = ["myst_parser", "breathe", "sphinx.ext.autodoc"]
source_suffix = {".md": "markdown"}
root_doc = "index"
language = "en"
# Texts of messages are quoted to the letter.
smartquotes = False

# Headings are targets under the names that Git hosts give them.
myst_heading_anchors = 4

breathe_default_project = "secpolicy"
breathe_domain_by_extension = {"h": "cpp"}
breathe_domain_by_file_pattern = {"*_c.h": "c"}
breathe_show_include = False

# The Python package is imported from the sources; its docstrings mark code with single backticks.
sys.path.insert(0, str(REPOSITORY / "bindings" / "python"))
default_role = "literal"
autoclass_content = "both"
autodoc_member_order = "bysource"
python_use_unqualified_type_names = True

pygments_style = "default"
pygments_dark_style = "github-dark"
highlight_language = "none"

# Light and dark as the reader's system has it, narrow screens, and no font from elsewhere.
html_theme = "furo"
html_theme_options = {"navigation_with_keys": True}
html_static_path = [str(pathlib.Path(__file__).parent / "static")]
html_css_files = ["site.css"]
html_copy_source = False
# Pages that are opened as files may not fetch each other.
html_show_search_summary = False
html_show_sourcelink = False
html_show_sphinx = False
html_show_copyright = False
# The package has one module.
html_domain_indices = False
