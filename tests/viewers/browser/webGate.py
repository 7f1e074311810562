#!/usr/bin/python3
# SPDX-License-Identifier: MIT
"""Opens a screen to browsers: Debian's noVNC and websockify on a free port of the loopback address.

usage: webGate.py ADDRESS      (HOST:PORT, or the path of a UNIX socket)
The first line on standard output is the address for the browser.
"""

import os
import socket
import sys

PAGES = "/usr/share/novnc"


def main(address):
    listener = socket.create_server(("127.0.0.1", 0))
    port = listener.getsockname()[1]
    print(f"http://127.0.0.1:{port}/vnc_lite.html", flush=True)
    # websockify takes over the open socket as its standard input.
    os.dup2(listener.fileno(), 0)
    nowhere = os.open("/dev/null", os.O_WRONLY)
    os.dup2(nowhere, 1)
    os.dup2(nowhere, 2)
    target = [f"--unix-target={address}"] if "/" in address else [address]
    os.execvp("websockify", ["websockify", "--inetd", "--web", PAGES, *target])


if __name__ == "__main__":
    main(*sys.argv[1:])
