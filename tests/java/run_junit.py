"""Runs the JUnit tests with the VM's checks of native code, whose warnings count as failures."""
import argparse
import os
import re
import subprocess
import sys

parser = argparse.ArgumentParser()
for option in ("java", "library-folder", "classes", "class-path"):
    parser.add_argument("--" + option, required=True)
arguments = parser.parse_args()

command = [arguments.java, "-Xcheck:jni", "-Djava.awt.headless=true",
           f"-Djava.library.path={arguments.library_folder}",
           "-cp", arguments.class_path, "org.junit.platform.console.ConsoleLauncher",
           "--scan-classpath", arguments.classes, "--fail-if-no-tests",
           "--disable-banner", "--disable-ansi-colors", "--details=tree"]
# The VM names files by the locale.
environment = dict(os.environ, LC_ALL="C.UTF-8")
done = subprocess.run(command, env=environment, stdout=subprocess.PIPE, stderr=subprocess.STDOUT,
                      text=True, errors="replace")
print(done.stdout)
# The VM writes "Warning: ", "WARNING in native method" or "FATAL ERROR in native method".
warnings = [line for line in done.stdout.splitlines() if re.match(r"(warning|fatal error)\b", line, re.IGNORECASE)]
for line in warnings:
    print("of the VM:", line)
sys.exit(done.returncode or bool(warnings))
