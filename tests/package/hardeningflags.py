#!/usr/bin/env python3
"""Every source is compiled with the flags whose effect can't be read from binaries, and with those given.

hardeningflags.py COMPILE_COMMANDS [FLAG...]
"""
import json
import sys

wanted = ("-fstack-clash-protection", "-fcf-protection=full", "-fstack-protector-strong", *sys.argv[2:])
commands = json.load(open(sys.argv[1]))
lacking = [(each["file"], flag) for each in commands for flag in wanted if flag not in each["command"].split()]
for file, flag in lacking[:10]:
    print(f"{file} is compiled without {flag}")
print(f"{len(commands)} commands looked at, {len(lacking)} flags lacking")
sys.exit(1 if lacking or len(commands) < 20 else 0)
