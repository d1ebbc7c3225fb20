"""Random timelines of mixed rates through comp, against exact fractions.

Usage: comp_otio.py PROGRAM"""

import json
import math
import random
import subprocess
import sys
from fractions import Fraction

NTSC = {23.976: 24, 23.98: 24, 29.97: 30, 59.94: 60}
RATES = [24, 25, 30, 48000, 44100, 12.5, 17.1234567, *NTSC]
random.seed(1)


def exact(rate):
    return Fraction(NTSC[rate] * 1000, 1001) if rate in NTSC else Fraction(str(rate))


def time(value, rate):
    return {"OTIO_SCHEMA": "RationalTime.1", "value": value, "rate": rate}


def timecode(frame, rate):
    base = math.floor(rate + Fraction(1, 2))
    seconds, frames = divmod(abs(frame), base)
    sign = "-" if frame < 0 else ""
    return f"{sign}{seconds // 3600:02}:{seconds // 60 % 60:02}:{seconds % 60:02}:{frames:02}"


def check(shown, expected, rate):
    frame, seconds = math.floor(expected * rate + Fraction(1, 2)), Fraction(shown["seconds"])
    assert shown["frame"] == frame and shown["timecode"] == timecode(frame, rate), (shown, expected)
    assert shown["wholeFrame"] == (expected * rate == frame), (shown, expected)
    # Exact wherever it fits; else the nearest, and how far it is off.
    most = min(2**32 - 1, (2**31 - 1) // max(1, math.ceil(abs(expected))))
    assert shown["exact"] == (expected.denominator < 2**32 and abs(expected.numerator) < 2**31), (shown, expected)
    off = abs(seconds - expected)
    assert off <= abs(expected.limit_denominator(most) - expected) and off <= shown.get("maxError", 0), (shown, expected)


count = 0
for _ in range(60):
    rate = random.choice(RATES)
    children, expected, at = [], [], Fraction(0)
    for _ in range(random.randrange(1, 9)):
        own = random.choice(RATES)
        start, duration = random.choice([random.randrange(-500, 5000), random.randrange(2**33)]), random.randrange(2000)
        scalar = random.choice([None, 2, -1, 0.5, 1 / 3])
        source_range = {"start_time": time(start, own), "duration": time(duration, own)}
        effects = [] if scalar is None else [{"OTIO_SCHEMA": "LinearTimeWarp.1", "time_scalar": scalar}]
        children.append({"OTIO_SCHEMA": "Clip.1", "name": "c", "source_range": source_range, "effects": effects})
        length, first = duration / exact(own), start / exact(own)
        speed = Fraction(1 if scalar is None else scalar).limit_denominator(1000)
        expected.append((at, at + length, first, first + length * speed))
        at += length
    file = {"OTIO_SCHEMA": "Timeline.1", "global_start_time": time(0, rate), "tracks": {"OTIO_SCHEMA": "Stack.1",
            "children": [{"OTIO_SCHEMA": "Track.1", "kind": "Video", "children": children}]}}
    run = subprocess.run([sys.argv[1], "--json", "-"], input=json.dumps(file), capture_output=True, text=True, check=True)
    timeline = json.loads(run.stdout)["timelines"][0]
    assert Fraction(timeline["rate"]) == exact(rate)
    items = timeline["tracks"][0]["items"]
    assert len(items) == len(expected)
    for item, times in zip(items, expected):
        names = ("recordIn", "recordOut", "sourceIn", "sourceOut")
        for name, value in zip(names, times):
            check(item[name], value, exact(rate))
            count += not item[name]["exact"]
assert count > 20, count
