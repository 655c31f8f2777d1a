"""What the emulated machine boots: a kernel of Debian's, and archives that make up its root folder.

Nothing is installed on this machine: packages are fetched, and unpacked below build/linux.
"""

import glob
import os
import shutil
import subprocess
import tempfile

from support.program import SOURCE, check, run

PACKAGES = os.path.join(SOURCE, "scripts/packages")
FOLDER = os.path.join(SOURCE, "build/linux")
FETCHED = os.path.join(FOLDER, "fetched")
BASE = os.path.join(FOLDER, "base.cpio")
BUSYBOX = os.path.join(FETCHED, "bin/busybox")
PROGRAMS = "iscsid", "iscsiadm", "tgtd", "tgtadm"
# With all that they depend on: the initiator, its disks, a target of the kernel's own, and devices to bind to.
MODULES = "iscsi_tcp", "sd_mod", "iscsi_target_mod", "target_core_file", "crc32c_intel", "dummy"
FILES = {"etc/passwd": "root:x:0:0:root:/root:/bin/sh\n", "etc/group": "root:x:0:\n",
         "etc/iscsi/initiatorname.iscsi": "InitiatorName=iqn.2026-11.org.example:machine\n"}


def done(*words, **options):
    ended = subprocess.run(words, check=False, capture_output=True, text=True, **options)
    check(ended.returncode == 0, *words, ended.stdout, ended.stderr)
    return ended.stdout


def fetch():
    """The kernel and the packages of the group `machine`, unpacked."""
    with open(PACKAGES, encoding="utf-8") as file:
        names = [line.split()[1] for line in file if line.startswith("machine ")]
    # The kernel's package is an empty one that names the newest.
    meta = next(name for name in names if name.startswith("linux-image-"))
    lines = done("apt-cache", "depends", meta).splitlines()
    names[names.index(meta)] = next(line.split()[-1] for line in lines if "Depends: linux-image-" in line)
    unpacked = FETCHED + ".new"
    shutil.rmtree(unpacked, ignore_errors=True)
    os.makedirs(unpacked)
    with tempfile.TemporaryDirectory(prefix="hcli-packages-") as folder:
        done("apt-get", "download", *names, cwd=folder)
        for package in glob.glob(os.path.join(folder, "*.deb")):
            done("dpkg-deb", "-x", package, unpacked)
    shutil.rmtree(FETCHED, ignore_errors=True)
    os.rename(unpacked, FETCHED)
    os.utime(FETCHED)


def copy(source, root, place):
    place = os.path.join(root, place.lstrip("/"))
    os.makedirs(os.path.dirname(place), exist_ok=True)
    shutil.copy(source, place)


def copy_libraries(binary, root, *folders):
    """What the dynamic linker loads for the binary; what was fetched goes before what is installed here."""
    fetched = (os.path.join(FETCHED, folder, "x86_64-linux-gnu") for folder in ("lib", "usr/lib"))
    for line in run("ldd", binary, LD_LIBRARY_PATH=":".join((*folders, *fetched))).stdout.splitlines():
        check("not found" not in line, f"a package is missing from scripts/packages: {binary} needs {line}")
        path = next((word for word in line.split() if word.startswith("/")), None)
        if path and not path.startswith(root):
            copy(path, root, path.removeprefix(FETCHED))


def copy_modules(root):
    version = os.listdir(os.path.join(FETCHED, "lib/modules"))[0]
    done(BUSYBOX, "depmod", "-b", FETCHED, version)
    folder = os.path.join("lib/modules", version)
    needs, wanted = {}, []
    with open(os.path.join(FETCHED, folder, "modules.dep"), encoding="utf-8") as file:
        for line in file:
            path, others = line.split(":")
            needs[path] = others.split()
            if os.path.basename(path).removesuffix(".ko").replace("-", "_") in MODULES:
                wanted.append(path)
    check(len(wanted) == len(MODULES), "not all modules are there:", MODULES, wanted)
    while wanted:
        path = wanted.pop()
        if not os.path.exists(os.path.join(root, folder, path)):
            copy(os.path.join(FETCHED, folder, path), root, os.path.join(folder, path))
            wanted += needs[path]
    for name in "modules.builtin", "modules.order":
        copy(os.path.join(FETCHED, folder, name), root, os.path.join(folder, name))
    done(BUSYBOX, "depmod", "-b", root, version)


def archive(root, path):
    names = "\n".join(os.path.relpath(os.path.join(folder, name), root)
                      for folder, folders, files in os.walk(root) for name in sorted(folders + files))
    with open(path + ".new", "wb") as file:
        packed = subprocess.run([BUSYBOX, "cpio", "-o", "-H", "newc"], check=False, cwd=root, input=names.encode(),
                                stdout=file, stderr=subprocess.PIPE)
    check(packed.returncode == 0, packed.stderr)
    os.rename(path + ".new", path)


def newer(path, *sources):
    return os.path.exists(path) and all(os.path.getmtime(path) > os.path.getmtime(source) for source in sources)


def base():
    """The archive with everything but what is tested; made anew where what it is made of has changed."""
    here = os.path.dirname(os.path.abspath(__file__))
    if newer(BASE, __file__, os.path.join(here, "init"), PACKAGES):
        return
    if not newer(FETCHED, PACKAGES):
        fetch()
    with tempfile.TemporaryDirectory(prefix="hcli-machine-") as root:
        for folder in "bin", "sbin", "proc", "sys", "dev", "tmp", "root", "var":
            os.mkdir(os.path.join(root, folder))
        os.symlink("../run", os.path.join(root, "var/run"))
        copy(BUSYBOX, root, "bin/busybox")
        for applet in done(BUSYBOX, "--list").split():
            if applet != "busybox":
                os.symlink("busybox", os.path.join(root, "bin", applet))
        for program in PROGRAMS:
            found = next(path for folder in ("sbin", "usr/sbin", "usr/bin")
                         if os.path.isfile(path := os.path.join(FETCHED, folder, program)))
            copy(found, root, f"sbin/{program}")
            copy_libraries(found, root)
        copy_modules(root)
        copy(os.path.join(FETCHED, "etc/iscsi/iscsid.conf"), root, "etc/iscsi/iscsid.conf")
        copy(os.path.join(here, "init"), root, "init")
        for path, text in FILES.items():
            with open(os.path.join(root, path), "w", encoding="utf-8") as file:
                file.write(text)
        archive(root, BASE)


def tested(path):
    """An archive with hcli as it is installed, and the program that tests parts of it alone."""
    with tempfile.TemporaryDirectory(prefix="hcli-installed-") as root:
        prefix = os.path.join(root, "usr")
        done("cmake", "--install", os.environ["HCLI_BUILD_DIR"], "--prefix", prefix, "--strip")
        copy(os.path.join(os.environ["HCLI_BUILD_DIR"], "bin/linux-driver"), root, "usr/bin/linux-driver")
        for binary in [os.path.join(prefix, "bin/hcli"), *glob.glob(f"{prefix}/lib/**/*.so", recursive=True)]:
            copy_libraries(binary, root, os.path.join(prefix, "lib"))
        archive(root, path)


def build(path):
    """The root folder: the kernel unpacks one archive behind the other."""
    base()
    tested(path + ".tested")
    with open(path, "wb") as whole:
        for part in BASE, path + ".tested":
            with open(part, "rb") as file:
                shutil.copyfileobj(file, whole)


def kernel():
    return glob.glob(os.path.join(FETCHED, "boot/vmlinuz-*"))[0]
