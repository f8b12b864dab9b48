"""Lets the tests import the package from the tree, with the libraries of the build that runs them."""

import os
import sys
from pathlib import Path

ROOT = Path(__file__).resolve().parents[2]
sys.path.insert(0, str(ROOT / "python"))
os.environ.setdefault("KTORBA_LIBRARY_PATH", str(ROOT / "build" / "debug"))
