#!/usr/bin/env python3
"""Writes the seed inputs of engine_fuzzer into fuzz/corpus/engine/.

Each seed is a short session of a client: frames streamed, replies pushed, the engine paused,
resumed, stopped, still images, lent buffers, a transport that fails. The byte layout is the one
EngineFuzzer.cpp reads (fixed-size fields; see the comment above its Harness class).
"""
import os
import struct

OUT = os.path.join(os.path.dirname(os.path.abspath(__file__)), "corpus", "engine")

I420, NV21, NV12, RGB, BGR, BGRA, BGRX, GRAY = range(8)
NOISE, FLAT, SPOTS, BLOCKS = range(4)
# Memory of a frame: allocated through the buffer, none, or borrowed (ending at an unreadable
# page, or 8-byte aligned so that a read just before the start is caught).
ALLOCATED, NO_MEMORY, AT_PAGE_END, ALIGNED = 0, 1, 2, 4


def exact(value):
    return bytes([255]) + struct.pack("<i", value)


def description(fmt, width, height, channels, stride):
    return exact(fmt) + exact(width) + exact(height) + bytes([channels + 1]) + exact(stride)


def frame(fmt, width, height, channels=1, stride=None, memory=AT_PAGE_END, delta=0, pixels=BLOCKS, seed=7):
    if stride is None:
        stride = width * max(channels, 1)
    return (description(fmt, width, height, channels, stride) + bytes([memory, delta + 64, pixels])
            + struct.pack("<I", seed))


def extra(step_ms=50, orientation=0, flat=0):
    # Time selector 6 advances the clock by value % 300 milliseconds.
    return bytes([6]) + struct.pack("<I", step_ms) + bytes([orientation // 90 + 2]) + struct.pack("<i", 0) + bytes([flat])


def reply(code=200, body=0, rtt=0):
    return bytes([255]) + struct.pack("<i", code) + bytes([body, rtt])


OWN_KEY = bytes([3])
NO_KEY = bytes([0])


def start():
    return bytes([0, 0])


def stop():
    return bytes([0, 1])


def pause():
    return bytes([0, 2])


def resume():
    return bytes([0, 3])


def process(*args, step_ms=50, key=NO_KEY, **kwargs):
    return bytes([2]) + frame(*args, **kwargs) + extra(step_ms) + key


def request(fmt, width, height, stride=None, pixels=BLOCKS, seed=3):
    if stride is None:
        stride = width
    return bytes([3]) + description(fmt, width, height, 0, stride) + bytes([pixels]) + struct.pack("<I", seed)


def process_lent(pick=0, change=4, value=0, step_ms=50, key=OWN_KEY):
    return bytes([4, pick, change | 0x80]) + struct.pack("<i", value) + extra(step_ms) + key


def single(*args, code=200, body=0, **kwargs):
    return bytes([5]) + frame(*args, **kwargs) + extra() + reply(code, body)


def push(which=4, code=200, body=0, rtt=5):
    return bytes([6, which]) + reply(code, body, rtt)


def mode(m, code=200, body=0):
    return bytes([7, m]) + reply(code, body)


WAIT = bytes([8])
RECREATE = bytes([9])


def write_lent(pick=0, count=4):
    return bytes([11, pick, 0]) + struct.pack("<i", 0) + bytes([count])


SEEDS = {
    "stream_and_reply": start() + b"".join(process(NV21, 64, 48, seed=i) for i in range(3)) + WAIT
    + push() + b"".join(process(GRAY, 48, 40, pixels=SPOTS, seed=i) for i in range(4)) + WAIT
    + push(code=500) + stop(),
    "held_frames_sharpness": start() + process(NV21, 64, 48) + WAIT
    + b"".join(process(NV12, 64, 48, pixels=p, step_ms=120) for p in (FLAT, SPOTS, NOISE, BLOCKS))
    + process(GRAY, 15, 15, step_ms=450) + push(body=1) + WAIT + push(body=3),
    "pause_resume_restart": start() + process(I420, 32, 32) + WAIT + pause() + push()
    + process(I420, 32, 32) + resume() + process(I420, 32, 32, step_ms=200) + WAIT + start()
    + pause() + start() + process(NV21, 32, 32) + WAIT + push() + stop() + push(),
    "lent_buffers": start() + request(NV21, 64, 48) + request(GRAY, 40, 40) + process_lent(0)
    + WAIT + push() + process_lent(1, step_ms=150) + request(NV21, 64, 47) + process_lent(2)
    + request(I420, 16, 16) + pause() + write_lent(3) + resume() + process_lent(3) + push(),
    "still_images": start() + single(NV21, 64, 48) + single(RGB, 40, 30, channels=3)
    + single(BGRA, 20, 20, channels=4) + single(GRAY, 33, 17) + single(NV12, 18, 14, code=404)
    + single(I420, 17, 9, body=4),
    "transport_modes": start() + mode(1) + process(NV21, 32, 32) + WAIT + mode(2)
    + process(NV21, 32, 32, step_ms=150) + WAIT + start() + pause() + resume() + mode(3)
    + process(GRAY, 32, 32, step_ms=150) + WAIT + mode(4) + process(GRAY, 32, 32, step_ms=150)
    + WAIT + mode(5) + process(GRAY, 32, 32, step_ms=150) + WAIT + mode(0) + stop(),
    "late_replies": start() + process(NV21, 48, 32) + WAIT + RECREATE + push(1) + start()
    + process(NV21, 48, 32) + WAIT + stop() + push() + RECREATE + push(),
    # Tiny frames while a frame is held: the sharpness margins shrink to 0 and its samples meet
    # the plane's edges.
    "tiny_frames_while_held": start() + process(NV21, 64, 48) + WAIT + process(NV21, 64, 48, step_ms=150)
    + b"".join(process(GRAY, w, h, pixels=NOISE, step_ms=20, memory=memory) for w, h in
               ((1, 1), (2, 2), (3, 3), (20, 4), (4, 20), (24, 5), (25, 5), (15, 15), (16, 6), (5, 64))
               for memory in (ALIGNED, AT_PAGE_END))
    + push() + stop(),
    "odd_geometry": start() + process(GRAY, 1, 1) + process(GRAY, 6, 6) + process(NV21, 7, 7)
    + process(NV21, 64, 48, stride=60) + process(GRAY, 30, 30, stride=40)
    + process(GRAY, 30, 30, memory=ALLOCATED, delta=-40) + process(NV21, 20, 20, memory=ALLOCATED, delta=-10)
    + process(RGB, 20, 20, channels=3) + process(99, 20, 20) + process(-1, 20, 20)
    + single(GRAY, 20, 20, channels=3) + single(NV21, 20, 20, stride=8) + stop(),
}


def main():
    os.makedirs(OUT, exist_ok=True)
    for name, data in SEEDS.items():
        with open(os.path.join(OUT, name), "wb") as f:
            f.write(data)
    print(f"{len(SEEDS)} seeds written to {OUT}")


if __name__ == "__main__":
    main()
