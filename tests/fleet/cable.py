"""Passes connections on, and can cut them. It stands for the line between a site and its centre."""

import contextlib
import selectors
import socket
import threading


class Cable:
    """`ends`: pairs of addresses, each (host, port): where to listen and where to connect to. Works on a thread of its
    own until the block ends."""

    def __init__(self, ends):
        self._ends = ends
        self._selector = selectors.DefaultSelector()
        self._pairs = {}
        self._is_cut = self._is_done = False
        self._wake, self._woken = socket.socketpair()
        self._changed = threading.Condition()
        self._is_obeyed = True
        self._thread = threading.Thread(target=self._work, daemon=True)

    def __enter__(self):
        self._selector.register(self._woken, selectors.EVENT_READ, None)
        for listen, connect in self._ends:
            listener = socket.create_server(listen)
            self._selector.register(listener, selectors.EVENT_READ, connect)
        self._thread.start()
        return self

    def __exit__(self, *_):
        self._is_done = True
        self._wake.send(b"x")
        self._thread.join()

    def cut(self):
        """Returns when nothing passes any more."""
        self._set(True)

    def mend(self):
        self._set(False)

    def _set(self, is_cut):
        with self._changed:
            self._is_cut, self._is_obeyed = is_cut, False
            self._wake.send(b"x")
            self._changed.wait_for(lambda: self._is_obeyed)

    def _work(self):
        while not self._is_done:
            for key, _ in self._selector.select():
                if key.fileobj is self._woken:
                    self._obey()
                elif key.data is not None:
                    self._accept(key.fileobj, key.data)
                elif key.fileobj in self._pairs:
                    self._pass_on(key.fileobj)
        for key in list(self._selector.get_map().values()):
            key.fileobj.close()

    def _obey(self):
        self._woken.recv(100)
        with self._changed:
            if self._is_cut:
                for each in list(self._pairs):
                    self._close(each)
            self._is_obeyed = True
            self._changed.notify()

    def _accept(self, listener, connect):
        taken, _ = listener.accept()
        if self._is_cut:
            taken.close()
            return
        try:
            other = socket.create_connection(connect, 5)
        except OSError:
            taken.close()
            return
        for one, another in ((taken, other), (other, taken)):
            one.settimeout(20)
            self._pairs[one] = another
            self._selector.register(one, selectors.EVENT_READ, None)

    def _pass_on(self, one):
        try:
            some = one.recv(1 << 16)
            if some:
                self._pairs[one].sendall(some)
                return
        except OSError:
            pass
        self._close(one)

    def _close(self, one):
        for each in (one, self._pairs.get(one)):
            if each is not None and self._pairs.pop(each, None) is not None:
                with contextlib.suppress(OSError):
                    self._selector.unregister(each)
                each.close()
