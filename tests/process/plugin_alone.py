"""The plug-in builds from its own folder and the contracts alone, against libraries given as files, and then loads."""

import os
import re
import shutil
import tempfile

from support.program import HCLI, SOURCE, check, read, run

BUILD = os.environ["HCLI_BUILD_DIR"]
LIBRARIES = os.path.join(BUILD, "lib")
# Compiled as this build was, so that ccache, where there is one, has every object already.
SAME = re.compile(r"^(CMAKE_BUILD_TYPE|CMAKE_CXX_COMPILER|CMAKE_CXX_FLAGS_DEBUG|HCLI_CHECKED):\w+=.*$", re.MULTILINE)

UNREGISTERED = ["AdapterDiscoveryIsns" + name for name in ("Add", "List", "ParamGet", "ParamSet", "Remove")]
UNREGISTERED += ["AdapterIsnsParamGet", "AdapterIsnsParamSet", "RouteAdd", "RouteList", "RouteRemove"]


def expect(done, status, text):
    check(done.returncode == status and text in done.stdout + done.stderr, done.args, done.stdout, done.stderr)


with tempfile.TemporaryDirectory(prefix="hcli-plugin-") as folder:
    tree, build = os.path.join(folder, "tree"), os.path.join(folder, "tree", "build", "alone")
    for name in "cmake", "contracts", "plugins":
        shutil.copytree(os.path.join(SOURCE, name), os.path.join(tree, name))
    shutil.copy(os.path.join(SOURCE, "CMakeLists.txt"), tree)
    same = ["-D" + found.group() for found in SAME.finditer(read(os.path.join(BUILD, "CMakeCache.txt")))]
    configure = ["cmake", "-S", tree, "-B", build, "-G", "Ninja", "-DHCLI_PLUGIN_ONLY=ON", *same]
    expect(run(*configure), 1, "set HCLI_FRAMEWORK_LIBRARY to the library to link")
    expect(run(*configure, "-DHCLI_FRAMEWORK_LIBRARY=/no/such.so"), 1, "no such file: /no/such.so")
    os.chdir(BUILD)  # paths are seen from the folder in which the command is given
    expect(run(*configure, "-DHCLI_FRAMEWORK_LIBRARY=lib/libplinth.so",
               "-DHCLI_STORAGE_LIBRARIES=lib/libcorectl.so;lib/libhost.so",
               "-DHCLI_IMA_LIBRARY=lib/libima.so"), 0, "")
    expect(run("ninja", "-C", build), 0, "")
    plugins = os.path.join(build, "lib/hcli/plugins")
    check(os.listdir(plugins) == ["iscsi.so"], os.listdir(plugins))
    # What stands on no path can be made from outside all the same.
    source, program = os.path.join(folder, "program.cpp"), os.path.join(folder, "program")
    made = " && ".join(f"{name}::New()->GetInputSpec()" for name in UNREGISTERED)
    with open(source, "w", encoding="utf-8") as file:
        file.write("#include <UnregisteredCommands.h>\nusing namespace TessaroCli::IscsiNamespace;\n"
                   f"int main() {{ return {made} ? 0 : 1; }}\n")
    compiler = re.search(r"^CMAKE_CXX_COMPILER:\w+=(.*)$", read(os.path.join(build, "CMakeCache.txt")), re.MULTILINE)
    expect(run(compiler.group(1), "-std=c++20", "-I" + os.path.join(tree, "contracts"),
               "-I" + os.path.join(tree, "plugins/iscsi"), source, os.path.join(plugins, "iscsi.so"), "-o", program,
               "-Wl,-rpath-link," + LIBRARIES), 0, "")
    expect(run(program, LD_LIBRARY_PATH=LIBRARIES), 0, "")
    expect(run(HCLI, "iscsi", "adapter", "--help", HCLI_PLUGINS=plugins, HCLI_ROOT=folder), 0, "list")
