# The tests that do not run for Windows, by their name and with the reason; nothing else is left out anywhere.
set(KTORBA_NOT_UNDER_WINE
  # Wine keeps a table of all pages that are reserved, a byte for each, where Windows and POSIX keep nothing.
  TimeAndOutput.MemoryCostsNothingBeforeItIsWritten
  # Full disks, limits, signals and terminals of POSIX, played by its shell.
  All/Session.GoesAsWritten/system
  # Links, modes, pipes with names and devices of POSIX.
  All/Session.GoesAsWritten/outputs)
list(JOIN KTORBA_NOT_UNDER_WINE ":" KTORBA_NOT_UNDER_WINE)
