#!/usr/bin/python3
# SPDX-License-Identifier: MIT
"""Opens a screen to browsers: Debian's noVNC and websockify on a free port of the loopback address.

usage: webGate.py ADDRESS      (HOST:PORT, or the path of a UNIX socket)
The first line on standard output is the address for the browser.
"""

import contextlib
import os
import signal
import socket
import subprocess
import sys

PAGES = "/usr/share/novnc"


def main(address):
    listener = socket.create_server(("127.0.0.1", 0))
    port = listener.getsockname()[1]
    print(f"http://127.0.0.1:{port}/vnc_lite.html", flush=True)
    # websockify takes over the open socket as its standard input. What it starts for each browser
    # outlives it, so all of them end here.
    target = [f"--unix-target={address}"] if "/" in address else [address]
    gate = subprocess.Popen(["websockify", "--inetd", "--web", PAGES, *target], stdin=listener,
                            stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL, start_new_session=True)
    signal.signal(signal.SIGTERM, lambda *_: sys.exit())
    try:
        gate.wait()
    finally:
        with contextlib.suppress(ProcessLookupError):
            os.killpg(gate.pid, signal.SIGKILL)


if __name__ == "__main__":
    main(*sys.argv[1:])
