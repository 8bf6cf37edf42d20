#!/usr/bin/env python3
"""Installs the build into a folder, compiles the host in C against that and nothing else, and runs it there.

    check_installed.py CMAKE BUILD FOLDER SOURCE TEXT LIBDIR COMPILER [FLAG...]

SOURCE is the host's, TEXT a recording in text form of one tap that raises the volume, LIBDIR the folder of
libraries below the prefix.
"""

import os
import shutil
import subprocess
import sys


def install(cmake, build, prefix):
    shutil.rmtree(prefix, ignore_errors=True)
    subprocess.run([cmake, "--install", build, "--prefix", prefix], check=True, stdout=subprocess.DEVNULL)


def compile_host(compiler, flags, prefix, source):
    host = os.path.join(prefix, "bin", "host")
    subprocess.run([compiler, "-Wall", "-Wextra", "-Werror", *flags, "-I", os.path.join(prefix, "include"),
                    source, "-o", host, "-pthread", "-ldl"], check=True)
    return host


def main(cmake, build, folder, source, text, libdir, compiler, *flags):
    prefix = os.path.join(folder, "prefix")
    install(cmake, build, prefix)
    host = compile_host(compiler, [flag for flag in flags if flag], prefix, source)
    checker = os.path.join(os.path.dirname(os.path.abspath(__file__)), "check_c_host.py")
    plugin = os.path.join(prefix, libdir, "zorvatouch", "ZorvaTouchHIDService.so")
    zorvatouch = os.path.join(prefix, "bin", "zorvatouch")
    return subprocess.run([sys.executable, checker, host, plugin, zorvatouch, text, folder], check=False).returncode


sys.exit(main(*sys.argv[1:]))
