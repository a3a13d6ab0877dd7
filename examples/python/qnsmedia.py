#!/usr/bin/env python3
# SPDX-License-Identifier: MIT
"""A client of QNSMediaService in one file that needs nothing but Python's standard library.

It is written from docs/protocol.md alone, so it also shows that this page is all one needs.

    import queue, qnsmedia

    with qnsmedia.Connection() as connection:
        events = queue.Queue()
        player = qnsmedia.Player(connection, on_notification=events.put)
        player.open("/media/film.mp4")
        for event in iter(events.get, None):
            if event.kind is qnsmedia.PlayerEvent.OPENED:
                player.play()
            elif event.kind is qnsmedia.PlayerEvent.END:
                break

Every request waits for its answer, at most Connection.deadline seconds, and raises an Error when
there is none or the daemon refuses. Requests may be made by any thread. Handlers of notifications
run one after another on a thread of the connection; they may make requests. They get None when
the connection has ended.
"""

import argparse
import collections
import enum
import itertools
import os
import queue
import selectors
import socket
import struct
import sys
import threading
from dataclasses import dataclass

DAEMON = ("127.0.0.1", 1008)
IDENTITIES = range(1000, 1008)
PACKET_SIZE = 20480
MAX_ARGUMENTS = PACKET_SIZE - 56
ACKNOWLEDGEMENT = b"OK\0"


class Error(Exception):
    """The root of all that goes wrong between client and daemon."""


class DaemonNotRunning(Error):
    """Nobody listens at the daemon's port."""


class IdentityInUse(Error):
    """Another process has the identity, or all of them are taken."""


class ConnectionLost(Error):
    """One of the two connections ended: a new Connection is needed."""


class TimedOut(Error):
    """No answer came within the deadline."""


class Refused(Error):
    """The daemon answered, and said no. The attribute result holds the number that it gave."""

    def __init__(self, request, result):
        super().__init__(f"{request} was refused ({result})")
        self.result = result


class ProtocolError(Error):
    """The daemon sent what this client does not understand."""


# Encoding ---------------------------------------------------------------------------------------

_UNSIGNED = ((0xCC, ">B"), (0xCD, ">H"), (0xCE, ">I"), (0xCF, ">Q"))
_SIGNED = ((0xD0, ">b"), (0xD1, ">h"), (0xD2, ">i"), (0xD3, ">q"))
_NUMBERS = dict(_UNSIGNED + _SIGNED + ((0xCA, ">f"), (0xCB, ">d")))
_CONSTANTS = {0xC0: None, 0xC2: False, 0xC3: True}
_LENGTHS = {0xDA: ">H", 0xDB: ">I"}


def _encode_integer(value):
    if -32 <= value <= 127:
        return struct.pack(">b", value)
    for head, form in _UNSIGNED if value >= 0 else _SIGNED:
        try:
            return bytes([head]) + struct.pack(form, value)
        except struct.error:
            continue
    raise ValueError(f"{value} does not fit into 64 bits")


def _encode_bytes(data):
    if len(data) < 32:
        return bytes([0xA0 + len(data)]) + data
    if len(data) < 1 << 16:
        return b"\xDA" + struct.pack(">H", len(data)) + data
    return b"\xDB" + struct.pack(">I", len(data)) + data


def encode(*items):
    """The bytes of the items: None, bool, int, str (a zero byte is added) or bytes (as they are).

    Text is sent in UTF-8; file names that are not come back unharmed from os.fsdecode().
    """
    packed = b""
    for item in items:
        if item is None:
            packed += b"\xC0"
        elif isinstance(item, bool):
            packed += b"\xC3" if item else b"\xC2"
        elif isinstance(item, int):
            packed += _encode_integer(item)
        elif isinstance(item, str):
            packed += _encode_bytes(item.encode("utf-8", "surrogateescape") + b"\0")
        else:
            packed += _encode_bytes(bytes(item))
    return packed


class Reader:
    """Takes items one after another from a packet's arguments; ProtocolError at their end."""

    def __init__(self, data):
        self._data = data
        self._at = 0

    def _take(self, size):
        taken = self._data[self._at:self._at + size]
        if len(taken) < size:
            raise ProtocolError("arguments end too early")
        self._at += size
        return taken

    def _number(self, form):
        return struct.unpack(form, self._take(struct.calcsize(form)))[0]

    def item(self):
        """The next item: None, bool, int, float, or bytes for text and bytes."""
        head = self._number(">B")
        if head <= 0x7F:
            return head
        if head >= 0xE0:
            return head - 0x100
        if 0xA0 <= head <= 0xBF:
            return self._take(head - 0xA0)
        if head in _CONSTANTS:
            return _CONSTANTS[head]
        if head in _LENGTHS:
            return self._take(self._number(_LENGTHS[head]))
        if head in _NUMBERS:
            return self._number(_NUMBERS[head])
        raise ProtocolError(f"no item begins with {head:#04x}")

    def integer(self):
        value = self.item()
        if not isinstance(value, int):
            raise ProtocolError("an integer was expected")
        return int(value)

    def flag(self):
        return bool(self.item())

    def raw(self):
        value = self.item()
        if not isinstance(value, bytes):
            raise ProtocolError("text or bytes were expected")
        return value

    def text(self):
        return self.raw().split(b"\0", 1)[0].decode("utf-8", "surrogateescape")


# Packets ----------------------------------------------------------------------------------------

_HEADER = struct.Struct("<qqqqB7xqB7x")


@dataclass(frozen=True)
class Packet:
    """One packet: who it is for, what is wanted, and the encoded arguments."""

    receiver: int
    object: int
    method: int
    callback: bool
    arguments: bytes

    def to_bytes(self):
        if not 1 <= len(self.arguments) <= MAX_ARGUMENTS:
            raise ValueError(f"{len(self.arguments)} bytes of arguments do not fit into a packet")
        header = _HEADER.pack(self.receiver, self.object, self.method, 0, self.callback,
                              len(self.arguments), 1)
        return (header + self.arguments).ljust(PACKET_SIZE, b"\0")

    @classmethod
    def from_bytes(cls, data):
        receiver, target, method, _, callback, size, _ = _HEADER.unpack_from(data)
        if not 1 <= size <= MAX_ARGUMENTS:
            raise ProtocolError(f"a packet with {size} bytes of arguments")
        start = _HEADER.size
        return cls(receiver, target, method, bool(callback), data[start:start + size])


# Connection -------------------------------------------------------------------------------------


def _listen(identity):
    """A socket that listens at the identity's port, or at the first free one's for None."""
    for port in IDENTITIES if identity is None else (identity,):
        listener = socket.socket(socket.AF_INET, socket.SOCK_STREAM)
        listener.setsockopt(socket.SOL_SOCKET, socket.SO_REUSEADDR, 1)
        try:
            listener.bind((DAEMON[0], port))
            listener.listen()
            return listener
        except PermissionError as error:
            listener.close()
            raise Error(f"ports below 1024 need a privilege: {error}") from error
        except OSError:
            listener.close()
    raise IdentityInUse("no identity is free" if identity is None else f"{identity} is in use")


def _without_delay(connection):
    connection.setsockopt(socket.IPPROTO_TCP, socket.TCP_NODELAY, 1)
    return connection


class Connection:
    """The two connections to the daemon, shared by the services of one client process.

    identity: 1000 to 1007, or None for the first that is free.
    deadline: the seconds that any request may take; assign it at any time.
    """

    def __init__(self, identity=None, deadline=5.0):
        self.deadline = deadline
        self._listener = _listen(identity)
        self.identity = self._listener.getsockname()[1]
        self._socket = self._connect()
        self._send_lock = threading.Lock()
        self._state_lock = threading.Lock()
        self._objects = {}  # object id: function that takes a packet
        self._ids = itertools.count(1)
        self._services = []
        self._unread = {}  # connection from the daemon: bytes of an incomplete packet
        self._lost = None
        self._finished = threading.Event()
        self._notifications = queue.SimpleQueue()
        self._wake, self._woken = socket.socketpair()
        self._receiver = threading.Thread(target=self._receive, daemon=True)
        self._notifier = threading.Thread(target=self._notify, daemon=True)
        self._receiver.start()
        self._notifier.start()

    def __enter__(self):
        return self

    def __exit__(self, *_):
        self.close()

    def close(self):
        """Unregisters what is registered, waits until the daemon has read it, and disconnects.

        Not to be called by a handler of notifications.
        """
        for service in self._services:
            service.unregister()
        self._lost = self._lost or "the connection is closed"
        # Ended rather than closed: unread acknowledgements would make the kernel reset the
        # connection, and the daemon lose what it has not read yet.
        _end(self._socket, socket.SHUT_WR)
        self._finished.wait(self.deadline)
        self._wake.close()
        self._receiver.join()
        self._lose()
        self._notifications.put(None)
        self._notifier.join()
        for end in (self._socket, self._listener, self._woken, *self._unread):
            end.close()

    def request(self, target, method, *items):
        """Sends one request to the object target of the daemon; for the services."""
        packet = Packet(8, target, method, False, encode(*items)).to_bytes()
        with self._send_lock:
            self.raise_if_lost()
            try:
                self._socket.settimeout(self.deadline)
                self._socket.sendall(packet)
            except OSError as error:
                # Part of a packet may be on its way: nothing can follow it. The thread that reads
                # notices the end and tells those who wait.
                self._lost = self._lost or f"the daemon does not take requests: {error}"
                _end(self._socket, socket.SHUT_RDWR)
                self.raise_if_lost()

    def add_object(self, receive):
        """The id of a new object, whose packets the function receive gets; for the services.

        It runs on the thread that reads, so it must not wait.
        """
        with self._state_lock:
            number = next(self._ids)
            self._objects[number] = receive
        return number

    def add_service(self, service):
        with self._state_lock:
            self._services.append(service)

    def notify(self, handler, notification):
        """Has handler(notification) called by the thread for notifications; for the services."""
        self._notifications.put((handler, notification))

    def raise_if_lost(self):
        if self._lost:
            raise ConnectionLost(self._lost)

    def _connect(self):
        try:
            return _without_delay(socket.create_connection(DAEMON, self.deadline))
        except ConnectionRefusedError as error:
            self._listener.close()
            raise DaemonNotRunning("the daemon is not running") from error
        except OSError as error:
            self._listener.close()
            raise TimedOut(f"the daemon does not accept: {error}") from error

    def _lose(self):
        """Ends all waiting: nothing will come any more."""
        with self._state_lock:
            services = list(self._services)
        for service in services:
            service.connection_lost()

    def _receive(self):
        with selectors.DefaultSelector() as selector:
            for readable, action in ((self._listener, self._accept),
                                     (self._socket, self._drop_acknowledgements),
                                     (self._woken, None)):
                selector.register(readable, selectors.EVENT_READ, action)
            while True:
                for key, _ in selector.select():
                    if key.data is None:
                        return
                    key.data(selector, key.fileobj)

    def _accept(self, selector, listener):
        connection = _without_delay(listener.accept()[0])
        self._unread[connection] = b""
        selector.register(connection, selectors.EVENT_READ, self._take)

    def _drop_acknowledgements(self, selector, connection):
        if not _read(connection):
            selector.unregister(connection)
            self._finished.set()
            self._lost = self._lost or "the daemon ended the connection"
            # Answers to what was sent before may still be on their way.
            if not self._unread:
                self._lose()

    def _take(self, selector, connection):
        """Reads from the daemon, acknowledges, and hands on each packet that is complete."""
        data = _read(connection)
        if not data:
            selector.unregister(connection)
            connection.close()
            del self._unread[connection]
            if not self._unread:
                self._lost = self._lost or "the daemon ended its connection"
                self._lose()
            return
        try:
            connection.sendall(ACKNOWLEDGEMENT)
        except OSError:
            pass  # the end of the connection is noticed when it is read
        unread = self._unread[connection] + data
        while len(unread) >= PACKET_SIZE:
            self._hand_on(unread[:PACKET_SIZE])
            unread = unread[PACKET_SIZE:]
        self._unread[connection] = unread

    def _hand_on(self, data):
        try:
            packet = Packet.from_bytes(data)
            receive = self._objects.get(packet.object)
            if receive and packet.callback:
                receive(packet)
        except ProtocolError as error:
            print(f"qnsmedia: dropped: {error}", file=sys.stderr)

    def _notify(self):
        while (entry := self._notifications.get()) is not None:
            handler, notification = entry
            try:
                handler(notification)
            except Exception as error:  # a handler's failure must not end the others
                print(f"qnsmedia: a handler failed: {error!r}", file=sys.stderr)


def _read(connection):
    try:
        return connection.recv(1 << 18)
    except OSError:
        return b""


def _end(connection, how):
    try:
        connection.shutdown(how)
    except OSError:
        pass  # it had ended already


# Services ---------------------------------------------------------------------------------------


class Service:
    """What player, discoverer and importer have in common: registration, requests and answers."""

    OBJECT = 0
    REGISTER = UNREGISTER = 0
    REGISTER_NOTIFY = UNREGISTER_NOTIFY = None
    UNORDERED = ()  # methods whose answer may get lost, so that a late one belongs to nobody

    def __init__(self, connection, on_notification=None):
        self._connection = connection
        self._handler = on_notification
        self._lock = threading.Lock()
        # By the callback's method: a queue for each request that waits, which gets the arguments
        # of the answer, or None at the end of the connection.
        self._waiting = collections.defaultdict(collections.deque)
        self._registered = False
        callback_object = connection.add_object(self._answered)
        connection.add_service(self)
        self.client_id = self._call(self.REGISTER, 1, callback_object,
                                    connection.identity).integer()
        self._registered = True
        if on_notification:
            notify_object = connection.add_object(self._notified)
            connection.request(self.OBJECT, self.REGISTER_NOTIFY, notify_object,
                               connection.identity, self.client_id)

    def unregister(self):
        """Gives the registration back. There are no answers and notifications afterwards."""
        if not self._registered:
            return
        self._registered = False
        try:
            if self._handler:
                self._connection.request(self.OBJECT, self.UNREGISTER_NOTIFY, self.client_id)
            self._connection.request(self.OBJECT, self.UNREGISTER, self.client_id)
        except ConnectionLost:
            pass  # nothing is left to be given back

    def connection_lost(self):
        """Ends all waiting; for the connection."""
        with self._lock:
            for requests in self._waiting.values():
                for request in requests:
                    request.put(None)
        if self._handler:
            self._connection.notify(self._handler, None)

    def _notification(self, reader):
        raise NotImplementedError

    def _request(self, method, *items):
        """Requests something for this client and returns a Reader of the answer's arguments."""
        return self._call(method, method + 1, self.client_id, *items)

    def _accepted(self, name, method, *items):
        result = self._request(method, *items).integer()
        if result != 0:
            raise Refused(name, result)

    def _call(self, method, answer, *items):
        request = queue.SimpleQueue()
        # Sent under the lock, so that the order in the queue is the order in which it was sent.
        with self._lock:
            self._waiting[answer].append(request)
            try:
                self._connection.request(self.OBJECT, method, *items)
            except BaseException:
                self._waiting[answer].remove(request)
                raise
        return self._wait(request, answer)

    def _wait(self, request, answer):
        try:
            arguments = request.get(timeout=self._connection.deadline)
        except queue.Empty:
            self._forget(request, answer)
            raise TimedOut("the daemon gave no answer") from None
        if arguments is None:
            self._connection.raise_if_lost()
        return Reader(arguments)

    def _forget(self, request, answer):
        """An answer that is late is still this request's: it must not be taken for the next's."""
        with self._lock:
            if answer in self.UNORDERED and request in self._waiting[answer]:
                self._waiting[answer].remove(request)

    def _answered(self, packet):
        with self._lock:
            requests = self._waiting[packet.method]
            if requests:
                requests.popleft().put(packet.arguments)

    def _notified(self, packet):
        if packet.method == 1:
            self._connection.notify(self._handler, self._notification(Reader(packet.arguments)))


def _enum(kind, value):
    """The value as a member of the enumeration, or as it is when it has none."""
    try:
        return kind(value)
    except ValueError:
        return value


class Result(enum.IntEnum):
    """How something ended, in notifications and answers of the discoverer."""

    WRONG_ARGUMENT = -1
    SUCCESS = 0
    NOT_FOUND = 1
    ACCESS_DENIED = 2
    NOT_MEDIA = 3
    DAMAGED = 4
    NOT_AVAILABLE = 5
    CANCELLED = 6
    TIMED_OUT = 7
    NO_SPACE = 8
    INTERNAL = 9


# Player -----------------------------------------------------------------------------------------


class PlayerStatus(enum.IntEnum):
    NO_PLAYER = -1
    CLOSED = 0
    PAUSED = 1
    NOT_READY = 2
    PLAYING = 3
    ENDED = 4
    FAILED = 5


class PlayerEvent(enum.IntEnum):
    OPENED = 1
    STATE = 2
    END = 3
    FAILED = 4
    LOOPED = 5
    BUFFERING = 6
    SOUGHT = 7


class SeekMode(enum.IntEnum):
    ACCURATE = 0
    KEY_FRAME = 1
    RELATIVE = 2


@dataclass(frozen=True)
class PlayerNotification:
    """What the player tells. Times in nanoseconds.

    parameters: of OPENED the number of video, audio and text streams; of STATE the new and the
    old status; of BUFFERING the percentage.
    """

    kind: PlayerEvent
    result: Result
    text: str
    parameters: tuple
    values: tuple
    time: int

    @property
    def seekable(self):
        return bool(self.values[0] & 1)

    @property
    def live(self):
        return bool(self.values[0] & 2)


@dataclass(frozen=True)
class PlayerState:
    """Position and duration in nanoseconds; 0 where they are not known."""

    status: PlayerStatus
    position: int
    duration: int


class Player(Service):
    """The daemon's player, which all clients share. All times are nanoseconds."""

    OBJECT = 62
    REGISTER, UNREGISTER = 13, 10
    REGISTER_NOTIFY, UNREGISTER_NOTIFY = 14, 11
    UNORDERED = (8,)

    def initialize(self):
        """Shows a black picture for two seconds."""
        self._accepted("initialize", 1)

    def open(self, name):
        """Opens a path or URI; the notification OPENED tells the outcome."""
        self._accepted("open", 2, name)

    def close(self):
        self._accepted("close", 3)

    def play(self):
        self._accepted("play", 4)

    def pause(self):
        self._accepted("pause", 5)

    def seek(self, position, mode=SeekMode.ACCURATE):
        """The notification SOUGHT tells when it is done."""
        self._accepted("seek", 6, int(mode), position, False)

    def status(self):
        """The PlayerState of the moment."""
        reader = self._request(7)
        status = _enum(PlayerStatus, reader.integer())
        reader.integer()
        return PlayerState(status, reader.integer(), reader.integer())

    def set_repeat(self, repeat, start=0, end=-1):
        """From end back to start while repeat is true; end -1 is the end of the file."""
        self._accepted("set repeat", 8, bool(repeat), start, end)

    def set_display(self, hertz):
        """The display's rate, 50 or 60; applies from the next open. There is no answer."""
        self._connection.request(self.OBJECT, 12, 0 if hertz == 50 else 1)

    def power_off(self):
        """Ends the daemon."""
        self._request(9)

    def _notification(self, reader):
        return PlayerNotification(
            _enum(PlayerEvent, reader.integer()), _enum(Result, reader.integer()), reader.text(),
            tuple(reader.integer() for _ in range(3)), tuple(reader.integer() for _ in range(2)),
            reader.integer())


# Discoverer -------------------------------------------------------------------------------------


@dataclass(frozen=True)
class VideoStream:
    media_type: str
    description: str
    width: int
    height: int
    depth: int
    frame_rate: tuple
    pixel_aspect: tuple
    interlaced: bool
    bit_rate: int
    highest_bit_rate: int
    still: bool


@dataclass(frozen=True)
class AudioStream:
    media_type: str
    description: str
    channels: int
    sample_rate: int
    depth: int
    bit_rate: int
    highest_bit_rate: int


@dataclass(frozen=True)
class Metadata:
    """What a file is. The duration in nanoseconds; tags as a dictionary."""

    media_type: str
    tags: dict
    seekable: bool
    live: bool
    duration: int
    video: tuple
    audio: tuple


def _video_stream(reader):
    media_type, description = reader.text(), reader.text()
    numbers = [reader.integer() for _ in range(7)]
    return VideoStream(media_type, description, *numbers[:3], tuple(numbers[3:5]),
                       tuple(numbers[5:]), reader.flag(), reader.integer(), reader.integer(),
                       reader.flag())


def _audio_stream(reader):
    return AudioStream(reader.text(), reader.text(), *(reader.integer() for _ in range(5)))


def _streams(reader, one):
    """A block, its size and the number of streams in it."""
    block = Reader(reader.raw())
    reader.integer()
    return tuple(one(block) for _ in range(reader.integer()))


def _tags(text):
    return dict(line.split("=", 1) for line in text.splitlines() if "=" in line)


class Discoverer(Service):
    """Tells what files are and draws pictures of them. One file is open at a time."""

    OBJECT = 51
    REGISTER, UNREGISTER = 8, 7

    def __init__(self, connection):
        super().__init__(connection)
        self._accepted("initialize", 1)

    def open(self, path):
        self._accepted("open", 2, path)

    def close(self):
        """Returns when the file is closed."""
        self._accepted("close", 3)
        self.extensions()  # the answer to close alone comes too early

    def metadata(self):
        """The Metadata of the open file."""
        reader = self._request(4)
        outcome, result = reader.integer(), _enum(Result, reader.integer())
        if outcome != 0:
            raise Refused("metadata", result)
        return Metadata(reader.text(), _tags(reader.text()), reader.flag(), reader.flag(),
                        reader.integer(), _streams(reader, _video_stream),
                        _streams(reader, _audio_stream))

    def image(self, path, width=0, height=0, position=0):
        """Writes the picture at position (nanoseconds) to path, which the daemon opens."""
        reader = self._request(5, width, height, position, path, "")
        outcome, result = reader.integer(), _enum(Result, reader.integer())
        if outcome != 0:
            raise Refused("image", result)

    def extensions(self):
        """The endings of what the daemon can open."""
        return [name for name in self._request(6).text().split(",") if name]


# Importer ---------------------------------------------------------------------------------------


class ImporterStatus(enum.IntEnum):
    NO_IMPORTER = -1
    IDLE = 0
    RUNNING = 1
    CANCELLING = 2


class ImporterEvent(enum.IntEnum):
    PROGRESS = 1
    FINISHED = 2
    STARTED = 3


@dataclass(frozen=True)
class ImporterState:
    """Bytes done and bytes in all of what is queued."""

    status: ImporterStatus
    done: int
    total: int


@dataclass(frozen=True)
class ImporterNotification:
    """text: the file's path; of a finished import its place, or the reason of a failure."""

    kind: ImporterEvent
    result: Result
    text: str
    video: str
    audio: str
    width: int
    height: int
    frame_rate: tuple
    sample_rate: int


class Importer(Service):
    """Takes files into the daemon's library."""

    OBJECT = 56
    REGISTER, UNREGISTER = 7, 5
    REGISTER_NOTIFY, UNREGISTER_NOTIFY = 8, 6

    def initialize(self):
        self._accepted("initialize", 1)

    def import_file(self, path, folder=""):
        """Imports path into the library's folder, or where it lies when there is none."""
        self._accepted("import", 2, path, folder)
        self.status()  # answered when the daemon has room for the next import

    def cancel(self):
        self._accepted("cancel", 3)

    def status(self):
        """The ImporterState of the moment."""
        reader = self._request(4)
        status = _enum(ImporterStatus, reader.integer())
        reader.integer()
        return ImporterState(status, reader.integer(), reader.integer())

    def _notification(self, reader):
        kind, result = _enum(ImporterEvent, reader.integer()), _enum(Result, reader.integer())
        texts = [reader.text() for _ in range(3)]
        width, height, *rate, sample_rate = (reader.integer() for _ in range(5))
        return ImporterNotification(kind, result, *texts, width, height, tuple(rate), sample_rate)


# Command line -----------------------------------------------------------------------------------


def _seconds(nanoseconds):
    return f"{nanoseconds / 1e9:.3f} s"


def _play(connection, options):
    events = queue.Queue()
    player = Player(connection, on_notification=events.put)
    player.open(os.path.abspath(options.file) if "://" not in options.file else options.file)
    for event in iter(events.get, None):
        if event.kind in (PlayerEvent.OPENED, PlayerEvent.FAILED) and event.result != 0:
            raise Error(event.text or f"failed: {event.result!r}")
        if event.kind is PlayerEvent.OPENED:
            print(f"playing {options.file}, {_seconds(event.time)}", flush=True)
            player.play()
        if event.kind is PlayerEvent.END:
            break
    player.close()


def _status(connection, _):
    state = Player(connection).status()
    print(f"{getattr(state.status, 'name', state.status)} at {_seconds(state.position)} "
          f"of {_seconds(state.duration)}")


def _info(connection, options):
    discoverer = Discoverer(connection)
    for path in options.files:
        discoverer.open(os.path.abspath(path))
        metadata = discoverer.metadata()
        discoverer.close()
        print(f"{path}: {metadata.media_type}, {_seconds(metadata.duration)}")
        for video in metadata.video:
            print(f"  video {video.description}, {video.width}x{video.height}")
        for audio in metadata.audio:
            print(f"  audio {audio.description}, {audio.sample_rate} Hz")
        for key, value in metadata.tags.items():
            print(f"  {key}={value}")


def _image(connection, options):
    discoverer = Discoverer(connection)
    discoverer.open(os.path.abspath(options.file))
    discoverer.image(os.path.abspath(options.output), position=int(options.at * 1e9))
    discoverer.close()


def _extensions(connection, _):
    print(" ".join(Discoverer(connection).extensions()))


def _import(connection, options):
    events = queue.Queue()
    importer = Importer(connection, on_notification=events.put)
    importer.import_file(os.path.abspath(options.file), options.folder)
    for event in iter(events.get, None):
        if event.kind is ImporterEvent.FINISHED and event.result != 0:
            raise Error(event.text or f"failed: {event.result!r}")
        if event.kind is ImporterEvent.FINISHED:
            print(event.text)
            return
    connection.raise_if_lost()


def _monitor(connection, _):
    events = queue.Queue()
    player = Player(connection, on_notification=events.put)
    print(player.status(), flush=True)
    for event in iter(events.get, None):
        print(event, flush=True)
    connection.raise_if_lost()


def _power_off(connection, _):
    Player(connection).power_off()


def _arguments():
    parser = argparse.ArgumentParser(description="A small client of the media service daemon.")
    parser.add_argument("--identity", type=int, choices=IDENTITIES, metavar="1000..1007")
    parser.add_argument("--timeout", type=float, default=5.0, help="seconds to wait for an answer")
    commands = parser.add_subparsers(required=True, metavar="COMMAND")

    def command(name, run, description):
        subparser = commands.add_parser(name, help=description, description=description)
        subparser.set_defaults(run=run)
        return subparser

    command("play", _play, "play a file or URI to its end").add_argument("file")
    command("status", _status, "tell the player's state")
    command("info", _info, "tell what files are").add_argument("files", nargs="+")
    image = command("image", _image, "write a picture of a file")
    image.add_argument("file")
    image.add_argument("output")
    image.add_argument("--at", type=float, default=0, metavar="SECONDS")
    command("extensions", _extensions, "tell which files can be opened")
    importing = command("import", _import, "take a file into the library")
    importing.add_argument("file")
    importing.add_argument("folder", nargs="?", default="")
    command("monitor", _monitor, "print notifications until interrupted")
    command("poweroff", _power_off, "end the daemon")
    return parser.parse_args()


_EXIT_STATUS = {DaemonNotRunning: 3, ConnectionLost: 4, TimedOut: 4}


def main():
    """0 done, 1 refused or failed, 2 wrong usage, 3 no daemon, 4 no answer, 130 interrupted."""
    options = _arguments()
    try:
        with Connection(options.identity, options.timeout) as connection:
            options.run(connection, options)
    except Error as error:
        print(f"qnsmedia: {error}", file=sys.stderr)
        return _EXIT_STATUS.get(type(error), 1)
    except KeyboardInterrupt:
        return 130
    return 0


if __name__ == "__main__":
    sys.exit(main())
