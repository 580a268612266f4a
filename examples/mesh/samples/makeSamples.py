#!/usr/bin/env python3
"""Writes the sample files beside this script: one icosahedron in every format.

Run it as `python3 examples/mesh/samples/makeSamples.py`; its results are part of the repository,
and the test that compares them runs it again. An argument names another folder to write to.

All files hold the same float coordinates. Vertices are numbered in the order in which the faces
first use them, so that formats without shared vertices give the same mesh.
"""

import pathlib
import struct
import sys

GOLDEN = (1 + 5 ** 0.5) / 2
EDGES = 1 / (1 + GOLDEN ** 2) ** 0.5

CORNERS = [(-1, GOLDEN, 0), (1, GOLDEN, 0), (-1, -GOLDEN, 0), (1, -GOLDEN, 0),
           (0, -1, GOLDEN), (0, 1, GOLDEN), (0, -1, -GOLDEN), (0, 1, -GOLDEN),
           (GOLDEN, 0, -1), (GOLDEN, 0, 1), (-GOLDEN, 0, -1), (-GOLDEN, 0, 1)]

TRIANGLES = [(0, 11, 5), (0, 5, 1), (0, 1, 7), (0, 7, 10), (0, 10, 11),
             (1, 5, 9), (5, 11, 4), (11, 10, 2), (10, 7, 6), (7, 1, 8),
             (3, 9, 4), (3, 4, 2), (3, 2, 6), (3, 6, 8), (3, 8, 9),
             (4, 9, 5), (2, 4, 11), (6, 2, 10), (8, 6, 7), (9, 8, 1)]


def toFloat(number):
    return struct.unpack("<f", struct.pack("<f", number))[0]


def text(number):
    """The shortest text that a reader rounds to this float."""
    for digits in range(1, 10):
        result = f"{number:.{digits}g}"
        if toFloat(float(result)) == number:
            return result
    raise ValueError(number)


def solid():
    """The vertices, and the faces as triples of their numbers, in the order of first use."""
    numbers = {}
    faces = [tuple(numbers.setdefault(corner, len(numbers)) for corner in triangle)
             for triangle in TRIANGLES]
    vertices = [tuple(toFloat(value * EDGES) for value in CORNERS[corner]) for corner in numbers]
    return vertices, faces


def normal(a, b, c):
    u = [q - p for p, q in zip(a, b)]
    v = [q - p for p, q in zip(a, c)]
    n = (u[1] * v[2] - u[2] * v[1], u[2] * v[0] - u[0] * v[2], u[0] * v[1] - u[1] * v[0])
    length = sum(x * x for x in n) ** 0.5
    return tuple(toFloat(x / length) for x in n)


def lines(*parts, end="\n"):
    return "".join(part + end for part in parts).encode("ascii")


def row(values):
    return " ".join(text(value) for value in values)


def obj(vertices, faces):
    return lines("# An icosahedron", "o icosahedron",
                 *(f"v {row(v)}" for v in vertices),
                 *("f " + " ".join(str(index + 1) for index in face) for face in faces))


def objCorners(vertices, faces):
    """With texture coordinates, normals, indices that count back, Windows line ends, and a line
    that goes on in the next."""
    normals = [normal(*(vertices[index] for index in face)) for face in faces]
    parts = ["# An icosahedron", "mtllib none.mtl"]
    parts += [f"v {row(v)}" for v in vertices]
    parts += ["vt 0 0", "vt 1 0", "vt 0.5 1"]
    for face, direction in zip(faces, normals):
        corners = [f"{index - len(vertices)}/{corner + 1}/-1" for corner, index in enumerate(face)]
        parts += [f"vn {row(direction)}", "f " + " ".join(corners[:2]) + " \\", "  " + corners[2]]
    return lines(*parts, end="\r\n")


def stlText(vertices, faces):
    parts = ["solid icosahedron"]
    for face in faces:
        corners = [vertices[index] for index in face]
        parts += [f"  facet normal {row(normal(*corners))}", "    outer loop"]
        parts += [f"      vertex {row(corner)}" for corner in corners]
        parts += ["    endloop", "  endfacet"]
    return lines(*parts, "endsolid icosahedron")


def stlBinary(vertices, faces, title):
    data = title.encode("ascii").ljust(80, b"\0") + struct.pack("<I", len(faces))
    for face in faces:
        corners = [vertices[index] for index in face]
        for point in (normal(*corners), *corners):
            data += struct.pack("<3f", *point)
        data += struct.pack("<H", 0)
    return data


def plyHeader(encoding, vertices, faces):
    return lines("ply", f"format {encoding} 1.0", "comment An icosahedron",
                 f"element vertex {len(vertices)}",
                 "property float x", "property float y", "property float z",
                 f"element face {len(faces)}", "property list uchar int vertex_indices",
                 "end_header")


def plyText(vertices, faces):
    return plyHeader("ascii", vertices, faces) + lines(
        *(row(v) for v in vertices),
        *("3 " + " ".join(str(index) for index in face) for face in faces))


def plyBinary(vertices, faces, encoding, order):
    data = plyHeader(encoding, vertices, faces)
    for vertex in vertices:
        data += struct.pack(order + "3f", *vertex)
    for face in faces:
        data += struct.pack(order + "B3i", 3, *face)
    return data


def off(vertices, faces):
    return lines("OFF", "# An icosahedron", f"{len(vertices)} {len(faces)} 30",
                 *(row(v) for v in vertices),
                 *("3 " + " ".join(str(index) for index in face) for face in faces))


def main():
    folder = pathlib.Path(sys.argv[1]) if len(sys.argv) > 1 else pathlib.Path(__file__).parent
    mesh = solid()
    files = {
        "icosahedron.obj": obj(*mesh),
        "icosahedronCorners.obj": objCorners(*mesh),
        "icosahedron.off": off(*mesh),
        "icosahedronAscii.ply": plyText(*mesh),
        "icosahedronLittle.ply": plyBinary(*mesh, "binary_little_endian", "<"),
        "icosahedronBig.ply": plyBinary(*mesh, "binary_big_endian", ">"),
        "icosahedronAscii.stl": stlText(*mesh),
        "icosahedronBinary.stl": stlBinary(*mesh, "An icosahedron"),
        "icosahedronSolid.stl": stlBinary(*mesh, "solid icosahedron"),
    }
    for name, data in files.items():
        (folder / name).write_bytes(data)


if __name__ == "__main__":
    main()
