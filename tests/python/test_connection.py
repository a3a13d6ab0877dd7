# SPDX-License-Identifier: MIT
"""What the Python client does when the other end does not do what it should."""

import socket
import threading
import unittest

import qnsmedia
from qnsmedia import Packet
from support import PATIENCE, Events, Peer

ACCEPTED = qnsmedia.encode(0)
PLAYING = qnsmedia.encode(3, 0, 5, 7)


class PeerTest(unittest.TestCase):
    """A peer that accepts every request; a test replaces what it answers to some of them."""

    def setUp(self):
        self.object = None
        self.arguments = {7: PLAYING}  # by request; None for no answer
        self.peer = Peer(self.answer)
        self.addCleanup(self.peer.close)

    def answer(self, packet):
        if packet.method == 13:
            self.object = qnsmedia.Reader(packet.arguments).integer()
            self.peer.connect_to(1000)
            return [Packet(1, self.object, 1, True, qnsmedia.encode(1))]
        arguments = self.arguments.get(packet.method, ACCEPTED)
        if packet.method in (10, 11, 14) or arguments is None:
            return []
        return [Packet(1, self.object, packet.method + 1, True, arguments)]

    def connect(self, deadline=PATIENCE):
        connection = qnsmedia.Connection(1000, deadline)
        self.addCleanup(connection.close)
        return connection


class AConnection(PeerTest):
    def test_finds_that_no_daemon_runs(self):
        self.peer.close()
        self.assertRaises(qnsmedia.DaemonNotRunning, qnsmedia.Connection, 1000)
        socket.create_server((qnsmedia.DAEMON[0], 1000)).close()

    def test_takes_the_first_identity_that_is_free(self):
        with socket.create_server((qnsmedia.DAEMON[0], 1000)):
            connection = qnsmedia.Connection()
            self.addCleanup(connection.close)
            self.assertEqual(connection.identity, 1001)

    def test_finds_that_its_identity_is_taken(self):
        with socket.create_server((qnsmedia.DAEMON[0], 1000)):
            self.assertRaises(qnsmedia.IdentityInUse, qnsmedia.Connection, 1000)

    def test_that_ends_ends_all_waiting(self):
        self.arguments[4] = None
        player = qnsmedia.Player(self.connect())
        self.peer.answer = lambda packet: self.peer.hang_up() or ()
        self.assertRaises(qnsmedia.ConnectionLost, player.play)
        self.assertRaises(qnsmedia.ConnectionLost, player.play)

    def test_that_ends_lets_the_last_answer_through(self):
        self.arguments[9] = bytes(4)
        player = qnsmedia.Player(self.connect())
        noticed, answered = threading.Event(), Events()

        def end_first(packet):
            self.peer.end_requests()
            noticed.wait(PATIENCE)
            return self.answer(packet)

        self.peer.answer = end_first
        threading.Thread(target=lambda: answered.put(player.power_off())).start()
        with self.assertRaises(qnsmedia.ConnectionLost):
            while True:
                player.set_display(50)  # until the end is noticed
        noticed.set()
        self.assertIsNone(answered.get(timeout=PATIENCE))

    def test_that_ends_is_told_to_the_handler(self):
        events = Events()
        qnsmedia.Player(self.connect(), on_notification=events.put)
        self.peer.hang_up()
        self.assertIsNone(events.get(timeout=PATIENCE))

    def test_outlives_a_stranger_who_connects_and_goes(self):
        player = qnsmedia.Player(self.connect())
        with socket.create_connection((qnsmedia.DAEMON[0], 1000)) as stranger:
            stranger.sendall(b"hello")
            stranger.shutdown(socket.SHUT_WR)
            while stranger.recv(3):
                pass
        player.play()

    def test_unregisters_before_it_closes(self):
        with self.connect() as connection:
            qnsmedia.Player(connection, on_notification=lambda event: None)
        methods = [packet.method for packet in self.peer.requests.queue]
        self.assertEqual(methods, [13, 14, 11, 10])


class ARequest(PeerTest):
    def test_that_is_not_answered_times_out(self):
        player = qnsmedia.Player(self.connect(deadline=0.05))
        self.arguments[4] = None
        self.assertRaises(qnsmedia.TimedOut, player.play)

    def test_that_is_refused_tells_the_number(self):
        player = qnsmedia.Player(self.connect())
        self.arguments[4] = qnsmedia.encode(1)
        with self.assertRaises(qnsmedia.Refused) as refusal:
            player.play()
        self.assertEqual(refusal.exception.result, 1)

    def test_is_not_answered_by_the_late_answer_to_another(self):
        connection = self.connect(deadline=0.05)
        player = qnsmedia.Player(connection)
        self.arguments[4] = None
        self.assertRaises(qnsmedia.TimedOut, player.play)
        connection.deadline = PATIENCE
        late = Packet(1, self.object, 5, True, qnsmedia.encode(1))
        own = Packet(1, self.object, 5, True, ACCEPTED)
        self.peer.answer = lambda packet: (late, own) if packet.method == 4 else ()
        player.play()

    def test_for_the_status_takes_any_answer_for_its_own(self):
        connection = self.connect(deadline=0.05)
        player = qnsmedia.Player(connection)
        self.arguments[7] = None
        self.assertRaises(qnsmedia.TimedOut, player.status)
        connection.deadline = PATIENCE
        self.arguments[7] = PLAYING
        self.assertEqual(player.status(), qnsmedia.PlayerState(3, 5, 7))

    def test_is_answered_by_callbacks_alone(self):
        player = qnsmedia.Player(self.connect())
        refused = qnsmedia.encode(1)
        senseless = bytearray(Packet(1, self.object, 5, True, refused).to_bytes())
        senseless[40:48] = (2 ** 40).to_bytes(8, "little")
        others = [senseless, Packet(1, self.object, 5, False, refused).to_bytes(),
                  Packet(1, self.object + 1, 5, True, refused).to_bytes()]

        def answer_last(packet):
            if packet.method == 4:
                for other in others:
                    self.peer.send(other)
            return self.answer(packet)

        self.peer.answer = answer_last
        player.play()

    def test_survives_answers_that_nobody_waits_for(self):
        player = qnsmedia.Player(self.connect())
        surplus = [Packet(1, target, method, callback, ACCEPTED)
                   for target, method, callback in ((self.object, 5, True), (99, 5, True),
                                                    (self.object, 77, True),
                                                    (self.object, 5, False))]
        for packet in surplus:
            self.peer.send(packet.to_bytes())
        player.pause()

    def test_may_come_from_any_thread(self):
        player = qnsmedia.Player(self.connect())
        states = []
        threads = [threading.Thread(target=lambda: states.append(player.status()))
                   for _ in range(8)]
        for thread in threads:
            thread.start()
        for thread in threads:
            thread.join(PATIENCE)
        self.assertEqual(states, 8 * [qnsmedia.PlayerState(3, 5, 7)])

    def test_too_large_for_a_packet_is_not_sent(self):
        player = qnsmedia.Player(self.connect())
        self.assertRaises(ValueError, player.open, "x" * qnsmedia.MAX_ARGUMENTS)
        player.open("x" * (qnsmedia.MAX_ARGUMENTS - 5))


class Packets(PeerTest):
    def test_are_acknowledged_once_for_each_read_and_may_come_in_pieces(self):
        player = qnsmedia.Player(self.connect())
        self.assertEqual(self.peer.acknowledgements.get(timeout=PATIENCE), b"OK\0")
        self.arguments[4] = None
        answer = Packet(1, self.object, 5, True, ACCEPTED).to_bytes()

        def in_pieces(packet):
            if packet.method == 4:
                self.peer.send(answer[:100])
                self.peer.acknowledgements.get(timeout=PATIENCE)
                self.peer.send(answer[100:])
            return ()

        self.peer.answer = in_pieces
        player.play()


class AHandler(PeerTest):
    def notify(self, target):
        arguments = qnsmedia.encode(3, 0, "", 0, 0, 0, 0, 0, 8)
        self.peer.send(Packet(1, target, 1, True, arguments).to_bytes())

    def register(self, handler):
        player = qnsmedia.Player(self.connect(), on_notification=handler)
        while (request := self.peer.requests.get(timeout=PATIENCE)).method != 14:
            pass
        return player, qnsmedia.Reader(request.arguments).integer()

    def test_may_make_requests(self):
        states = Events()
        player, target = self.register(lambda event: event and states.put(player.status()))
        self.notify(target)
        self.assertEqual(states.get(timeout=PATIENCE).position, 5)

    def test_that_fails_does_not_end_the_others(self):
        events = Events()

        def fail_once(event):
            events.put(event)
            if events.qsize() == 1:
                raise RuntimeError("on purpose")

        _, target = self.register(fail_once)
        self.notify(target)
        self.notify(target)
        for _ in range(2):
            self.assertEqual(events.get(timeout=PATIENCE).time, 8)


class Arguments(unittest.TestCase):
    def test_of_every_length_and_width_come_back(self):
        for value in ("", "x" * 30, "x" * 31, "x" * 65534, "x" * 65535, "\udcff", 0, 127, 128,
                      2 ** 16, 2 ** 32, 2 ** 64 - 1, -32, -33, -129, -2 ** 15 - 1, -2 ** 31 - 1,
                      -2 ** 63):
            reader = qnsmedia.Reader(qnsmedia.encode(value))
            with self.subTest(value):
                self.assertEqual(reader.text() if isinstance(value, str) else reader.integer(),
                                 value)
        self.assertRaises(ValueError, qnsmedia.encode, 2 ** 64)

    def test_of_other_kinds_come_back(self):
        reader = qnsmedia.Reader(qnsmedia.encode(None, True, False, b"ab"))
        self.assertEqual([reader.item() for _ in range(4)], [None, True, False, b"ab"])

    def test_that_are_damaged_are_found(self):
        for data in (b"", b"\xCD\x01", b"\xA3ab", b"\xDA\x00", b"\xC1"):
            with self.subTest(data):
                self.assertRaises(qnsmedia.ProtocolError, qnsmedia.Reader(data).item)


if __name__ == "__main__":
    unittest.main()
