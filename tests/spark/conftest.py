"""Sessions of Spark: in this process, and on a cluster of real processes."""

import ctypes
import os
import shutil
import signal
import subprocess
import sys
import time
from pathlib import Path

import pytest

HOST = "127.0.0.1"
LIMIT = 120  # seconds for a process to come up, on a machine that is busy
os.environ["SPARK_LOCAL_IP"] = HOST
os.environ["PYSPARK_PYTHON"] = sys.executable


def start_session(master, directory, **settings):
    """On a master; or "server" for one in a process of its own, of which this process is a client."""
    if shutil.which("java") is None:
        pytest.skip("there is no java")
    from pyspark.sql import SparkSession

    defaults = {
        "spark.ui.enabled": "false",
        "spark.ui.showConsoleProgress": "false",
        "spark.driver.host": HOST,
        "spark.driver.bindAddress": HOST,
        "spark.driver.memory": "1g",
        "spark.local.dir": directory,
        "spark.sql.warehouse.dir": directory,
        "spark.sql.shuffle.partitions": "4",
        # Neither that of this machine nor UTC, so that a value that is read in the wrong zone shows.
        "spark.sql.session.timeZone": "America/New_York",
        "spark.log.level": "OFF",
    }
    builder = SparkSession.builder.appName("tests")
    builder = builder.remote("local[2]") if master == "server" else builder.master(master)
    for key, value in (defaults | settings).items():
        builder = builder.config(key, value)
    return builder.getOrCreate()


@pytest.fixture(scope="module")
def spark(tmp_path_factory):
    session = start_session("local[2]", tmp_path_factory.mktemp("spark"))
    yield session
    session.stop()


def die_with_parent():
    """A process that is left behind by a test that was killed is killed, too."""
    pr_set_pdeathsig = 1
    ctypes.CDLL(None).prctl(pr_set_pdeathsig, signal.SIGKILL)


class Cluster:
    """A master and two workers with a core each."""

    def __init__(self, directory: Path) -> None:
        self.directory = directory
        self.processes = []
        self.session = None

    def start(self):
        if shutil.which("java") is None:
            pytest.skip("there is no java")
        log = self.start_daemon("master.Master", "--port", "0")
        url = self.wait_for(log, "Starting Spark master at ").split()[0]
        for _ in range(2):
            log = self.start_daemon("worker.Worker", "--cores", "1", "--memory", "1g", url)
            self.wait_for(log, "Successfully registered with master")
        self.session = start_session(url, self.directory, **{"spark.executor.memory": "700m"})

    def start_daemon(self, name, *arguments):
        import pyspark

        home = Path(pyspark.__file__).parent
        log = self.directory / f"{len(self.processes)}.log"
        command = [home / "bin" / "spark-class", f"org.apache.spark.deploy.{name}"]
        environment = {"SPARK_HOME": home, "SPARK_WORKER_DIR": self.directory, "SPARK_LOCAL_DIRS": self.directory}
        with open(log, "w") as output:
            process = subprocess.Popen(
                [*command, "--host", HOST, "--webui-port", "0", *arguments],
                stdout=output,
                stderr=output,
                cwd=self.directory,
                env=os.environ | environment,
                preexec_fn=die_with_parent,
            )
        self.processes.append(process)
        return log

    def wait_for(self, log, words):
        """What follows the words in the log."""
        end = time.monotonic() + LIMIT
        while time.monotonic() < end:
            text = log.read_text()
            if words in text:
                return text.partition(words)[2]
            time.sleep(0.1)
        raise TimeoutError(f"{words!r} does not come: {log.read_text()[-2000:]}")

    def executors(self):
        """The ids of the processes that work for the session: the children of the workers."""
        workers = {process.pid for process in self.processes[1:]}
        found = []
        for entry in Path("/proc").glob("[0-9]*"):
            try:
                state, parent = (entry / "stat").read_text().rsplit(")", 1)[1].split()[:2]
            except OSError:  # no process, or one that has ended by now
                continue
            if int(parent) in workers and state != "Z":
                found.append(int(entry.name))
        return found

    def stop(self):
        if self.session is not None:
            self.session.stop()
        for process in reversed(self.processes):
            process.terminate()
            process.wait(LIMIT)


@pytest.fixture
def cluster(tmp_path):
    running = Cluster(tmp_path)
    try:
        running.start()
        yield running
    finally:
        running.stop()
