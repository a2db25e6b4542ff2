"""ending.py PROGRAM CASE SLACK: ends a watch in an unkind moment. Prints what went wrong; exits 0 if nothing did.

name: a name server that never answers holds the way to the broker. pipe: nobody reads what an output writes. twice: the
same, and a second signal comes. adapter: the way to it is being built up, and nobody answers."""

import fcntl
import os
import signal
import socket
import struct
import subprocess
import sys
import tempfile
import time

SLACK = float(sys.argv[3])  # how many times slower than others the program may be
LIMIT = 2.0 * SLACK  # seconds that an end may take
SMALL_PIPE = 4096


def start(program, folder, output, stdout, port="sim:petrol-can11?instant"):
    command = [program, "watch", "--port", port, "--output", output,
               "--settings", folder + "/settings"]
    return subprocess.Popen(command, stdout=stdout, stderr=subprocess.DEVNULL,
                            env=dict(os.environ, STATE_DIRECTORY=folder))


def loopback_up():
    with socket.socket(socket.AF_INET, socket.SOCK_DGRAM) as control:
        fcntl.ioctl(control, 0x8914, struct.pack("16sh14x", b"lo", 1))  # SIOCSIFFLAGS, IFF_UP


def in_own_network(arguments, folder):
    """Runs this script again where only loopback is, and a silent name server on it."""
    with open(folder + "/resolv.conf", "w") as file:
        file.write("nameserver 127.0.0.1\n")
    rights = "-mn" if os.geteuid() == 0 else "-Urmn"
    inner = 'mount --bind "$0"/resolv.conf /etc/resolv.conf && exec "$@"'
    return subprocess.call(["unshare", rights, "bash", "-c", inner, folder, sys.executable, __file__, *arguments])


def silent_name_server():
    loopback_up()
    server = socket.socket(socket.AF_INET, socket.SOCK_DGRAM)
    server.bind(("127.0.0.1", 53))
    server.settimeout(20)
    return server


def end(watch):
    begin = time.monotonic()
    watch.send_signal(signal.SIGTERM)
    code = watch.wait(60)
    return code, time.monotonic() - begin


def check(what, truth):
    if not truth:
        print(what)
        sys.exit(1)


def name(program, folder):
    server = silent_name_server()
    watch = start(program, folder, "mqtt://broker.example/cars", subprocess.DEVNULL)
    server.recvfrom(512)  # now it waits for the name
    code, seconds = end(watch)
    check(f"ended with {code} after {seconds:.1f} s", code == 0 and seconds < LIMIT)


def adapter(program, folder):
    with socket.socket() as deaf, socket.socket() as first, socket.socket() as second:
        deaf.bind(("127.0.0.1", 0))
        deaf.listen(0)
        for caller in (first, second):  # its queue is full from now on
            caller.setblocking(False)
            caller.connect_ex(deaf.getsockname())
        time.sleep(0.2)
        place = "127.0.0.1:%d" % deaf.getsockname()[1]
        watch = start(program, folder, "csv:" + folder + "/a.csv", subprocess.DEVNULL, "tcp://" + place)
        time.sleep(2.0)
        code, seconds = end(watch)
        check(f"ended with {code} after {seconds:.1f} s", code == 0 and seconds < LIMIT)


def pipe(program, folder, twice=False):
    reading, writing = os.pipe()
    fcntl.fcntl(writing, fcntl.F_SETPIPE_SZ, SMALL_PIPE)
    watch = start(program, folder, "ndjson:-", writing)
    full = time.monotonic() + 60
    size = -1
    while time.monotonic() < full:  # until a second has passed without room for more
        now = struct.unpack("i", fcntl.ioctl(reading, 0x541B, b"\0" * 4))[0]  # FIONREAD
        if size == now > 0:
            break
        size = now
        time.sleep(1.5)
    check("the pipe never filled", size > 0)
    if twice:
        watch.send_signal(signal.SIGTERM)
        time.sleep(0.2)
        code, seconds = end(watch)
        check(f"ended with {code} after {seconds:.1f} s", code == 130 and seconds < 0.8 * SLACK)
    else:
        code, seconds = end(watch)
        check(f"ended with {code} after {seconds:.1f} s", code == 0 and seconds < LIMIT)
    os.close(reading)


def main():
    program, case = sys.argv[1:3]
    with tempfile.TemporaryDirectory() as folder:
        if case == "name":
            sys.exit(in_own_network([program, "inner", sys.argv[3]], folder))
        if case == "inner":
            name(program, folder)
        elif case == "adapter":
            adapter(program, folder)
        else:
            pipe(program, folder, case == "twice")


main()
