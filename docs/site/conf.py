"""The Sphinx configuration of the documentation; tools/site runs it."""

import os
import sys
import warnings
from pathlib import Path

ROOT = Path(os.environ["QX_SOURCE"])
sys.path[:0] = [str(ROOT / "python"), str(ROOT / "tools"), str(ROOT / "docs/site")]
warnings.filterwarnings("ignore", category=DeprecationWarning)

import pages  # noqa: E402
import qx  # noqa: E402
from sphinx_gallery.sorting import FileNameSortKey  # noqa: E402

project = "QX analysis library"
version = release = qx.__version__
html_title = "QX analysis library"
language = "en"
html_show_copyright = html_show_sphinx = html_show_sourcelink = html_copy_source = False

extensions = ["sphinx.ext.autodoc", "sphinx.ext.autosummary", "sphinx.ext.mathjax", "numpydoc", "myst_parser",
              "sphinx_copybutton", "sphinx_gallery.gen_gallery", "pages"]
root_doc = "index"
exclude_patterns = ["site", "**/README.rst", "**/*.ipynb"]
source_suffix = {".md": "markdown", ".rst": "restructuredtext"}
suppress_warnings = ["myst.header"]  # tables of one level below another one
default_role = "py:obj"
toc_object_entries = False
add_module_names = False

html_theme = "furo"
html_static_path = [str(ROOT / "docs/site/static")]
html_css_files = ["site.css"]
pygments_style, pygments_dark_style = "friendly", "monokai"

# MathJax of Debian's package, which tools/site copies beside the pages.
mathjax_path = "mathjax/MathJax.js?config=TeX-AMS_CHTML"
mathjax2_config = {"displayAlign": "left", "displayIndent": "1em", "messageStyle": "none",
                   "CommonHTML": {"linebreaks": {"automatic": True}},
                   "showMathMenu": False}

myst_enable_extensions = ["colon_fence", "dollarmath", "deflist"]
myst_heading_anchors = 4

autodoc_member_order = "bysource"
autosummary_generate = False
numpydoc_show_class_members = False
numpydoc_use_plots = False
copybutton_prompt_text = r">>> |\.\.\. |\$ "
copybutton_prompt_is_regexp = True

sphinx_gallery_conf = {
    "examples_dirs": [str(ROOT / "examples/tutorials"), str(ROOT / "examples/exports")],
    "gallery_dirs": ["tutorials", "examples"],
    "filename_pattern": ".*",
    "within_subsection_order": FileNameSortKey,
    "download_all_examples": False,
    "show_signature": False,
    "min_reported_time": 1e9,
    "remove_config_comments": True,
    "abort_on_example_error": True,
    "plot_gallery": "True",
    "default_thumb_file": pages.thumbnail(Path(os.environ["QX_SITE_SOURCE"])),
    "image_scrapers": ("matplotlib",),
    "reset_modules": ("matplotlib", pages.plot_style),
    "capture_repr": ("_repr_html_",),
}
