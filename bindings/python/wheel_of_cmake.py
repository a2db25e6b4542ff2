"""Builds the Python package for pip: CMake builds, this file zips. Needs nothing that pip would have to fetch.

VELMORA_CMAKE_ARGS holds arguments more for CMake. VELMORA_BUILD_FOLDER names a build of this project that is finished,
whose module is taken in place of a new one.
"""
import base64
import gzip
import hashlib
import io
import os
import pathlib
import re
import shlex
import subprocess
import sys
import sysconfig
import tarfile
import tempfile
import time
import zipfile

ROOT = pathlib.Path(__file__).resolve().parents[2]
_FOUND = re.search(r"project\(velmora VERSION ([0-9.]+)", (ROOT / "CMakeLists.txt").read_text())
if _FOUND is None:
    raise RuntimeError("CMakeLists.txt tells no version")
VERSION = _FOUND.group(1)
INFO = f"velmora-{VERSION}.dist-info"
METADATA = (f"Metadata-Version: 2.1\nName: velmora\nVersion: {VERSION}\n"
            "Summary: Vehicle diagnostics over an ELM327-family OBD-II adapter\nLicense: MIT\nRequires-Python: >=3.11\n")


def _tag() -> str:
    abi = f"cp{sys.version_info.major}{sys.version_info.minor}"
    return f"{abi}-{abi}-{re.sub('[-.]', '_', sysconfig.get_platform())}"


def _when() -> int:
    """The time of what is in the archives, so that the same sources give the same bytes where SOURCE_DATE_EPOCH is set."""
    return max(int(os.environ.get("SOURCE_DATE_EPOCH", time.time())), 315532800)


def _zip(path: pathlib.Path, files: dict[str, bytes]) -> None:
    files[f"{INFO}/METADATA"] = METADATA.encode()
    files[f"{INFO}/WHEEL"] = f"Wheel-Version: 1.0\nGenerator: velmora\nRoot-Is-Purelib: false\nTag: {_tag()}\n".encode()
    record = ""
    for name, content in sorted(files.items()):
        digest = base64.urlsafe_b64encode(hashlib.sha256(content).digest()).rstrip(b"=").decode()
        record += f"{name},sha256={digest},{len(content)}\n"
    with zipfile.ZipFile(path, "w", zipfile.ZIP_DEFLATED) as archive:
        for name, content in [*sorted(files.items()), (f"{INFO}/RECORD", f"{record}{INFO}/RECORD,,\n".encode())]:
            entry = zipfile.ZipInfo(name, time.gmtime(_when())[:6])
            entry.external_attr = 0o100644 << 16
            entry.compress_type = zipfile.ZIP_DEFLATED
            archive.writestr(entry, content)


def _build(folder: str) -> None:
    # Files of a target are compiled together: the same code in half of the time.
    subprocess.check_call([
        "cmake", "-S", str(ROOT), "-B", folder, "-G", "Ninja", "-DCMAKE_BUILD_TYPE=Release", "-DBUILD_SHARED_LIBS=OFF",
        "-DVELMORA_PROGRAM=OFF", "-DVELMORA_WERROR=OFF", "-DVELMORA_PYTHON=ON", "-DVELMORA_PYTHON_FOLDER=.",
        "-DCMAKE_UNITY_BUILD=ON", "-DCMAKE_UNITY_BUILD_BATCH_SIZE=16",
        f"-DPython3_EXECUTABLE={sys.executable}", *shlex.split(os.environ.get("VELMORA_CMAKE_ARGS", ""))])
    subprocess.check_call(["cmake", "--build", folder, "--target", "velmoraPython"])


def _licences() -> dict[str, bytes]:
    return {f"{INFO}/{name}": (ROOT / name).read_bytes() for name in ("LICENSE", "THIRD-PARTY-NOTICES")
            if (ROOT / name).exists()}


def prepare_metadata_for_build_wheel(metadata_directory: str, config_settings: object = None) -> str:
    folder = pathlib.Path(metadata_directory, INFO)
    folder.mkdir()
    (folder / "METADATA").write_text(METADATA)
    return folder.name


def build_wheel(wheel_directory: str, config_settings: object = None, metadata_directory: str | None = None) -> str:
    with tempfile.TemporaryDirectory() as work:
        folder = os.environ.get("VELMORA_BUILD_FOLDER")
        if not folder:
            folder = f"{work}/build"
            _build(folder)
        stage = pathlib.Path(work, "stage")
        subprocess.check_call(["cmake", "--install", folder, "--component", "Python", "--prefix", str(stage), "--strip"])
        package = next(stage.rglob("velmora/__init__.py")).parent
        files = {f"velmora/{file.name}": file.read_bytes() for file in package.iterdir()}
    name = f"velmora-{VERSION}-{_tag()}.whl"
    _zip(pathlib.Path(wheel_directory, name), files | _licences())
    return name


def build_sdist(sdist_directory: str, config_settings: object = None) -> str:
    def plain(entry: tarfile.TarInfo) -> tarfile.TarInfo:
        entry.mtime, entry.uid, entry.gid, entry.uname, entry.gname = _when(), 0, 0, "", ""
        entry.mode = 0o755 if entry.mode & 0o100 else 0o644
        return entry

    base = f"velmora-{VERSION}"
    listed = subprocess.check_output(["git", "ls-files", "-z"], cwd=ROOT, text=True).split("\0")[:-1]
    unpacked = io.BytesIO()
    with (tarfile.open(fileobj=unpacked, mode="w", format=tarfile.PAX_FORMAT) as archive,
          tempfile.NamedTemporaryFile("w") as told):
        for name in sorted(listed):
            archive.add(ROOT / name, f"{base}/{name}", filter=plain)
        told.write(METADATA)
        told.flush()
        archive.add(told.name, f"{base}/PKG-INFO", filter=plain)
    pathlib.Path(sdist_directory, f"{base}.tar.gz").write_bytes(gzip.compress(unpacked.getvalue(), mtime=_when()))
    return f"{base}.tar.gz"
