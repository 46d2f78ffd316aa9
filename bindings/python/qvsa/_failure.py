class Failure(Exception):
    """An operation that failed.

    ``number`` is the failure's number as ``errNumber`` has it, ``text`` says what went wrong.
    """

    def __init__(self, number, text):
        super().__init__(number, text)
        self.number = number
        self.text = text

    def __str__(self):
        shown = self.number if self.number >= 0 else f"0x{self.number & 0xFFFFFFFF:08X}"
        return f"{self.text} ({shown})"


def number(value):
    """A failure's number as the headers write it, 0x80040452, in the form of ``errNumber`` and ``Failure.number``."""
    return value - (1 << 32) if value >= 1 << 31 else value
