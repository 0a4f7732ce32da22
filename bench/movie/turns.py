"""Programs that take turns: every round runs all of them once in random order. Figures are medians of the rounds, ratios
medians of the rounds' own ratios."""
import os
import random
import statistics
import subprocess
import sys
import time


def measure(command):
    """Wall seconds, CPU seconds, peak memory in MB."""
    start = time.monotonic()
    child = subprocess.Popen(command, stdin=subprocess.DEVNULL, stdout=subprocess.DEVNULL, stderr=subprocess.PIPE)
    complaint = child.stderr.read()
    _, status, usage = os.wait4(child.pid, 0)
    wall = time.monotonic() - start
    if status != 0:
        sys.exit("failed: " + " ".join(command) + "\n" + complaint.decode(errors="replace")[-2000:])
    return wall, usage.ru_utime + usage.ru_stime, usage.ru_maxrss / 1024


def take_turns(commands, rounds):
    results = {program: [] for program in commands}
    for number in range(rounds + 1):
        for program in random.sample(list(commands), len(commands)):
            figures = measure(commands[program])
            if number > 0:  # the first round warms up
                results[program].append(figures)
    return results


def print_head(measured):
    """`measured`: the program that the others are compared with, the first of them."""
    print(f"| source | program | wall s | CPU s | MB | {measured} / this: wall, CPU, memory |\n|---|---|---|---|---|---|")


def print_rows(source, results):
    """What take_turns gives, of one source."""
    measured = next(iter(results))
    first = source
    for program, figures in results.items():
        wall, cpu, memory = (statistics.median(column) for column in zip(*figures))
        ratios = (statistics.median(o[i] / p[i] for o, p in zip(results[measured], figures)) for i in range(3))
        told = "" if program == measured else ", ".join(f"{ratio:.2f}" for ratio in ratios)
        print(f"| {first} | `{program}` | {wall:.2f} | {cpu:.2f} | {memory:.0f} | {told} |", flush=True)
        first = ""
