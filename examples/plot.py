"""An animated plot as a movie, cell by cell as in a notebook. Usage: plot.py [OUTPUT.mp4]   (needs NumPy)"""

# %% A damped wave, drawn into arrays of RGB.
import sys

import movieconv
import numpy as np

WIDTH, HEIGHT, RATE, SECONDS = 640, 360, 25, 4
x = np.linspace(0, 4 * np.pi, WIDTH)


def frames():
    for number in range(RATE * SECONDS):
        picture = np.full((HEIGHT, WIDTH, 3), 255, np.uint8)
        picture[HEIGHT // 2] = 200  # the axis
        wave = np.exp(-x / 8) * np.sin(x - number * 2 * np.pi / RATE)
        rows = (HEIGHT / 2 - wave * HEIGHT * 0.4).astype(int)
        for thickness in (-1, 0, 1):
            picture[rows + thickness, np.arange(WIDTH)] = (200, 40, 40)
        yield picture


# %% Its sound: a tone whose loudness follows the plot.
def sound():
    t = np.arange(48000 * SECONDS) / 48000
    yield 0.2 * np.sin(2 * np.pi * 330 * t) * np.exp(-(t % 1.0))


# %% Write it, and see how far it is.
output = sys.argv[1] if len(sys.argv) > 1 else "plot.mp4"
result = movieconv.write(output, frames(), rate=RATE, sound=sound(), duration=SECONDS,
                         progress=lambda p: print(f"\r{p.percent:5.1f} %", end=""))
print(f"\n{result.pictures_written} pictures in {output}")
