"""The Python binding: streams, dict forms, batch colour, errors, event log.
The library itself is tested in C++; these check what the binding adds."""

import json
import os
import pathlib
import threading

import numpy as np
import pytest

import kvdata

EXAMPLES = pathlib.Path(os.environ.get("KVDATA_SOURCE_DIR", pathlib.Path(__file__).parents[2])) / "examples"

# Object streams: the class. Record streams: the Streams member and the
# records it takes, by their argument names (the keys of the JSON document).
OBJECTS = {"user": kvdata.KVUser, "tolerance": kvdata.KVTolerance, "tolset": kvdata.KVTolSet,
           "tile": kvdata.KVTile, "tileset": kvdata.KVTileSet, "calibration": kvdata.KVCalibration,
           "profile": kvdata.KVProfile, "testrun": kvdata.KVTestRun}
RECORDS = {"scpair": ("Stream_SCPair", {"SCP": kvdata.tSCPair}),
           "tileset-calibration": ("Stream_TileSetCalibration",
                                   {"TS": kvdata.tTileSet, "TSC": kvdata.tTileSetCalibration}),
           "profile-record": ("Stream_Profile", {"pro": kvdata.tOVProfile}),
           "station": ("Stream_Station", {"Station": kvdata.tStation}),
           "testrun-record": ("Stream_TestRun", {"TR": kvdata.tTestRun1}),
           "user-block": ("Stream_User", {"User": kvdata.tUser}),
           "organization": ("Stream_Organization", {"Org": kvdata.tOrganization})}
KINDS = sorted(p.stem for p in (EXAMPLES / "streams").glob("*.kvs"))


def read_records(kind, data):
    member, names = RECORDS[kind]
    records = {name: cls() for name, cls in names.items()}
    stream = kvdata.ByteArray(data)
    ok, end = getattr(kvdata.Streams.instance(), member)(
        kvdata.StreamDirection.FromStream, stream, 0, *records.values())
    assert ok and 0 < end <= len(data)
    return records


def write_records(kind, records, size):
    out = kvdata.ByteArray(bytes(size))             # some writers only fill what is there
    ok, end = getattr(kvdata.Streams.instance(), RECORDS[kind][0])(
        kvdata.StreamDirection.ToStream, out, 0, *records.values())
    assert ok and 0 < end <= len(out)
    return bytes(out)


def test_every_example_kind_is_known():
    assert set(KINDS) == set(OBJECTS) | set(RECORDS)


@pytest.mark.parametrize("kind", KINDS)
def test_stream_round_trip_and_dict_form(kind):
    data = (EXAMPLES / "streams" / f"{kind}.kvs").read_bytes()
    document = json.loads((EXAMPLES / "json" / f"{kind}.json").read_text())
    if kind in OBJECTS:
        obj = OBJECTS[kind].from_bytes(memoryview(data))
        assert obj.to_bytes() == data
        # The faithful members agree with the Python way.
        ok, end = OBJECTS[kind].create().StreamIn(bytearray(data), 0)
        assert ok and 0 < end <= len(data)
        values = {key: getattr(obj, key) for key in document if key != "kind"}
    else:
        values = read_records(kind, data)
        assert write_records(kind, values, len(data)) == data
    for key, value in values.items():
        if hasattr(value, "to_dict"):
            # The record read from the stream is the document's, both ways.
            assert value.to_dict() == document[key]
            assert type(value).from_dict(document[key]) == value
        elif isinstance(value, list):
            assert [json.loads(json.dumps(m.ID)) for m in value] == [t["ID"] for t in document[key]]


def test_records_views_and_construction():
    ts = kvdata.tTileSet.from_dict(json.loads((EXAMPLES / "json" / "tileset.json").read_text())["v1TileSet"])
    tiles = ts.Tiles
    assert (tiles.lbound, tiles.ubound, len(tiles)) == (1, 13, 13)
    assert [t.Name for t in tiles][0] == tiles[1].Name == "White"
    tiles[2].TempComp[40] = 0.5                      # a view: changes the set itself
    assert ts.Tiles[2].TempComp[40] == 0.5 and len(ts.Tiles[2].TempComp) == 40
    with pytest.raises(IndexError):
        tiles[0]
    pair = kvdata.tSCPair()
    pair[kvdata.SC.SCI][40] = 87.5
    assert pair.Spectrum[1].Data[40] == 87.5 and pair[kvdata.SC.SCE][40] == 0.0
    user = kvdata.tUser(USERID="jsmith", UserNumber=1042, OrgID=7)
    assert eval(repr(user), {"tUser": kvdata.tUser}) == user
    assert eval(repr(ts), vars(kvdata)) == ts
    with pytest.raises(TypeError):
        kvdata.tUser(UserNumbr=1)
    empty = kvdata.tTileSet(Tiles=[])
    assert empty.Tiles.rank == 0 and len(empty.Tiles) == 0
    with pytest.raises(ValueError, match=r"tTileSet\.Tiles\(1\)"):
        kvdata.tTileSet.from_dict({"TSN": "x", "Tiles": [{"Name": "a", "ColorRGB": 1}]})


# Ways an element taken from a dynamic array can lose its place, and whether
# index 3 still holds an element afterwards.
@pytest.mark.parametrize("change, index_stays", [
    (lambda ts: ts.Tiles.redim_preserve(1, 2), False),
    (lambda ts: ts.Tiles.erase(), False),
    (lambda ts: setattr(ts, "Tiles", []), False),
    (lambda ts: ts.Tiles.redim(1, 500), True),      # new storage; index 3 is a fresh tile
    (lambda ts: None, True),
])
def test_elements_follow_their_index_after_the_array_changes(change, index_stays):
    outer = kvdata.tTileSet(Tiles=[kvdata.tTileDef(Name=f"T{i}") for i in range(1, 4)])
    ts = kvdata.tTileSet()
    ts.Tiles = outer.Tiles                           # a copy of the array, not a view of outer
    tile, temp = ts.Tiles[3], ts.Tiles[3].TempComp
    orphan = kvdata.tTileSet(Tiles=[kvdata.tTileDef(Name="kept")]).Tiles[1]
    change(ts)
    assert orphan.Name == "kept" and outer.Tiles[3].Name == "T3"
    if index_stays:
        temp[40] = 0.25
        assert tile.TempComp[40] == ts.Tiles[3].TempComp[40] == 0.25
        assert tile.Name == ts.Tiles[3].Name
    else:
        for use in (lambda: tile.Name, lambda: temp[1], lambda: setattr(tile, "Name", "x")):
            with pytest.raises(IndexError):
                use()


def test_interface_members_reach_the_object():
    data = (EXAMPLES / "streams" / "calibration.kvs").read_bytes()
    cal = kvdata.KVCalibration.from_bytes(data)
    tile = kvdata.query(cal, kvdata.IKVCalibration).Tiles(13)
    tile.SCWL(kvdata.SC.SCI, 40, 87.5)               # written back into the calibration
    assert cal.v1Calibration.Tiles[13][kvdata.SC.SCI][40] == 87.5 == cal.Tiles(13).SCWL(kvdata.SC.SCI, 40)
    cal.TSN = "CT-9"
    assert cal.v1Calibration.TSN.rstrip() == "CT-9" and cal.to_bytes() != data
    profile = kvdata.query(kvdata.KVProfile.from_bytes((EXAMPLES / "streams" / "profile.kvs").read_bytes()),
                           kvdata.IKVProfile)
    table = profile.WhiteCorrection                  # a copy: the call below changes the object
    profile.WhiteCorrection(kvdata.SC.SCI, 40, 1.25)
    assert profile.WhiteCorrection(kvdata.SC.SCI, 40) == profile.WhiteCorrection[kvdata.SC.SCI][40] == 1.25
    assert table[kvdata.SC.SCI][40] != 1.25
    again = kvdata.KVProfile.from_bytes(kvdata.query(profile, kvdata.IKVStream).to_bytes())
    assert again.WhiteCorrection(kvdata.SC.SCI, 40) == 1.25 and again.ISN == profile.ISN


def test_batch_matches_ilu_d6510_bit_for_bit():
    rng = np.random.default_rng(19)
    spectra = (rng.random((2000, 40), dtype=np.float32) * 120).astype(np.float32)
    spectra[5] = 0.0
    spectra[6] = 3.4e38                                 # overflows: NaN in all six results
    xyz, lab = kvdata.calc_xyz_lab_d6510(spectra)
    assert xyz.shape == lab.shape == (2000, 3) and xyz.dtype == lab.dtype == np.float32
    ilu = kvdata.ILU_D6510.create()
    for i in [i for i in range(300) if i != 6] + [1999]:
        x = np.array(ilu.calcXYZ(spectra[i].tolist()), dtype=np.float32)
        lab_i = np.array(ilu.calcLAB(x.tolist()), dtype=np.float32)
        assert x.view(np.uint32).tolist() == xyz[i].view(np.uint32).tolist()
        assert lab_i.view(np.uint32).tolist() == lab[i].view(np.uint32).tolist()
    assert np.isnan(xyz[6]).all() and np.isnan(lab[6]).all()
    # Other layouts and types are converted first, with the same results.
    again, _ = kvdata.calc_xyz_lab_d6510(np.asfortranarray(spectra.astype(np.float64)))
    assert np.array_equal(again, xyz, equal_nan=True)
    with pytest.raises(ValueError):
        kvdata.calc_xyz_lab_d6510(spectra[:, :39])
    # Given outputs are filled in place; outputs that cannot take the results are refused.
    out_xyz, out_lab = np.zeros((2000, 3), np.float32), np.zeros((2000, 3), np.float32)
    got = kvdata.calc_xyz_lab_d6510(spectra, xyz=out_xyz, lab=out_lab)
    assert got[0] is out_xyz and got[1] is out_lab
    assert np.array_equal(out_xyz, xyz, equal_nan=True) and np.array_equal(out_lab, lab, equal_nan=True)
    for bad in (np.zeros((1999, 3), np.float32), np.zeros((2000, 3)), np.zeros((3, 2000), np.float32).T):
        with pytest.raises(ValueError):
            kvdata.calc_xyz_lab_d6510(spectra, xyz=bad)
    with pytest.raises(kvdata.Error) as caught:
        kvdata.calc_xyz_lab_d6510(spectra, xyz=out_xyz, lab=out_xyz)
    assert caught.value.number == 5


def test_errors_map_to_exception_types():
    cases = [
        (lambda: kvdata.tTileSet().Tiles.lbound, 9, IndexError),
        (lambda: kvdata.ILU_D6510.create().calcXYZ([3.4e38] * 40), 6, OverflowError),
        (lambda: kvdata.KVTolSet.create().Add(None), 91, ValueError),
        (lambda: kvdata.KVProfile.create().WhiteCorrection(kvdata.SC.SCI, 41, 1.0), 9, IndexError),
    ]
    twice = kvdata.KVTolSet.create()
    twice.Add(kvdata.KVTolerance.create(), "a")
    cases.append((lambda: twice.Add(kvdata.KVTolerance.create(), "A"), 457, KeyError))
    for call, number, builtin in cases:
        with pytest.raises(kvdata.Error) as caught:
            call()
        assert caught.value.number == number and isinstance(caught.value, builtin)
        assert caught.value.source and caught.value.description
    with pytest.raises(kvdata.StreamError) as caught:
        kvdata.KVTestRun.from_bytes(b"\x05\x00\x00\x00\x10")
    assert caught.value.entries


def test_sink_called_from_several_threads():
    seen = []
    bad = b"\x05\x00\x00\x00\x10"                  # a test run's stream cut short: the codec logs
    failures = []

    def writer(i):
        for k in range(200):
            kvdata.EventLog.Write(f"writer {i} entry {k}")

    def reader():
        for _ in range(50):
            try:
                kvdata.KVTestRun.from_bytes(bad)
            except kvdata.StreamError as e:
                failures.append(e.entries)

    previous = kvdata.EventLog.SetSink(seen.append)
    try:
        threads = [threading.Thread(target=writer, args=(i,)) for i in range(4)]
        threads += [threading.Thread(target=reader) for _ in range(4)]
        for t in threads:
            t.start()
        for t in threads:
            t.join()
    finally:
        kvdata.EventLog.SetSink(previous)
    written = [e for e in seen if e.startswith("writer ")]
    assert sorted(written) == sorted(f"writer {i} entry {k}" for i in range(4) for k in range(200))
    assert len(failures) == 200
    # Each failed read carries its own entries, none of another thread's.
    assert all(entries and not any(e.startswith("writer ") for e in entries) for entries in failures)
    assert sum(len(f) for f in failures) == len(seen) - len(written)
