"""The movies that are measured on, made with FFmpeg's own generators, the same bytes whenever they are made."""
import os
import subprocess

RATE = 25


def test_cards(width, height, seconds):
    """A: cheap to decode, most of it stands still."""
    return ["-f", "lavfi", "-i", f"testsrc2=s={width}x{height}:r={RATE}:d={seconds}",
            "-f", "lavfi", "-i", f"sine=440:d={seconds}:r=48000"], "medium"


def noisy_fractal(width, height, seconds):
    """B: decoding is most of the work."""
    return ["-f", "lavfi", "-i", f"mandelbrot=s={width}x{height}:r={RATE},noise=alls=20:allf=t",
            "-f", "lavfi", "-i", "anoisesrc=c=pink:r=48000:a=0.5:seed=1", "-t", str(seconds)], "veryfast"


def film(width, height, seconds):
    """Shots of 5 s with hard cuts: a landscape of soft and hard edges that is panned, something nearer that moves faster,
    and grain over all."""
    shot = 5
    graph = []
    shots = max(1, round(seconds / shot))
    for number in range(shots):
        # Noise of three scales, in colours of its own for each shot.
        texture = [f"color=c=0x{(number * 37) % 90 + 90:02x}{(number * 53) % 80 + 90:02x}{(number * 71) % 90 + 80:02x}"
                   f":s={width // 8}x{height // 8}:r={RATE}:d=0.04,noise=alls=90:all_seed={number + 1},gblur=sigma=3",
                   f"eq=contrast=2.2:brightness=0.12,scale={width * 2}:{height * 2}:flags=bicubic,"
                   f"noise=alls=14:all_seed={number + 51},gblur=sigma=2"]
        direction = 1 if number % 2 == 0 else -1
        pan = f"{width // 2}+{direction * width // 16}*t"
        graph.append(f"{','.join(texture)},loop=-1:1:0,setpts=N/{RATE}/TB,trim=duration={shot},"
                     f"crop={width}:{height}:{pan}:{height // 2}+{height // 60}*t*t[back{number}]")
        graph.append(f"color=c=0x{(number * 91) % 100 + 30:02x}4030:s={width // 6}x{height // 2}:r={RATE}:d={shot},"
                     f"noise=alls=30:all_seed={number + 101},gblur=sigma=1[near{number}]")
        across = f"{width}-{width // 4}*t" if direction > 0 else f"-{width // 6}+{width // 4}*t"
        graph.append(f"[back{number}][near{number}]overlay=x={across}:y={height // 2}-{height // 40}*sin(6*t)"
                     f":shortest=1,noise=alls=5:allf=t:all_seed={number + 201},format=yuv420p[shot{number}]")
    joined = "".join(f"[shot{number}]" for number in range(shots))
    graph.append(f"{joined}concat=n={shots}[out]")
    return ["-filter_complex", ";".join(graph), "-f", "lavfi", "-i",
            "anoisesrc=c=brown:r=48000:a=0.4:seed=7,aformat=channel_layouts=stereo", "-map", "[out]", "-map", "0:a",
            "-t", str(seconds)], "veryfast"


SOURCES = {"A": test_cards, "B": noisy_fractal, "film": film}


def make(folder, name, width, height, seconds):
    """The path of the movie; H.264 with AAC in MP4."""
    path = os.path.join(folder, f"{name}-{height}-{seconds}.mp4")
    if not os.path.exists(path):
        inputs, preset = SOURCES[name](width, height, seconds)
        part = path + ".part.mp4"
        quality = ["-crf", "18"] if name == "film" else []
        subprocess.run(["ffmpeg", "-v", "error", "-nostdin", "-y", *inputs, "-c:v", "libx264", "-preset", preset, *quality,
                        "-pix_fmt", "yuv420p", "-c:a", "aac", "-b:a", "128k", part], check=True)
        os.rename(part, path)
    return path
