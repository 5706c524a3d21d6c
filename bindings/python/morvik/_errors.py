"""Errors and warnings in Python."""

from morvik._core import Error as Error

Error.__module__ = "morvik"
Error.__doc__ = """The decoder refuses something, for the reason that the text gives. A ``ValueError``, too."""


class Difference(AssertionError):
    """A core's value differs from the model: the first one that a :class:`morvik.Checker` has met in a block."""


class DecoderWarning(UserWarning):
    """A warning of the decoder, such as for the first clipped soft value. Each kind comes once in a decoder's life;
    ``warnings.filterwarnings("error", category=morvik.DecoderWarning)`` makes it an exception.
    """


class SimulationWarning(UserWarning):
    """What to know of the results of :func:`morvik.error_rate`: a code rate so high that a terminal may leave out decoding,
    or curves that have not fallen.
    """
