# SPDX-License-Identifier: MIT
"""The client says and understands what the protocol's page shows."""

import collections
import re
import unittest

import qnsmedia
from qnsmedia import Packet
from support import PATIENCE, Events, Peer, blocks_of_page, bytes_in

SECOND = 10 ** 9
FILM = "/media/film.mp4"
CLIENT_ID = bytes.fromhex("D2 00 00 00 01")


def packet_in(lines):
    data = bytearray(qnsmedia.PACKET_SIZE)
    for line in lines:
        offset, content = line.split("#")[0].split(":")
        part = bytes.fromhex(content)
        data[int(offset, 16):int(offset, 16) + len(part)] = part
    return bytes(data)


class ThePagesItems(unittest.TestCase):
    def setUp(self):
        lines = [line for title, lines in blocks_of_page() if title == "items" for line in lines]
        self.items = [line.rsplit(":", 1) for line in lines]
        self.assertGreater(len(self.items), 10)

    def test_are_understood(self):
        for name, data in self.items:
            kind, value = name.strip().split(" ", 1)
            reader = qnsmedia.Reader(bytes.fromhex(data))
            with self.subTest(name):
                if kind == "text":
                    self.assertEqual(reader.text(), value.strip('"'))
                else:
                    self.assertEqual(reader.integer(), int(value))
                self.assertRaises(qnsmedia.ProtocolError, reader.item)

    def test_are_written_the_same_way(self):
        for name, data in self.items:
            kind, value = name.strip().split(" ", 1)
            with self.subTest(name):
                if kind == "text":
                    self.assertEqual(qnsmedia.encode(value.strip('"')), bytes.fromhex(data))
                elif kind == "int":
                    self.assertEqual(qnsmedia.encode(int(value)), bytes.fromhex(data))


class ThePagesPackets(unittest.TestCase):
    def setUp(self):
        self.packets = {title: packet_in(lines) for title, lines in blocks_of_page()
                        if title.startswith("packet")}

    def test_are_written_the_same_way(self):
        registration = Packet(8, 62, 13, False, qnsmedia.encode(10, 1000))
        self.assertEqual(registration.to_bytes(), self.packets["packet to-daemon"])

    def test_are_understood(self):
        answer = Packet(1, 10, 1, True, bytes.fromhex("D2 00000001"))
        self.assertEqual(Packet.from_bytes(self.packets["packet to-client"]), answer)


class PageTest(unittest.TestCase):
    """A peer that answers as the page shows for one service, whose blocks begin with PREFIX."""

    PREFIX = ""
    REGISTRATIONS = ()
    UNREGISTRATIONS = ()
    WITHOUT_ANSWER = ()

    def setUp(self):
        self.requests = self.blocks("request")
        self.answers = collections.deque(
            (method, arguments) for method, arguments in self.blocks("callback") if method != 1)
        self.callback_object = None
        self.peer = Peer(self.answer)
        self.addCleanup(self.peer.close)
        self.connection = qnsmedia.Connection(1000, deadline=PATIENCE)
        self.addCleanup(self.connection.close)

    def blocks(self, kind):
        """Method and arguments of each block of the kind."""
        return [(int(title.split()[-1]), bytes_in(lines)) for title, lines in blocks_of_page()
                if re.fullmatch(rf"{self.PREFIX}{kind} \d+", title)]

    def answer(self, packet):
        if packet.method == self.REGISTRATIONS[0]:
            self.callback_object = qnsmedia.Reader(packet.arguments).integer()
            self.peer.connect_to(1000)
            return [Packet(1, self.callback_object, 1, True, CLIENT_ID)]
        if packet.method in self.REGISTRATIONS + self.WITHOUT_ANSWER:
            return []
        method, arguments = self.answers.popleft()
        return [Packet(1, self.callback_object, method, True, arguments)]

    def notify(self):
        """Sends the page's notification, as soon as the client has registered for it."""
        while (request := self.peer.requests.get(timeout=PATIENCE)).method != self.REGISTRATIONS[1]:
            pass
        target = qnsmedia.Reader(request.arguments).integer()
        arguments, = (bytes_in(lines) for title, lines in blocks_of_page()
                      if title == self.PREFIX + "notification")
        self.peer.send(Packet(1, target, 1, True, arguments).to_bytes())

    def expect_requests_of_page(self):
        """The client has sent, byte for byte, what the page shows, without registrations."""
        self.connection.close()
        left_out = self.REGISTRATIONS + self.UNREGISTRATIONS
        sent = [(packet.method, packet.arguments) for packet in self.peer.requests.queue
                if packet.method not in left_out]
        self.assertEqual(sent, [entry for entry in self.requests if entry[0] not in left_out])
        self.assertFalse(self.answers)


class ThePagesPlayer(PageTest):
    REGISTRATIONS = (13, 14)
    UNREGISTRATIONS = (10, 11)
    WITHOUT_ANSWER = UNREGISTRATIONS + (12,)

    def test_is_talked_to_as_shown(self):
        player = qnsmedia.Player(self.connection)
        player.initialize()
        player.set_display(60)
        player.open(FILM)
        player.play()
        player.seek(3 * SECOND // 2)
        player.set_repeat(True, SECOND, 2 * SECOND)
        self.assertEqual(player.status(), qnsmedia.PlayerState(
            qnsmedia.PlayerStatus.PLAYING, 3 * SECOND // 2, 10 * SECOND))
        player.pause()
        player.close()
        self.assertEqual(player.status(),
                         qnsmedia.PlayerState(qnsmedia.PlayerStatus.NOT_READY, 0, 0))
        player.power_off()
        self.expect_requests_of_page()

    def test_notifies_as_shown(self):
        events = Events()
        qnsmedia.Player(self.connection, on_notification=events.put)
        self.notify()
        event = events.wait_for(qnsmedia.PlayerEvent.OPENED)
        self.assertEqual(event, qnsmedia.PlayerNotification(
            qnsmedia.PlayerEvent.OPENED, qnsmedia.Result.SUCCESS, FILM, (1, 2, 0), (1, 0),
            10 * SECOND))
        self.assertTrue(event.seekable)
        self.assertFalse(event.live)


class ThePagesDiscoverer(PageTest):
    PREFIX = "discoverer "
    REGISTRATIONS = (8,)
    UNREGISTRATIONS = WITHOUT_ANSWER = (7,)

    def test_is_talked_to_as_shown(self):
        discoverer = qnsmedia.Discoverer(self.connection)
        discoverer.open(FILM)
        self.assertEqual(discoverer.metadata(), qnsmedia.Metadata(
            "video/mp4", {"TITLE": "Film"}, True, False, 10 * SECOND,
            (qnsmedia.VideoStream("video/x-h264", "H.264", 640, 360, 24, (25, 1), (1, 1), False,
                                  800000, 1000000, False),),
            (qnsmedia.AudioStream("audio/mpeg", "AAC", 2, 48000, 0, 128000, 128000),)))
        discoverer.image("/srv/film.jpg", width=320, position=3 * SECOND // 2)
        discoverer.close()
        self.expect_requests_of_page()


class ThePagesImporter(PageTest):
    PREFIX = "importer "
    REGISTRATIONS = (7, 8)
    UNREGISTRATIONS = WITHOUT_ANSWER = (5, 6)

    def test_is_talked_to_as_shown(self):
        importer = qnsmedia.Importer(self.connection)
        importer.initialize()
        importer.import_file(FILM, "Films")
        importer.cancel()
        self.expect_requests_of_page()

    def test_tells_its_status_as_shown(self):
        self.answers = collections.deque(entry for entry in self.answers if entry[0] == 5)
        importer = qnsmedia.Importer(self.connection)
        self.assertEqual(importer.status(), qnsmedia.ImporterState(
            qnsmedia.ImporterStatus.RUNNING, 0, 1000000))

    def test_notifies_as_shown(self):
        events = Events()
        qnsmedia.Importer(self.connection, on_notification=events.put)
        self.notify()
        event = events.wait_for(qnsmedia.ImporterEvent.STARTED)
        self.assertEqual(event, qnsmedia.ImporterNotification(
            qnsmedia.ImporterEvent.STARTED, qnsmedia.Result.SUCCESS, FILM, "H.264", "AAC",
            640, 360, (25, 1), 48000))


if __name__ == "__main__":
    unittest.main()
