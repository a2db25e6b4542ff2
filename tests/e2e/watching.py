"""What scripts share that run a watch beside other programs: waits with an end, and an end for all that was started."""

import signal
import sys
import tempfile
import time

LIMIT = 60.0  # seconds for anything that is waited for


def wait_for(what, condition):
    end = time.monotonic() + LIMIT
    while not condition():
        if time.monotonic() > end:
            print("not within a minute:", what)
            sys.exit(1)
        time.sleep(0.05)


def end(watch):
    """By the signal of a service manager; an end with an error is one of the script, too."""
    watch.send_signal(signal.SIGTERM)
    if watch.wait(LIMIT) != 0:
        print("the watch ended with", watch.returncode)
        sys.exit(1)


def main(run):
    """Runs run(PROGRAM, FOLDER, PROCESSES) in a folder of its own; what it adds to the processes does not outlive it."""
    processes = []
    with tempfile.TemporaryDirectory() as folder:
        try:
            run(sys.argv[1], folder, processes)
        finally:
            for each in processes:
                each.kill()
                each.wait()
