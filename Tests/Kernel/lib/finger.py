"""A finger by hand: the reports of a tap or a hold in a region's middle, whenever a test wants them.

Signals are those of a firm fingertip of Docs/Synth.md; the sensor's clock goes on from touch to touch.
"""

import struct

# Electrodes A to O.
FINGERTIPS = {
    "play/pause": (230, 350, 310, 300, 350, 240, 40, 10, 5, 5, 90, 10, 5, 10, 40),
    "volume-down": (5, 0, 0, 15, 0, 5, 0, 0, 0, 0, 20, 215, 395, 300, 400),
    "volume-up": (0, 0, 5, 5, 0, 10, 405, 350, 465, 75, 5, 0, 5, 5, 0),
}
RISE = (0.0, 0.35, 0.8)
FALL = (0.7, 0.25, 0.0, 0.0, 0.0)
PERIOD_MS = 10
IMAGE = struct.Struct("<BII4x15H15h")


class Finger:
    """Lines for zorvatouch-uhid-surface: each method's are to be said after those of the calls before."""

    def __init__(self, pace_ms=PERIOD_MS):
        """pace_ms: between reports; 0 sends them as fast as the kernel takes them."""
        self._pace_ms = pace_ms
        self._frame = 0

    def tap(self, region, touched_ms=120):
        return self.down(region, touched_ms) + self.up(region)

    def hold(self, region, touched_ms=900):
        return self.down(region, touched_ms) + self.up(region)

    def down(self, region, touched_ms=620):
        """The finger comes and stays; after 500 ms that is a hold, until `up`."""
        pressures = RISE + (1.0,) * (touched_ms // PERIOD_MS)
        return [line for pressure in pressures for line in self._lines(region, pressure)]

    def up(self, region):
        return [line for pressure in FALL for line in self._lines(region, pressure)]

    def rest(self, images=10):
        """Nothing touches the sensor."""
        return [line for _ in range(images) for line in self._lines("volume-up", 0.0)]

    def report(self, region, pressure):
        self._frame += 1
        signals = [round(signal * pressure) for signal in FINGERTIPS[region]]
        raw = [20000 + signal for signal in signals]
        return IMAGE.pack(1, self._frame, self._frame * PERIOD_MS, *raw, *signals)

    def _lines(self, region, pressure):
        line = self.report(region, pressure).hex(" ")
        return [line, f"wait {self._pace_ms}"] if self._pace_ms else [line]
