#!/usr/bin/python3
# SPDX-License-Identifier: MIT
"""Looks at a screen with a real browser, and reads back what is on its canvas.

usage: canvas.py URL PICTURE COMMAND...
Saves the canvas of the noVNC page at URL as the PNG file PICTURE and runs COMMAND, again and again until
it succeeds. Ends with 0 then; with the command's status when it has not succeeded for a minute. A line
on standard input makes it begin once more.
"""

import base64
import subprocess
import sys
import tempfile
import time

from selenium import webdriver
from selenium.webdriver.chrome.options import Options
from selenium.webdriver.chrome.service import Service

SWITCHES = """--headless=new --no-sandbox --disable-gpu --disable-quic --no-first-run
--disable-background-networking --disable-component-update --disable-sync --window-size=1400,1000"""
READ = """const canvas = document.querySelector('#screen canvas');
return canvas && canvas.width > 1 ? canvas.toDataURL('image/png').split(',')[1] : '';"""
PATIENCE = 60


def open_browser(profile):
    options = Options()
    options.binary_location = "/usr/bin/chromium"
    for switch in SWITCHES.split():
        options.add_argument(switch)
    options.add_argument(f"--user-data-dir={profile}")
    return webdriver.Chrome(service=Service("/usr/bin/chromedriver"), options=options)


def succeeds(browser, picture, command):
    status = 2
    deadline = time.monotonic() + PATIENCE
    while status != 0 and time.monotonic() < deadline:
        png = browser.execute_script(READ)
        if png:
            with open(picture, "wb") as file:
                file.write(base64.b64decode(png))
            result = subprocess.run(command, capture_output=True, text=True, check=False)
            status = result.returncode
            said = result.stdout + result.stderr
        time.sleep(0.3)
    print(said.strip() if png else "there is no canvas", flush=True)
    return status


def main(url, picture, *command):
    with tempfile.TemporaryDirectory() as profile:
        browser = open_browser(profile)
        try:
            browser.get(url)
            status = succeeds(browser, picture, command)
            while status == 0 and sys.stdin.readline():
                status = succeeds(browser, picture, command)
        finally:
            browser.quit()
    return status


if __name__ == "__main__":
    sys.exit(main(*sys.argv[1:]))
