"""Converting movie files with the program movieconv, which reads whatever FFmpeg does."""

from __future__ import annotations

import json
import os
import shutil
import signal
import subprocess
import tempfile
from dataclasses import dataclass
from typing import Any, Iterator, List, Optional

from ._engine import ConversionError
from ._library import library


@dataclass(frozen=True)
class FileProgress:
    """How far a conversion is. None stands for a figure that is not known yet; times are seconds."""

    phase: str  # "converting", "paused", "finishing" or "waiting_for_room"
    percent: float
    position: float
    speed: Optional[float]
    left: Optional[float]
    bytes: int


def _program() -> str:
    """The program: that which MOVIECONV_PROGRAM names, else one beside the library, else one in the PATH."""
    name = library()._name
    beside = os.path.join(os.path.dirname(os.path.realpath(name)), "movieconv") if os.sep in name else None
    for candidate in (os.environ.get("MOVIECONV_PROGRAM"), beside, shutil.which("movieconv")):
        if candidate and os.path.isfile(candidate) and os.access(candidate, os.X_OK):
            return candidate
    raise FileNotFoundError("The program movieconv is not installed; MOVIECONV_PROGRAM can name it.")


class Conversion:
    """A running conversion. Iterating over it gives FileProgress until it is done and raises ConversionError when
    it fails; `wait()` does that without the news. Leaving a `with` block early stops it, and `files` tells what was made;
    where it has failed, that raises ConversionError, too."""

    def __init__(self, arguments: List[str]) -> None:
        self._messages = tempfile.TemporaryFile()
        self._process = subprocess.Popen(
            [_program(), "--progress", "json", *arguments], stdin=subprocess.DEVNULL, stdout=subprocess.PIPE,
            stderr=self._messages)
        self._paused = False
        self._stopped = False
        self._concluded = False
        self._errors: List[str] = []  # what the program has told of them
        self._error: Optional[str] = None
        self.warnings: List[str] = []  # what was put right or is worth knowing
        self.files: List[str] = []  # complete, on the disk, under their names

    def __iter__(self) -> Iterator[FileProgress]:
        assert self._process.stdout is not None
        if self._concluded:
            self._raise_error()
            return
        for line in self._process.stdout:
            event = json.loads(line)
            kind = event.get("event")
            if kind == "progress":
                yield FileProgress(event["phase"], event["percent"] or 0.0, event["position_s"] or 0.0,
                                   event["speed"], event["left_s"], event["bytes"] or 0)
            elif kind == "clip_closed":
                self.files.append(event["path"])
            elif kind in ("warning", "error"):
                (self.warnings if kind == "warning" else self._errors).append(event["text"])
        self._conclude()

    def _conclude(self) -> None:
        code = self._process.wait()
        self._messages.seek(0)
        messages = self._messages.read().decode("utf-8", "replace").strip()
        self._close()
        # Before the program can take the signal, it ends by it.
        if code == 0 or (self._stopped and code in (6, -signal.SIGTERM)):
            return
        text = " ".join(self._errors) or messages or f"The program movieconv ended with {code}."
        self._error = text
        self._raise_error()

    def _raise_error(self) -> None:
        if self._error is not None:
            raise ConversionError(self._error)

    def _close(self) -> None:
        self._concluded = True
        assert self._process.stdout is not None
        self._process.stdout.close()
        self._messages.close()

    def wait(self) -> None:
        """Returns when the conversion is done; raises as iterating does."""
        for _ in self:
            pass

    def pause(self) -> None:
        """Halts it until resume()."""
        self._signal(signal.SIGSTOP)
        self._paused = True

    def resume(self) -> None:
        """Goes on after pause()."""
        self._signal(signal.SIGCONT)
        self._paused = False

    @property
    def paused(self) -> bool:
        return self._paused

    def stop(self) -> None:
        """Ends it; the output is finished with what was converted. Iterating ends then, without an error."""
        if not self._stopped:  # a second signal would end it at once
            self._stopped = True
            self._signal(signal.SIGTERM)
        self.resume()

    def _signal(self, number: int) -> None:
        if self._process.poll() is None:
            self._process.send_signal(number)

    def __enter__(self) -> "Conversion":
        return self

    def __exit__(self, kind: Any, *_error: Any) -> None:
        if self._concluded:
            return
        if self._process.poll() is None:
            self.stop()
        try:
            self.wait()  # the program waits for a reader before it ends; how it ended, nobody has asked
        except ConversionError:
            if kind is None:
                raise


def convert(source: "str | os.PathLike[str]", output: "str | os.PathLike[str]", *options: str) -> Conversion:
    """Converts a movie file; `options` are the program's, as in convert(a, b, "--size", "640x360").

        with movieconv.convert("in.mkv", "out.mp4") as conversion:
            for progress in conversion:
                print(progress.percent)
    """
    return Conversion([*options, "--", os.fspath(source), os.fspath(output)])
