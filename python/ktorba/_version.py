"""The version of this package, which is that of the libraries it came with; a test compares it with the header."""

VERSION = "0.1.0"
