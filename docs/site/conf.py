"""Settings of the site."""

import os
import sys
from pathlib import Path

from pygments.lexer import RegexLexer
from pygments.token import Generic

here = Path(__file__).parent
sys.path.insert(0, str(here))
root = here.parents[1]
output = Path(os.environ["VTSYM_DOCS"])

project = "vtsym"
copyright = "the authors of vtsym"
html_title = "vtsym"

extensions = ["myst_parser", "breathe", "railroads"]
myst_enable_extensions = ["colon_fence", "deflist"]
myst_heading_anchors = 4
exclude_patterns = ["site"]

html_theme = "furo"
html_static_path = ["static"]
html_css_files = ["site.css"]
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

# Names of other libraries, and of what is not public, have no page to point to.
nitpick_ignore_regex = [("cpp:identifier", r".*")]

highlight_language = "none"


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
