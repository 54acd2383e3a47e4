"""The library that reads Kconfig files, where it is installed (Debian: python3-kconfiglib)."""

try:
    import kconfiglib  # type: ignore[import]
except ImportError:  # said by main()
    kconfiglib = None

__all__ = ["kconfiglib"]
