#!/usr/bin/env python3
"""A measuring station's day in miniature: build a tile set and its
calibration, stream them, save and load the stream, and compute the colour of
the certified spectra.

    PYTHONPATH=build/dev/python /usr/bin/python3 examples/python/station.py [FOLDER]
"""

import math
import pathlib
import sys
import tempfile

import numpy as np

import kvdata

NAMES = ["White", "Pale Grey", "Mid Grey", "Diff Grey", "Black", "Deep Pink", "Red",
         "Orange", "Bright Yellow", "Green", "Diff Green", "Cyan", "Deep Blue"]


def reflectance(i, band):
    """A smooth made-up spectrum per tile, percent reflectance."""
    return 5.0 + 80.0 * (0.5 + 0.5 * math.sin(0.15 * band + i)) * (1.0 - i / 16.0)


def main(folder):
    tiles = kvdata.tTileSet(TSN="CT-4471", Tiles=[
        kvdata.tTileDef(Name=name, ColorRGB=0x808080 + i, TempComp=[0.001 * b for b in range(40)])
        for i, name in enumerate(NAMES)])
    calibration = kvdata.tTileSetCalibration(
        TSN=tiles.TSN, Certified=kvdata.Date(45366.4375), TempCalibrated=23.0,
        Tiles=[{"SCE": [reflectance(i, b) for b in range(40)],
                "SCI": [reflectance(i, b) + 0.5 for b in range(40)]} for i in range(13)])

    # The tile set as an object, with the interfaces' names.
    ts = kvdata.KVTileSet.create()
    ts.v1TileSet = tiles
    print(f"tile set {ts.TSN}: {ts.count} tiles, tile 5 is {ts.Tiles(5).ColorName}")

    # Both as object streams in one file, saved and loaded again.
    cal = kvdata.KVCalibration.create()
    cal.v1Calibration = calibration
    tile_bytes, cal_bytes = ts.to_bytes(), cal.to_bytes()
    path = pathlib.Path(folder) / "station.kvs"
    assert kvdata.Streams.instance().StreamSave(path, tile_bytes + cal_bytes)
    loaded = kvdata.ByteArray()
    assert kvdata.Streams.instance().StreamLoad(path, loaded)
    ts_back = kvdata.KVTileSet.from_bytes(bytes(loaded)[:len(tile_bytes)])
    cal_back = kvdata.KVCalibration.from_bytes(bytes(loaded)[len(tile_bytes):])
    assert ts_back.v1TileSet == tiles and cal_back.v1Calibration == cal.v1Calibration
    print(f"saved and loaded {len(loaded)} bytes: {path}")

    # Colour of every certified SCI spectrum at once.
    sci = np.array([list(pair[kvdata.SC.SCI]) for pair in cal_back.v1Calibration.Tiles],
                   dtype=np.float32)
    _, lab = kvdata.calc_xyz_lab_d6510(sci)
    for tile, (l, a, b) in zip(ts_back.v1TileSet.Tiles, lab):
        print(f"  {tile.Name:<14} L* {l:6.2f}  a* {a:7.2f}  b* {b:7.2f}")

    # A damaged stream is refused with what the library logged.
    try:
        kvdata.KVTestRun.from_bytes(bytes(loaded)[:5])
    except kvdata.StreamError as e:
        print(f"damaged stream refused: {len(e.entries)} log entries, first: {e.entries[0]}")


if __name__ == "__main__":
    if len(sys.argv) > 1:
        main(sys.argv[1])
    else:
        with tempfile.TemporaryDirectory() as folder:
            main(folder)
