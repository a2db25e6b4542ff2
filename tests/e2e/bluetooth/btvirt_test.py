#!/usr/bin/env python3
"""The kernel's own RFCOMM against a controller that btvirt plays: btvirt_test.py PROGRAM

Needs /dev/vhci, root and btvirt (package bluez-test-tools). Where one of them is missing it says so and exits with 77:
nothing was tested.
"""
import os
import shutil
import subprocess
import sys
import tempfile
import time

SKIPPED = 77
ABSENT = '02:00:00:00:00:7F'


def missing():
    if not os.path.exists('/dev/vhci'):
        return 'no /dev/vhci: the kernel plays no controllers'
    if os.geteuid() != 0:
        return 'root alone may open /dev/vhci'
    return None if shutil.which('btvirt') else 'no btvirt: apt-get install bluez-test-tools'


def controllers():
    folder = '/sys/class/bluetooth'
    return set(os.listdir(folder)) if os.path.isdir(folder) else set()


def run(program):
    with tempfile.TemporaryDirectory() as folder:
        result = subprocess.run([program, '--settings', folder + '/settings', '-p', f'bt://{ABSENT}?channel=1', 'info'],
                                text=True, capture_output=True, timeout=60, check=False)
        return result.returncode, result.stderr


def main(program):
    reason = missing()
    if reason:
        print('skipped:', reason)
        return SKIPPED
    before = controllers()
    played = subprocess.Popen(['btvirt', '-l1'], stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL)
    try:
        end = time.monotonic() + 10
        while controllers() == before and time.monotonic() < end:
            time.sleep(0.1)
        if controllers() == before:
            print('btvirt brings no controller')
            return 1
        code, said = run(program)
        print(said)
        # A controller that is down has no route, one that is up finds nobody: the kernel's answer is not "no Bluetooth".
        told = any(words in said for words in ('is off, or there is no controller', 'no answer', 'timed out'))
        return 0 if code == 3 and told else 1
    finally:
        played.terminate()
        played.wait(10)


sys.exit(main(sys.argv[1]))
