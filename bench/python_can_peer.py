#!/usr/bin/env python3
"""The classic CAN workload of the end-to-end benchmarks through python-can's virtual bus: frames
sent on one channel and received on another, one frame per call, as a script would move them.
Prints one JSON object with the frames per second."""
import argparse
import json
import platform
import time

import can


def run(frames: int, batch: int) -> dict:
    channel = "kvsvbench"
    sender = can.Bus(interface="virtual", channel=channel, receive_own_messages=False)
    receiver = can.Bus(interface="virtual", channel=channel, receive_own_messages=False)
    messages = [
        can.Message(arbitration_id=0x100 + i % 0x700, is_extended_id=False,
                    data=bytes((i * 3 + b) & 0xFF for b in range(8)))
        for i in range(batch)
    ]
    try:
        received = 0
        start = time.perf_counter()
        while received < frames:
            for message in messages:
                sender.send(message)
            for _ in messages:
                if receiver.recv(timeout=1.0) is None:
                    raise RuntimeError("a frame sent was not received")
                received += 1
        seconds = time.perf_counter() - start
    finally:
        sender.shutdown()
        receiver.shutdown()
    return {
        "peer": "python-can virtual bus",
        "python_can_version": can.__version__,
        "python": platform.python_version(),
        "frames": received,
        "batch": batch,
        "seconds": seconds,
        "frames_per_second": received / seconds,
    }


def main() -> None:
    parser = argparse.ArgumentParser(description=__doc__)
    parser.add_argument("--frames", type=int, default=200000)
    parser.add_argument("--batch", type=int, default=1000,
                        help="frames sent before they are received")
    args = parser.parse_args()
    print(json.dumps(run(args.frames, args.batch)))


if __name__ == "__main__":
    main()
