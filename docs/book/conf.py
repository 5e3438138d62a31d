# docs/book/conf.py: how Sphinx makes the book.
"""tools/make_book.py puts the sources together and sets the variables that are read here."""

import os

project = "Tessel"
author = "The Tessel developers"
project_copyright = author
release = version = os.environ["TESSEL_VERSION"]

extensions = ["myst_parser", "breathe"]
source_suffix = {".md": "markdown", ".rst": "restructuredtext"}
myst_heading_anchors = 6
highlight_language = "text"
smartquotes = False  # what is quoted is to be pasted into programs

breathe_projects = {"tessel": os.environ["TESSEL_DOXYGEN"]}
breathe_default_project = "tessel"
breathe_show_include = False  # the names of headers without their folder are of no use
breathe_show_enumvalue_initializer = True
breathe_domain_by_extension = {"h": "c", "hpp": "cpp"}

html_theme = "furo"
html_title = f"Tessel {version}"
html_static_path = ["static"]
html_css_files = ["book.css"]
html_show_sphinx = False
html_copy_source = False
html_theme_options = {
    "light_css_variables": {"color-brand-primary": "#1f5fa8", "color-brand-content": "#1f5fa8"},
    "dark_css_variables": {"color-brand-primary": "#7ab7f5", "color-brand-content": "#7ab7f5"},
}
pygments_style = "friendly"
pygments_dark_style = "monokai"
