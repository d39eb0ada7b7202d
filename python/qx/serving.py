"""The server of `view`, which serves the pages of the given recordings on the loopback address.

It uses aiohttp, from Debian, rather than the standard library's http.server, whose documentation advises against
it except for tests. aiohttp serves several windows at once, ends with its process, and limits the size of requests.
Long computations are done in threads, in which the library runs in parallel.

A request is only served if it has the token in its path and the server's own name in its Host header, so that
neither another user of the machine nor another site's page in the browser can access a recording.
"""

import asyncio
import hmac
import html
import math
import secrets

from aiohttp import web

from . import pages, viewing
from .files import InputError
from .outcomes import QxError

HEADERS = {"Cache-Control": "no-store", "Referrer-Policy": "no-referrer", "X-Content-Type-Options": "nosniff",
           "X-Frame-Options": "DENY", "Cross-Origin-Resource-Policy": "same-origin"}
MOST_POINTS = 20_000


class Refused(ValueError):
    """A request that cannot be served, with a message for the reader."""


def application(opened, token, ports):
    """The application; `ports` contains the port when the server listens."""
    @web.middleware
    async def guard(request, handler):
        hosts = {f"{name}:{port}" for name in ("127.0.0.1", "localhost") for port in ports}
        given = request.match_info.get("token", "")
        if request.headers.get("Host", "") not in hosts or not hmac.compare_digest(given.encode(), token.encode()):
            return web.Response(status=403, text="not allowed\n", headers=HEADERS)
        try:
            response = await handler(request)
        except (Refused, InputError, QxError, ValueError) as error:
            return web.json_response({"error": str(error)}, status=400, headers=HEADERS)
        response.headers.update(HEADERS)
        return response

    def of(request):
        index = _whole(request.match_info["file"])
        if not 0 <= index < len(opened):
            raise Refused("no such recording")
        return opened[index]

    async def start(request):
        if len(opened) == 1:
            return await page(request, opened[0])
        links = "".join(f'<li><a href="{i}/">{html.escape(one.name)}</a></li>' for i, one in enumerate(opened))
        return web.Response(text=pages.page("view", "Recordings", f"<ul>{links}</ul>"), content_type="text/html")

    async def page(request, one=None):
        one = one or of(request)
        trouble = ""
        try:
            await asyncio.to_thread(one.read)
        except (InputError, QxError) as error:
            trouble = f"{error}; the page shows what was read before."
        return web.Response(text=page_of(one, opened.index(one), trouble), content_type="text/html")

    async def data(request):
        one, query = of(request), request.query
        if query.get("version") != str(one.version):
            raise Refused("the file has been read again: reload this page")
        channel = _whole(query.get("channel", "0"), len(one.channels))
        return web.json_response(await asyncio.to_thread(
            one.data, channel, _number(query["from"]), _number(query["to"]),
            min(MOST_POINTS, _whole(query["points"]))))

    async def sections(request):
        one, query = of(request), request.query
        choices = choices_of(query, len(one.channels))

        def made():
            text, plots = pages.parts(one.sections(choices))
            return {"html": text, "plots": plots}

        return web.json_response(await asyncio.to_thread(made))

    async def state(request):
        one = of(request)
        return web.json_response({"state": one.state(), "version": one.version})

    app = web.Application(middlewares=[guard], client_max_size=1 << 10)
    app.add_routes([web.get("/{token}/", start), web.get("/{token}/{file}/", page),
                    web.get("/{token}/{file}/data", data), web.get("/{token}/{file}/sections", sections),
                    web.get("/{token}/{file}/state", state)])
    return app


def _whole(text, below=None):
    value = int(text) if text.isascii() and text.isdigit() and len(text) < 10 else -1
    if value < 0 or below is not None and value >= below:
        raise Refused(f"{text[:20]!r} is not a valid number")
    return value


def _number(text):
    value = float(text)
    if not math.isfinite(value) or abs(value) > 1e15:
        raise Refused(f"{text[:20]!r} is not a time")
    return value


def choices_of(query, channels):
    """The Choices of a request."""
    kind, window = query.get("kind", "none"), query.get("window", "hann")
    if kind not in viewing.KINDS or window not in viewing.WINDOWS:
        raise Refused("no such filter or window")
    edges = tuple(_number(query[name]) for name in ("low", "high") if query.get(name))
    needed = {"none": len(edges), "lowpass": 1, "highpass": 1}.get(kind, 2)
    if len(edges) != needed:
        raise Refused(f"a {kind} needs {needed} edge{'s' * (needed > 1)}")
    order = _whole(query.get("order", "4"))
    if not 1 <= order <= 20:
        raise Refused("the order must be from 1 to 20")
    end = query.get("to")
    return viewing.Choices(_whole(query.get("channel", "0"), channels), _number(query.get("from") or "0"),
                           _number(end) if end else math.inf, window, kind, edges, order)


def page_of(one, index, trouble=""):
    """The page of a recording: its channels, and a form for the analysis."""
    def options(name, values):
        return (f'<select name="{name}">' + "".join(
            f'<option value="{html.escape(value)}">{html.escape(text)}</option>' for value, text in values) + "</select>")

    unit = one.recording.time_unit
    frequency = "Hz" if one.recording.rate else "per sample"
    form = (f'<form class="choices" data-file="{index}" data-version="{one.version}">'
            f"<label>channel {options('channel', [(str(i), c[0]) for i, c in enumerate(one.channels)])}</label>"
            f'<label>from <input name="from" size="9" inputmode="decimal"> {unit}</label>'
            f'<label>to <input name="to" size="9" inputmode="decimal"> {unit}</label>'
            f'<button type="button" id="shown">use visible part</button>'
            f"<label>window {options('window', [(w, w.replace('_', '-')) for w in viewing.WINDOWS])}</label>"
            f"<label>filter {options('kind', [(k, k) for k in viewing.KINDS])}</label>"
            f'<label>edge <input name="low" size="7" inputmode="decimal"> {frequency}</label>'
            f'<label>second edge <input name="high" size="7" inputmode="decimal"> {frequency}</label>'
            '<label>order <input name="order" size="3" value="4" inputmode="numeric"></label></form>')
    plots = list(one.plots())
    drawn = "".join(f'<figure class="plot" data-plot="{i}"></figure>' for i in range(len(plots)))
    inner = (f'<p class="quiet">{html.escape(one.recording.choice)}.</p><p id="state" role="status">'
             f"{html.escape(trouble)}</p>"
             f'<div id="channels">{drawn}</div>{form}<div id="sections" aria-live="polite"></div>'
             f'<script type="application/json" id="channel-plots">{pages.data(plots)}</script>')
    if not pages.dygraphs():
        inner = "<p>The page needs Debian's package libjs-dygraphs.</p>"
    return pages.page("view", one.name, inner, moving=True, scripts=pages.own_script("view.js"))


async def serve(opened, port, ready):
    """Serves pages until it is interrupted; `ready` is called with the address."""
    token, ports = secrets.token_urlsafe(18), set()
    runner = web.AppRunner(application(opened, token, ports), access_log=None)
    await runner.setup()
    site = web.TCPSite(runner, "127.0.0.1", port)
    await site.start()
    chosen = runner.addresses[0][1]
    ports.add(chosen)
    ready(f"http://127.0.0.1:{chosen}/{token}/")
    try:
        await asyncio.Event().wait()
    finally:
        await runner.cleanup()
