#!/usr/bin/env python3
"""A server for the locks of Git LFS, on the loopback, for as long as its process lives. It speaks the published
protocol. The first part of an address is the user: http://127.0.0.1:PORT/ada. Prints its port, then each request."""

import json
import threading
from http.server import BaseHTTPRequestHandler, ThreadingHTTPServer

locks = {}
guard = threading.Lock()
numbers = iter(range(1, 1000000))


class Handler(BaseHTTPRequestHandler):
    def log_message(self, *_):
        pass

    def answer(self, code, content):
        body = json.dumps(content).encode()
        self.send_response(code)
        self.send_header("Content-Type", "application/vnd.git-lfs+json")
        self.send_header("Content-Length", str(len(body)))
        self.end_headers()
        self.wfile.write(body)

    def parts(self):
        print(self.command, self.path, flush=True)
        _, user, *rest = self.path.partition("?")[0].split("/")
        return user, rest

    def do_GET(self):
        user, rest = self.parts()
        with guard:
            self.answer(200 if rest == ["locks"] else 404, {"locks": list(locks.values())})

    def do_POST(self):
        user, rest = self.parts()
        body = json.loads(self.rfile.read(int(self.headers["Content-Length"])) or b"{}")
        with guard:
            if rest == ["locks", "verify"]:
                ours = [lock for lock in locks.values() if lock["owner"]["name"] == user]
                theirs = [lock for lock in locks.values() if lock["owner"]["name"] != user]
                self.answer(200, {"ours": ours, "theirs": theirs})
            elif rest == ["locks"]:
                taken = [lock for lock in locks.values() if lock["path"] == body["path"]]
                if taken:
                    self.answer(409, {"lock": taken[0], "message": "already created lock"})
                    return
                number = str(next(numbers))
                locks[number] = {"id": number, "path": body["path"], "locked_at": "2031-05-17T15:49:06+00:00",
                                 "owner": {"name": user}}
                self.answer(201, {"lock": locks[number]})
            elif len(rest) == 3 and rest[0] == "locks" and rest[2] == "unlock" and rest[1] in locks:
                if locks[rest[1]]["owner"]["name"] != user and not body.get("force"):
                    self.answer(403, {"message": "not your lock"})
                    return
                self.answer(200, {"lock": locks.pop(rest[1])})
            else:
                self.answer(404, {"message": "not found"})


server = ThreadingHTTPServer(("127.0.0.1", 0), Handler)
print(server.server_port, flush=True)
server.serve_forever()
