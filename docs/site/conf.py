"""Settings of the site."""

import os
import re
import sys
from pathlib import Path

import furo
from pygments.lexer import RegexLexer
from pygments.token import Generic

here = Path(__file__).parent
sys.path.insert(0, str(here))
root = here.parents[1]
output = Path(os.environ["VTSYM_DOCS"])

project = "vtsym"
copyright = "the authors of vtsym"
html_title = "vtsym"

extensions = ["myst_parser", "breathe", "railroads", "sphinx.ext.autodoc"]
myst_enable_extensions = ["colon_fence", "deflist"]
myst_heading_anchors = 4
exclude_patterns = ["site"]

html_theme = "furo"
html_static_path = ["static", str(output / "static")]
html_css_files = ["site.css", "dark.css"]
html_copy_source = False
html_show_sphinx = False
html_show_copyright = False
html_theme_options = {"sidebar_hide_name": False}
html_use_index = True

breathe_projects = {"vtsym": str(output / "xml")}
breathe_default_project = "vtsym"
breathe_default_members = ("members", "undoc-members")
breathe_show_include = True
cpp_id_attributes = ["VTSYM_API"]

autodoc_default_options = {"members": True, "undoc-members": True, "show-inheritance": True}
autodoc_member_order = "bysource"
autodoc_class_signature = "separated"
autodoc_preserve_defaults = True

# Names of other libraries, and of what is not public, have no page to point to.
nitpick_ignore_regex = [("cpp:identifier", r".*"), ("py:(class|data|obj)", r".*")]

highlight_language = "none"


def darkColours():
    """The theme's dark colours for readers whose system is dark; the style sheet that Debian builds has them for its button alone."""
    sheet = (Path(furo.__file__).parent / "theme/furo/static/styles/furo.css").read_text(encoding="utf-8")
    colours = re.search(r'body\[data-theme="?dark"?\] *\{(.*?)\}', sheet, re.S)[1]
    return f'@media (prefers-color-scheme: dark) {{\nbody:not([data-theme="light"]) {{{colours}}}\n}}\n'


(output / "static").mkdir(parents=True, exist_ok=True)
(output / "static" / "dark.css").write_text(darkColours(), encoding="utf-8")


class Transcript(RegexLexer):
    """Commands after `$`, and what they write, which may look like anything."""

    name = "console"
    tokens = {"root": [(r"^\$ .*\n", Generic.Strong), (r".*\n", Generic.Output)]}


def setup(app):
    """Bases and aliases that are not public are named without a link."""

    def plain(app, env, node, contnode):
        isOfDoxygen = node.get("reftype") == "ref" and node.get("refdomain") == "std"
        return contnode if isOfDoxygen and node["reftarget"].startswith(("class", "struct", "namespace")) else None

    app.connect("missing-reference", plain)
    app.add_lexer("console", Transcript)
