# python/tessel/__main__.py: python3 -m tessel is the command line.
"""Runs the command line."""

import sys

from tessel.command import main

sys.exit(main())
