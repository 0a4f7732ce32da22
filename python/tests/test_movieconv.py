"""The package against the library of the build (MOVIECONV_LIBRARY) and its program."""

import errno
import gc
import signal
import subprocess
import threading
import weakref

import pytest

import movieconv
from movieconv import Category, ConversionError, colour

numpy = pytest.importorskip("numpy")
WIDTH, HEIGHT, RATE = 64, 48, 25


def pictures(count):
    for number in range(count):
        picture = numpy.zeros((HEIGHT, WIDTH, 3), numpy.uint8)
        picture[:, : number % WIDTH + 1, 0] = 255  # red from the left
        yield picture


def tone(seconds, rate=48000):
    for _ in range(round(seconds * 25)):
        yield numpy.sin(numpy.arange(rate // 25) * 0.05) * 0.25


def streams(path):
    shown = subprocess.run(["ffprobe", "-v", "error", "-count_packets", "-show_entries",
                            "stream=codec_type,nb_read_packets", "-of", "csv=p=0", path],
                           capture_output=True, text=True, check=True)
    return dict(line.split(",")[:2] for line in shown.stdout.split())


def test_writes_pictures_and_sound(tmp_path):
    told = []
    result = movieconv.write(tmp_path / "müsli.mp4", pictures(50), rate=RATE, sound=tone(2), duration=2.0,
                             progress=told.append)
    assert result.done and result.category is Category.DONE and result.what == ""
    assert (result.pictures_sent, result.pictures_written, result.samples_sent) == (50, 50, 96000)
    assert streams(tmp_path / "müsli.mp4")["video"] == "50"
    assert told[-1].percent == 100.0 and told[-1].position == pytest.approx(2.0, abs=0.05)


@pytest.mark.parametrize("form", ["rgb bytes", "rgba bytes", "rgba array", "planes", "memoryviews"])
def test_takes_every_form_of_pictures_alike(tmp_path, form):
    """The same picture in every form gives the same file size, since it gives the same planes."""
    rgb = next(pictures(1))
    rgba = numpy.dstack([rgb, numpy.full((HEIGHT, WIDTH), 9, numpy.uint8)])
    bgrx = numpy.ascontiguousarray(rgba[:, :, [2, 1, 0, 3]])
    planes = colour.rgb32_rows_to_yuv420(bgrx)
    forms = {"rgb bytes": rgb.tobytes(), "rgba bytes": rgba.tobytes(), "rgba array": rgba, "planes": tuple(planes),
             "memoryviews": tuple(memoryview(plane) for plane in planes)}
    sizes = set()
    for name, picture in (("array", rgb), (form, forms[form])):
        path = tmp_path / f"{name}.mkv"
        movieconv.write(path, [picture] * 5, size=(WIDTH, HEIGHT))
        sizes.add(path.stat().st_size)
    assert len(sizes) == 1


def test_sound_alone_in_every_form(tmp_path):
    for number, block in enumerate([numpy.zeros((4800, 2), numpy.int16), numpy.zeros((4800, 2)), bytes(19200)]):
        result = movieconv.write(tmp_path / f"{number}.wav", sound=[block] * 10, channels=2)
        assert result.samples_written == 48000


def test_errors_are_exceptions_with_a_sentence(tmp_path):
    with pytest.raises(ConversionError) as failed:
        movieconv.write(tmp_path / "none" / "out.mp4", pictures(5))
    assert failed.value.result.category is Category.CANNOT_OPEN
    assert failed.value.result.system_error == errno.ENOENT
    assert "out.mp4" in str(failed.value)
    for arguments in (dict(pictures=[]), dict(), dict(pictures=[b"x"]), dict(pictures=pictures(1), file_format="")):
        with pytest.raises(ValueError):
            movieconv.write(tmp_path / "out.mp4", **arguments)
    with pytest.raises(ValueError, match="no numbers"):
        movieconv.write(tmp_path / "no-numbers.wav", sound=[numpy.full(480, numpy.nan)])
    (tmp_path / "no-numbers.wav").unlink(missing_ok=True)
    with pytest.raises(ValueError, match="extension"):
        movieconv.write(tmp_path / "out.txt", pictures(1))
    assert list(tmp_path.iterdir()) == []


@pytest.mark.parametrize("wrong", [
    dict(rate=0), dict(rate=-1), dict(rate=float("nan")), dict(rate=float("inf")), dict(sample_rate=0),
    dict(channels=0), dict(size=(0, 48)), dict(sample_rate=2**32), dict(video_bitrate=2**32 + 500_000),
    dict(audio_bitrate=-1), dict(audio_bitrate=float("nan")), dict(output_size=(2**32 + 64, 48))])
def test_what_makes_no_movie_is_told_by_its_name(tmp_path, wrong):
    with pytest.raises(ValueError, match="above 0"):
        movieconv.write(tmp_path / "out.mp4", **{"pictures": pictures(2), "sound": tone(0.1), **wrong})
    assert list(tmp_path.iterdir()) == []


@pytest.mark.parametrize("size", [(320, 240), (1280, 720)])
def test_colours_are_what_the_file_says_in_every_size(tmp_path, size):
    red = numpy.full((size[1], size[0], 3), (255, 0, 0), numpy.uint8)
    movieconv.write(tmp_path / "out.mp4", [red] * 3, video_codec="H264", video_bitrate=4_000_000)
    space = subprocess.run(["ffprobe", "-v", "error", "-show_entries", "stream=color_space", "-of", "csv=p=0",
                            tmp_path / "out.mp4"], capture_output=True, text=True, check=True).stdout.strip()
    seen = subprocess.run(["ffmpeg", "-v", "error", "-nostdin", "-i", tmp_path / "out.mp4", "-frames:v", "1",
                           "-f", "rawvideo", "-pix_fmt", "rgb24", "-"], capture_output=True, check=True).stdout[:3]
    assert space == "smpte170m" and seen[0] > 248 and max(seen[1:]) < 6


def test_what_an_iterable_raises_comes_out_and_the_file_is_closed(tmp_path):
    def failing():
        yield from pictures(10)
        raise RuntimeError("the camera is gone")

    with pytest.raises(RuntimeError, match="camera"):
        movieconv.write(tmp_path / "out.mp4", failing())
    assert streams(tmp_path / "out.mp4") == {"video": "10"}


def test_progress_can_end_it(tmp_path):
    result = movieconv.write(tmp_path / "out.mp4", pictures(500), sound=tone(20), progress=lambda _: False)
    assert result.category is Category.CANCELLED and 0 < result.pictures_sent < 500
    assert "video" in streams(tmp_path / "out.mp4")


def test_log_function_takes_lines(tmp_path):
    lines = []
    movieconv.set_log_function(lambda level, line: lines.append((level, line)))
    movieconv.write(tmp_path / "out.mp4", pictures(3))
    movieconv.set_log_function(None)
    assert (movieconv.LogLevel.INFO, "Encoding thread Starting .") in lines
    assert any("libx264" in line for _, line in lines)


def test_converts_files(tmp_path):
    movieconv.write(tmp_path / "in.mp4", pictures(50), sound=tone(2))
    conversion = movieconv.convert(tmp_path / "in.mp4", tmp_path / "out.mkv", "--size", "32x24")
    told = list(conversion)
    assert told and conversion.files == [str(tmp_path / "out.mkv")]
    assert streams(tmp_path / "out.mkv")["video"] == "50"
    with pytest.raises(ConversionError, match="in.mp5"):
        movieconv.convert(tmp_path / "in.mp5", tmp_path / "x.mkv").wait()


def test_pauses_and_stops_a_conversion(tmp_path):
    movieconv.write(tmp_path / "in.mp4", pictures(5000))
    with movieconv.convert(tmp_path / "in.mp4", tmp_path / "out.mkv", "--size", "1920x1080") as conversion:
        next(iter(conversion))
        conversion.pause()
        assert conversion.paused
        conversion.resume()
        conversion.stop()
        conversion.wait()
    assert int(streams(tmp_path / "out.mkv")["video"]) < 5000 if (tmp_path / "out.mkv").exists() else True


def test_leaving_a_conversion_signals_once_and_reads_what_it_still_tells(tmp_path, monkeypatch):
    talkative = tmp_path / "movieconv"  # ends when all of its news were read
    talkative.write_text("#!/bin/sh\n"
                         "trap 'printf T >>\"$0.signals\"; yes {} | head -c 200000; exit 6' TERM\n"
                         "echo '{\"event\": \"warning\", \"text\": \"begun\"}'\n"
                         "echo '{\"event\": \"progress\", \"phase\": \"converting\", \"percent\": 1, "
                         "\"position_s\": 1, \"speed\": 1, \"left_s\": 1, \"bytes\": 1}'\n"
                         "while :; do sleep 0.05; done\n")
    talkative.chmod(0o755)
    monkeypatch.setenv("MOVIECONV_PROGRAM", str(talkative))
    with movieconv.convert("in.mkv", "out.mkv") as conversion:
        next(iter(conversion))
        conversion.stop()
        conversion.stop()
    assert conversion.warnings == ["begun"] and conversion._process.returncode == 6
    assert (tmp_path / "movieconv.signals").read_text() == "T"


@pytest.mark.parametrize("begun", [False, True])
def test_stopping_is_no_error_even_before_the_program_listens(tmp_path, monkeypatch, begun):
    slow = tmp_path / "movieconv"
    slow.write_text("#!/bin/sh\n" + ("trap 'exit 6' TERM\n" if begun else "") + "echo '{\"event\": \"start\"}'\n"
                    "while :; do sleep 0.05; done\n")
    slow.chmod(0o755)
    monkeypatch.setenv("MOVIECONV_PROGRAM", str(slow))
    conversion = movieconv.convert("in.mkv", "out.mkv")
    assert conversion._process.stdout.readline()
    conversion.stop()
    conversion.wait()
    assert conversion._process.returncode == (6 if begun else -signal.SIGTERM)


def test_a_failure_that_nobody_read_is_raised_at_the_end_of_with(tmp_path):
    with pytest.raises(ConversionError, match="in.mp5"):
        with movieconv.convert(tmp_path / "in.mp5", tmp_path / "x.mkv") as conversion:
            conversion._process.wait()
    with pytest.raises(ConversionError, match="in.mp5"):
        conversion.wait()


def test_leaving_a_conversion_early_tells_its_file(tmp_path):
    movieconv.write(tmp_path / "in.mp4", pictures(3000))
    with movieconv.convert(tmp_path / "in.mp4", tmp_path / "out.mkv", "--size", "1280x720") as conversion:
        for progress in conversion:
            if progress.percent > 0:
                break
    assert conversion.files == [str(tmp_path / "out.mkv")] and (tmp_path / "out.mkv").exists()


@pytest.mark.parametrize("code", [0, 4, 6])
def test_leaving_a_conversion_early_raises_where_it_fails(tmp_path, monkeypatch, code):
    failing = tmp_path / "movieconv"
    failing.write_text("#!/bin/sh\n"
                       "trap 'echo \"{\\\"event\\\": \\\"error\\\", \\\"text\\\": \\\"no folder\\\"}\"; "
                       f"exit {code}' TERM\n"
                       "echo '{\"event\": \"progress\", \"phase\": \"converting\", \"percent\": 1, "
                       "\"position_s\": 1, \"speed\": 1, \"left_s\": 1, \"bytes\": 1}'\n"
                       "while :; do sleep 0.05; done\n")
    failing.chmod(0o755)
    monkeypatch.setenv("MOVIECONV_PROGRAM", str(failing))
    def leave():
        with movieconv.convert("in.mkv", "out.mkv") as conversion:
            for _ in conversion:
                break
    if code == 4:
        with pytest.raises(ConversionError, match="no folder"):
            leave()
    else:
        leave()
    with pytest.raises(KeyError):  # what the block raises itself comes first
        with movieconv.convert("in.mkv", "out.mkv") as conversion:
            next(iter(conversion))
            raise KeyError


def test_write_keeps_nothing_of_what_it_was_given(tmp_path):
    class Given(list):
        pass

    given = Given(pictures(3))
    seen = weakref.ref(given)
    gc.disable()  # what is freed at once needs no collector
    try:
        movieconv.write(tmp_path / "out.mp4", given)
        del given
        assert seen() is None
    finally:
        gc.enable()


def test_a_log_function_may_set_another_one_while_others_do(tmp_path):
    running, others = threading.Event(), threading.Event()

    def log(_level, _line):
        if not running.is_set():
            running.set()
            others.wait(60)
            movieconv.set_log_function(None)

    movieconv.set_log_function(log)
    writing = threading.Thread(target=movieconv.write, args=(tmp_path / "out.mp4", pictures(3)), daemon=True)
    writing.start()
    assert running.wait(60)
    setting = threading.Thread(target=movieconv.set_log_function, args=(None,), daemon=True)
    setting.start()
    setting.join(60)
    others.set()
    writing.join(60)
    assert not setting.is_alive() and not writing.is_alive()


def test_conversions_at_once_know_nothing_of_each_other(tmp_path):
    results = {}

    def run(name, folder):
        try:
            results[name] = movieconv.write(folder / f"{name}.mp4", pictures(25)).done
        except ConversionError as error:
            results[name] = error.result.category

    threads = [threading.Thread(target=run, args=pair)
               for pair in (("good", tmp_path), ("bad", tmp_path / "none"))]
    for thread in threads:
        thread.start()
    for thread in threads:
        thread.join()
    assert results == {"good": True, "bad": Category.CANNOT_OPEN}


class TestColour:
    rgb = numpy.random.default_rng(5).integers(0, 256, (6, 8, 3), numpy.uint8)
    bgrx = numpy.dstack([rgb, rgb[:, :, :1]])

    def test_routines_agree_with_each_other(self):
        down, up = colour.rgb32_to_yuv420(self.bgrx), colour.rgb32_to_yuv420(self.bgrx[::-1], bottom_up=True)
        rows = colour.rgb32_rows_to_yuv420(self.bgrx)
        bitmap = colour.rgb24_to_yuv420(self.rgb[::-1])
        alpha = colour.rgb32_to_yuva420(self.bgrx)
        for other in (up, rows, bitmap, alpha[:3]):
            for plane, same in zip(down, other):
                assert numpy.array_equal(plane, same)
        assert numpy.array_equal(alpha.a, self.bgrx[:, :, 3])
        back = colour.yuv420_to_argb(down)
        assert numpy.array_equal(back[::-1, :, :3], colour.yuv420_to_rgb24(down))
        assert numpy.array_equal(back[::-1, :, :3], colour.yuv420_to_rgb32(down)[:, :, :3])
        assert (back[:, :, 3] == 255).all()

    def test_simple_ones_follow_the_pixel_equations(self):
        grey = numpy.full((2, 2, 3), (10, 200, 30), numpy.uint8)
        planes = colour.rgb24_to_yuv420_simple(grey)
        assert (planes.y[0, 0], planes.u[0, 0], planes.v[0, 0]) == colour.rgb_to_yuv(30, 200, 10)
        pixel = colour.yuv420_to_rgb24_simple(planes)[0, 0]
        assert tuple(pixel[::-1]) == colour.yuv_to_rgb(*(int(plane[0, 0]) for plane in planes))

    def test_packed_and_copies(self):
        yuy2 = colour.rgb24_to_yuy2(self.rgb)
        swapped = colour.copy_yuy2(yuy2, 0, 0, 8, 6, swap=True)
        assert numpy.array_equal(swapped, yuy2[:, :, ::-1])
        assert numpy.array_equal(colour.yuy2_to_rgb24(yuy2), colour.yuy2_to_rgb24(swapped, yuy2=False))
        planes = colour.yuy2_to_yuv420(yuy2)
        assert numpy.array_equal(planes.y, yuy2[:, :, 0])
        assert numpy.array_equal(colour.yuy2_to_yuv420(colour.yuv420_to_yuy2(planes)).u, planes.u)
        part = colour.copy_yuv420(planes, 2, 2, 4, 2)
        assert numpy.array_equal(part.y, planes.y[2:4, 2:6]) and numpy.array_equal(part.v, planes.v[1:2, 1:3])
        small = colour.plane_444_to_420(planes.y)
        assert numpy.array_equal(colour.plane_420_to_444(small), colour.chroma_to_full(small, 8, 6))

    def test_what_does_not_fit_is_told(self):
        for call in (lambda: colour.rgb24_to_yuv420(self.bgrx), lambda: colour.rgb24_to_yuy2(self.rgb[:, :7]),
                     lambda: colour.yuv420_to_rgb24((self.rgb[:, :, 0],) * 3),
                     lambda: colour.copy_yuy2(colour.rgb24_to_yuy2(self.rgb), 6, 0, 4, 2)):
            with pytest.raises(ValueError):
                call()
        with pytest.raises(TypeError):
            colour.rgb24_to_yuv420(self.rgb.astype(float))

    def test_without_numpy(self, monkeypatch):
        expected = colour.rgb24_to_yuv420(self.rgb)
        monkeypatch.setattr("movieconv._buffers.numpy", None)
        plain = colour.rgb24_to_yuv420(memoryview(self.rgb.tobytes()).cast("B", [6, 8, 3]))
        assert isinstance(plain.y, memoryview)
        assert [bytes(plane) for plane in plain] == [plane.tobytes() for plane in expected]


def test_version():
    assert movieconv.version() >= (1, 1, 0)
    assert colour.kernel_level()
