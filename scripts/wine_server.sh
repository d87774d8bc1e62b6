#!/usr/bin/env bash
# usage: wine_server.sh start|stop
# start: one Wine server for many runs, with Wine's own services already up. Left to
# itself the server exits as soon as its last program does, and a program starting at
# that moment finds it gone ("recvmsg: Connection reset by peer"). The services are
# started here, on no terminal, because they keep the output streams of whichever program
# starts them: started by a test, they would keep its output open, and CTest would wait
# for that test for ever.
# stop: ends the server and everything Wine runs.
set -euo pipefail
export WINEDEBUG=-all WINEDLLOVERRIDES="mscoree,mshtml="
case "${1:-}" in
  start)
    wineserver -p
    wineboot </dev/null >/dev/null 2>&1
    ;;
  stop)
    wineserver -k || true
    ;;
  *)
    echo "usage: $0 start|stop" >&2
    exit 2
    ;;
esac
