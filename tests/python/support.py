# SPDX-License-Identifier: MIT
"""What the tests of the Python client need: the daemon, a peer that is told what to say, media."""

import os
import queue
import re
import signal
import socket
import subprocess
import tempfile
import threading
import time
import unittest

import qnsmedia

PATIENCE = 60  # seconds; whoever waits that long has failed


def temporary_folder(test):
    folder = tempfile.TemporaryDirectory()
    test.addCleanup(folder.cleanup)
    return folder.name


def make_film(path):
    """Two seconds of picture and sound, with a title."""
    subprocess.run(
        ["ffmpeg", "-v", "error", "-y", "-f", "lavfi", "-i", "testsrc2=size=160x120:rate=25",
         "-f", "lavfi", "-i", "sine=sample_rate=48000", "-t", "2", "-g", "25", "-c:v", "libx264",
         "-pix_fmt", "yuv420p", "-c:a", "aac", "-metadata", "title=Überfahrt", path],
        check=True, stdin=subprocess.DEVNULL)


def wait_until_it_listens(process):
    """Nothing tells when another process listens: the only thing to do is to look."""
    until = time.monotonic() + PATIENCE
    command = ["ss", "--no-header", "--listening", "--tcp", "--numeric",
               f"sport = {qnsmedia.DAEMON[1]}"]
    while not subprocess.run(command, capture_output=True, check=True).stdout:
        if process.poll() is not None or time.monotonic() > until:
            raise AssertionError("the daemon does not listen")
        time.sleep(0.005)


class DaemonTest(unittest.TestCase):
    """A test with the daemon, which must have ended by itself or by a signal with status 0."""

    OPTIONS = ()

    def setUp(self):
        self.data = temporary_folder(self)
        self.log = open(os.path.join(self.data, "daemon.log"), "w+b")
        self.addCleanup(self.log.close)
        self.daemon = subprocess.Popen(
            ["setpriv", "--pdeathsig", "KILL", "--", os.environ["QNS_DAEMON"],
             *self.OPTIONS],
            stdout=self.log, stderr=subprocess.STDOUT,
            env={**os.environ, "QNS_HV_DATA": self.data})
        self.addCleanup(self.end_daemon)
        wait_until_it_listens(self.daemon)

    def end_daemon(self):
        if self.daemon.poll() is None:
            self.daemon.send_signal(signal.SIGTERM)
        status = self.daemon.wait(PATIENCE)
        self.log.seek(0)
        self.assertEqual(status, 0, self.log.read().decode(errors="replace"))

    def connect(self, identity=None):
        connection = qnsmedia.Connection(identity, deadline=PATIENCE)
        self.addCleanup(connection.close)
        return connection


class Events(queue.Queue):
    """Takes notifications; wait_for() skips those of other kinds."""

    def wait_for(self, kind):
        while (event := self.get(timeout=PATIENCE)) is not None and event.kind is not kind:
            pass
        return event


class Peer:
    """Stands in for the daemon: takes requests, and answers what the test tells it to.

    answer(packet) gives the packets to be sent back. Requests are kept in .requests.
    """

    def __init__(self, answer=lambda packet: ()):
        self.answer = answer
        self.requests = queue.Queue()
        self.acknowledgements = queue.Queue()
        self._listener = socket.create_server(qnsmedia.DAEMON)
        self._client = None
        self._from_client = None
        self._taker = None
        self._thread = threading.Thread(target=self._serve, daemon=True)
        self._thread.start()

    def close(self):
        self.hang_up()
        self._listener.close()
        self._thread.join(PATIENCE)
        if self._taker:
            self._taker.join(PATIENCE)

    def hang_up(self):
        """Ends both connections."""
        for end in (self._listener, self._from_client, self._client):
            try:
                end and end.shutdown(socket.SHUT_RDWR)
            except OSError:
                pass

    def end_requests(self):
        """Ends the connection that carries requests, on this side only."""
        self._from_client.shutdown(socket.SHUT_WR)

    def connect_to(self, identity):
        self._client = socket.create_connection((qnsmedia.DAEMON[0], identity))
        self._taker = threading.Thread(target=self._take_acknowledgements, daemon=True)
        self._taker.start()

    def send(self, data):
        self._client.sendall(data)

    def _take_acknowledgements(self):
        with self._client as client:
            while data := client.recv(3, socket.MSG_WAITALL):
                self.acknowledgements.put(data)

    def _serve(self):
        try:
            self._from_client = self._listener.accept()[0]
            while data := self._from_client.recv(qnsmedia.PACKET_SIZE, socket.MSG_WAITALL):
                self._from_client.sendall(qnsmedia.ACKNOWLEDGEMENT)
                packet = qnsmedia.Packet.from_bytes(data)
                self.requests.put(packet)
                for answer in self.answer(packet):
                    self.send(answer.to_bytes())
        except OSError:
            pass  # the test hung up
        finally:
            if self._from_client:
                self._from_client.close()


def blocks_of_page():
    """The fenced blocks of the protocol's page: the words behind the fence, and the lines."""
    with open(os.environ["QNS_PROTOCOL_PAGE"], encoding="utf-8") as page:
        return [(title, lines.splitlines())
                for title, lines in re.findall(r"^```(.*)\n((?:.*\n)*?)```$", page.read(), re.M)]


def bytes_in(lines):
    return bytes.fromhex(" ".join(line.split("#")[0] for line in lines))
