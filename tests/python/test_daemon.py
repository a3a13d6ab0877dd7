# SPDX-License-Identifier: MIT
"""The Python client and the real daemon, which have nothing but the protocol's page in common."""

import os
import signal
import subprocess
import sys
import tempfile
import unittest

import qnsmedia
from qnsmedia import ImporterEvent, PlayerEvent, PlayerStatus
from support import PATIENCE, DaemonTest, Events, make_film, temporary_folder

SECOND = 10 ** 9
FRAME = SECOND // 25


def setUpModule():
    global folder, film
    folder = tempfile.TemporaryDirectory()
    unittest.addModuleCleanup(folder.cleanup)
    film = os.path.join(folder.name, "Überfahrt.mp4")
    make_film(film)


class ThePlayer(DaemonTest):
    def setUp(self):
        super().setUp()
        self.connection = self.connect()
        self.events = Events()
        self.player = qnsmedia.Player(self.connection, on_notification=self.events.put)

    def open_film(self):
        self.player.open(film)
        return self.events.wait_for(PlayerEvent.OPENED)

    def test_opens_plays_and_comes_to_the_end(self):
        opened = self.open_film()
        self.assertEqual((opened.result, opened.text), (qnsmedia.Result.SUCCESS, film))
        self.assertEqual(opened.parameters, (1, 1, 0))
        self.assertTrue(opened.seekable)
        self.assertAlmostEqual(opened.time, 2 * SECOND, delta=SECOND // 10)
        self.player.play()
        self.events.wait_for(PlayerEvent.END)
        self.assertEqual(self.events.wait_for(PlayerEvent.STATE).parameters[:2],
                         (PlayerStatus.ENDED, PlayerStatus.PLAYING))
        self.assertEqual(self.player.status().status, PlayerStatus.ENDED)

    def test_pauses_seeks_and_tells_where_it_is(self):
        self.open_film()
        self.player.play()
        self.player.pause()
        self.player.seek(SECOND)
        self.assertEqual(self.events.wait_for(PlayerEvent.SOUGHT).result, 0)
        state = self.player.status()
        self.assertEqual(state.status, PlayerStatus.PAUSED)
        self.assertAlmostEqual(state.position, SECOND, delta=FRAME)

    def test_loops(self):
        self.open_film()
        self.player.set_repeat(True, SECOND // 2, SECOND)
        self.player.play()
        for _ in range(2):
            self.assertIsNotNone(self.events.wait_for(PlayerEvent.LOOPED))
        self.player.set_repeat(False)
        self.events.wait_for(PlayerEvent.END)

    def test_tells_why_a_file_does_not_open(self):
        self.player.open("/nowhere/film.mp4")
        self.assertEqual(self.events.wait_for(PlayerEvent.OPENED).result,
                         qnsmedia.Result.NOT_FOUND)

    def test_shows_a_black_picture_before_the_first_film(self):
        self.player.initialize()
        self.assertNotEqual(self.events.wait_for(PlayerEvent.OPENED).text, film)
        self.assertEqual(self.open_film().text, film)

    def test_is_shared_by_clients(self):
        other = qnsmedia.Player(self.connect())
        self.assertNotEqual(other.client_id, self.player.client_id)
        other.set_display(50)
        self.open_film()
        other.play()
        self.events.wait_for(PlayerEvent.END)
        self.player.close()
        self.assertIn(other.status().status, (PlayerStatus.NOT_READY, PlayerStatus.CLOSED))

    def test_ends_the_daemon(self):
        self.player.power_off()
        self.assertEqual(self.daemon.wait(PATIENCE), 0)
        self.assertIsNone(self.events.wait_for(None))
        self.assertRaises(qnsmedia.ConnectionLost, self.player.play)


class TheDiscoverer(DaemonTest):
    def setUp(self):
        super().setUp()
        self.connection = self.connect()
        self.discoverer = qnsmedia.Discoverer(self.connection)

    def test_tells_what_a_film_is(self):
        self.discoverer.open(film)
        metadata = self.discoverer.metadata()
        self.assertEqual(metadata.media_type, "video/mp4")
        self.assertEqual(metadata.tags["TITLE"], "Überfahrt")
        self.assertTrue(metadata.seekable)
        self.assertAlmostEqual(metadata.duration, 2 * SECOND, delta=SECOND // 10)
        video, = metadata.video
        self.assertEqual((video.width, video.height, video.frame_rate), (160, 120, (25, 1)))
        self.assertEqual((video.pixel_aspect, video.interlaced, video.still),
                         ((1, 1), False, False))
        audio, = metadata.audio
        self.assertEqual(audio.sample_rate, 48000)

    def test_opens_the_next_file_when_the_last_is_closed(self):
        self.discoverer.open(film)
        with self.assertRaises(qnsmedia.Refused) as refusal:
            self.discoverer.open(film)
        self.assertEqual(refusal.exception.result, qnsmedia.Result.NOT_AVAILABLE)
        self.discoverer.close()
        self.discoverer.open(film)

    def test_tells_why_a_file_does_not_open(self):
        with self.assertRaises(qnsmedia.Refused) as refusal:
            self.discoverer.open("/nowhere/film.mp4")
        self.assertEqual(refusal.exception.result, qnsmedia.Result.NOT_FOUND)

    def test_draws_a_picture_without_a_word_when_nothing_is_wrong(self):
        picture = os.path.join(temporary_folder(self), "film.png")
        self.discoverer.open(film)
        self.discoverer.image(picture, width=80, position=SECOND)
        with open(picture, "rb") as file:
            head = file.read(24)
        self.assertEqual(head[:8], b"\x89PNG\r\n\x1a\n")
        self.assertEqual(head[16:], (80).to_bytes(4, "big") + (60).to_bytes(4, "big"))

    def test_tells_which_endings_it_knows(self):
        self.assertIn("mp4", self.discoverer.extensions())

    def test_refuses_an_eleventh_client(self):
        for _ in range(9):
            qnsmedia.Discoverer(self.connection)
        self.assertRaises(qnsmedia.Refused, qnsmedia.Discoverer, self.connection)


class TheImporter(DaemonTest):
    def setUp(self):
        super().setUp()
        self.events = Events()
        self.importer = qnsmedia.Importer(self.connect(), on_notification=self.events.put)
        self.importer.initialize()

    def test_takes_a_file_where_it_lies(self):
        self.importer.import_file(film)
        self.assertEqual(self.events.wait_for(ImporterEvent.STARTED).text, film)
        finished = self.events.wait_for(ImporterEvent.FINISHED)
        self.assertEqual((finished.result, finished.text), (qnsmedia.Result.SUCCESS, film))
        self.assertEqual((finished.width, finished.height, finished.frame_rate,
                          finished.sample_rate), (160, 120, (25, 1), 48000))
        self.assertIn("H.264", finished.video)
        self.assertEqual(self.importer.status().status, qnsmedia.ImporterStatus.IDLE)

    def test_takes_a_file_into_a_folder(self):
        self.importer.import_file(film, "Filme")
        place = self.events.wait_for(ImporterEvent.FINISHED).text
        self.assertEqual(place, os.path.join(self.data, "media", "Filme", "Überfahrt.mp4"))
        self.assertEqual(os.path.getsize(place), os.path.getsize(film))

    def test_does_not_take_a_file_of_which_nothing_can_be_read(self):
        self.importer.import_file("/nowhere/film.mp4")
        finished = self.events.wait_for(ImporterEvent.FINISHED)
        self.assertEqual((finished.result, finished.text), (qnsmedia.Result.NOT_FOUND, ""))

    def test_can_be_told_to_stop(self):
        self.importer.cancel()
        self.assertEqual(self.importer.status().status, qnsmedia.ImporterStatus.IDLE)


class OneClient(DaemonTest):
    def test_uses_all_services_over_one_connection(self):
        connection = self.connect(1007)
        player = qnsmedia.Player(connection)
        discoverer = qnsmedia.Discoverer(connection)
        importer = qnsmedia.Importer(connection)
        self.assertEqual([player.client_id, discoverer.client_id, importer.client_id], [1, 1, 1])
        self.assertEqual(player.status().status, PlayerStatus.NOT_READY)

    def test_may_have_any_identity(self):
        for identity in qnsmedia.IDENTITIES:
            self.assertEqual(qnsmedia.Player(self.connect(identity)).status().status,
                             PlayerStatus.NOT_READY)


class AClientThatRestarts(DaemonTest):
    OPTIONS = ("--reconnect-clients",)

    def test_is_served_under_the_same_identity(self):
        for _ in range(3):
            with qnsmedia.Connection(1000, PATIENCE) as connection:
                discoverer = qnsmedia.Discoverer(connection)
                discoverer.open(film)
                self.assertEqual(discoverer.metadata().media_type, "video/mp4")

    def test_is_told_of_what_another_life_began(self):
        with qnsmedia.Connection(1000, PATIENCE) as connection:
            qnsmedia.Player(connection).open(film)
        events = Events()
        player = qnsmedia.Player(self.connect(1000), on_notification=events.put)
        player.play()
        events.wait_for(PlayerEvent.END)


class TheCommandLine(DaemonTest):
    @staticmethod
    def command(identity, *arguments):
        return [sys.executable, qnsmedia.__file__, "--timeout", str(PATIENCE),
                "--identity", str(identity), *arguments]

    def run_tool(self, identity, *arguments, status=0):
        done = subprocess.run(self.command(identity, *arguments), capture_output=True,
                              encoding="utf-8", timeout=PATIENCE, check=False)
        self.assertEqual(done.returncode, status, done.stderr)
        return done.stdout + done.stderr

    def test_does_all_that_the_module_can(self):
        picture = os.path.join(temporary_folder(self), "film.jpg")
        self.assertIn("NOT_READY at 0.000 s", self.run_tool(1000, "status"))
        self.assertIn("160x120", self.run_tool(1001, "info", film))
        self.run_tool(1002, "image", film, picture, "--at", "1")
        self.assertTrue(os.path.exists(picture))
        self.assertIn("mp4", self.run_tool(1003, "extensions"))
        self.assertIn("Überfahrt.mp4", self.run_tool(1004, "import", film))
        self.assertIn("playing", self.run_tool(1005, "play", film))
        self.assertIn("refused (1)", self.run_tool(1006, "info", "/nowhere.mp4", status=1))
        self.run_tool(1007, "poweroff")
        self.assertEqual(self.daemon.wait(PATIENCE), 0)
        self.assertIn("not running", self.run_tool(1000, "status", status=3))
        self.run_tool(1000, "dance", status=2)

    def test_tells_what_happens_until_it_is_interrupted(self):
        with subprocess.Popen(self.command(1000, "monitor"), encoding="utf-8",
                              stdout=subprocess.PIPE) as monitor:
            self.assertIn("NOT_READY", monitor.stdout.readline())
            qnsmedia.Player(self.connect(1001)).open(film)
            self.assertIn(film, next(line for line in monitor.stdout if "OPENED" in line))
            monitor.send_signal(signal.SIGINT)
            self.assertEqual(monitor.wait(PATIENCE), 130)

    def test_notices_the_end_of_the_daemon(self):
        with subprocess.Popen(self.command(1000, "monitor"), encoding="utf-8",
                              stdout=subprocess.PIPE, stderr=subprocess.PIPE) as monitor:
            self.assertIn("NOT_READY", monitor.stdout.readline())
            self.daemon.send_signal(signal.SIGTERM)
            self.assertIn("ended its connection", monitor.communicate(timeout=PATIENCE)[1])
            self.assertEqual(monitor.returncode, 4)


if __name__ == "__main__":
    unittest.main()
