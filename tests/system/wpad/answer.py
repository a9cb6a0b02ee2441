#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Answers what comes to port 67 with the bytes of a file, whatever they are.

  answer.py HEXFILE SKIP

Prints every message as a line of hexadecimal text. The first SKIP messages are left unanswered. The answer goes to port 68
of the address in the message, or of the sender when there is none.
"""
import socket, sys

answer = bytes.fromhex(open(sys.argv[1]).read())
skip = int(sys.argv[2])
server = socket.socket(socket.AF_INET, socket.SOCK_DGRAM)
server.bind(("", 67))
print("listening", flush=True)
while True:
    message, sender = server.recvfrom(2048)
    print(message.hex(), flush=True)
    if skip > 0:
        skip -= 1
        continue
    ciaddr = socket.inet_ntoa(message[12:16])
    server.sendto(answer, (sender[0] if ciaddr == "0.0.0.0" else ciaddr, 68))
