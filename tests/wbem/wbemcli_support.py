"""The installed tool and the real client, run as users run them, and what one should see of the
other."""
import atexit
import json
import os
import re
import shutil
import subprocess
import tempfile
import threading
import time

TOOL = os.environ["PLEXOR_TESTBED"]
SCENARIOS = os.environ["SCENARIO_DIR"]
EXPECTED = os.environ["EXPECTED_DIR"]

CLASSES = ["Controller", "SoftwareIdentity", "StorageVolume", "StorageExtent", "SASSATAPort",
           "Battery"]
PREFIX = "Tovexa_Plexor"
NAMESPACE = "root/cimv2"
DEADLINE = 150  # seconds until the largest inventory must be there, on a busy machine


def environment():
    """Settings of the checking builds that the tool's own tests need as well."""
    settings = dict(os.environ)
    settings.pop("PLEXOR_PROVIDER_LIBRARY", None)
    # The provider abandons the texts of a volume that has no pool.
    settings["ASAN_OPTIONS"] = "detect_leaks=0"
    # The thread checker of gcc 12 does not see a join that has a deadline.
    settings.setdefault("TSAN_OPTIONS", "report_thread_leaks=0")
    return settings


def scenario_names():
    return sorted(name[:-5] for name in os.listdir(SCENARIOS) if name.endswith(".json"))


def scenario_file(name):
    return os.path.join(SCENARIOS, name + ".json")


def require_client():
    if shutil.which("wbemcli") is None:
        raise RuntimeError("wbemcli is not installed; scripts/install-deps installs it")


class Client:
    """wbemcli; `output` is "" and `errors` tells why when a request fails."""

    def __init__(self, *arguments):
        result = subprocess.run(["wbemcli", *arguments], capture_output=True, timeout=60,
                                check=False)
        self.output = result.stdout.decode("utf-8", "replace")
        self.errors = result.stderr.decode("utf-8", "replace")

    def blocks(self):
        """What `-nl` prints, an entry for each instance."""
        return [block for block in self.output.split("\n\n") if block.strip()]

    def lines(self):
        return self.output.splitlines()


class Server:
    """`plexor-testbed serve` on a port of its own."""

    def __init__(self, scenario, *arguments, port="0"):
        self.process = subprocess.Popen(
            [TOOL, "serve", "--scenario", scenario, "--port", port, *arguments],
            stdin=subprocess.PIPE, stdout=subprocess.PIPE, stderr=subprocess.PIPE,
            env=environment(), text=True)
        atexit.register(self.process.kill)  # whatever becomes of the test
        first = self.process.stdout.readline()
        match = re.fullmatch(r"serving https?://(127\.0\.0\.1:\d+)/cimom\n", first)
        if not match:
            self.process.kill()
            raise RuntimeError("the server said: " + first + self.process.communicate()[1])
        self.host = match.group(1)

    def url(self, name, name_space=NAMESPACE):
        return f"http://{self.host}/{name_space}:{name}"

    def say(self, command):
        self.process.stdin.write(command + "\n")
        self.process.stdin.flush()

    def close_input(self):
        self.process.stdin.close()
        self.process.stdin = None

    def end(self, how=None):
        """Ends the server by a signal, or as `how` says; its status."""
        if how is None:
            self.process.terminate()
        else:
            how(self)
        try:
            self.process.communicate(timeout=90)
            return self.process.returncode
        finally:
            self.process.kill()


def show(name):
    """What the tool's own client sees of a scenario."""
    with tempfile.TemporaryFile() as output:
        subprocess.run([TOOL, "show", "--json", "--timeout", str(DEADLINE), "--scenario",
                        scenario_file(name)], stdout=output, env=environment(), check=True)
        output.seek(0)
        return json.load(output)


def value_text(value):
    """A value of the tool's JSON as wbemcli prints it."""
    if value is None:
        return ""
    if isinstance(value, bool):
        return "TRUE" if value else "FALSE"
    if isinstance(value, list):
        return ",".join(value_text(element) for element in value)
    if isinstance(value, str):
        return '"' + re.sub(r"[\x00-\x08\x0b\x0c\x0e-\x1f]", "\ufffd", value) + '"'
    return str(value)


def path_text(host, class_name, keys):
    return f"{host}/{NAMESPACE}:{class_name}." + ",".join(
        name + "=" + value_text(value) for name, value in keys.items())


def block_of(host, class_name, instance, only=None):
    """An instance of the tool's JSON as `wbemcli -nl` prints it."""
    lines = [path_text(host, class_name, instance["keys"])]
    for name, value in instance["properties"].items():
        if only is None or name in only:
            lines.append(f"-{name}={value_text(value)}")
    return "\n".join(lines)


def line_of(host, class_name, instance):
    """The same as `wbemcli` without `-nl` prints it."""
    return path_text(host, class_name, instance["keys"]) + " " + ",".join(
        f"{name}={value_text(value)}" for name, value in instance["properties"].items())


def property_of(block, name):
    match = re.search(f"^-{name}=(.*)$", block, re.MULTILINE)
    value = match.group(1) if match else ""
    return value[1:-1] if value.startswith('"') else value


def is_addressable(instance, controllers):
    """The provider cannot tell where the controller's id ends in a DeviceID when the id has an
    underscore, and does not take one of a single character."""
    device = instance["keys"].get("DeviceID")
    if device is None:
        return True
    ids = [controller["keys"]["Name"][len("tvxController"):] for controller in controllers]
    owners = [one for one in ids if re.fullmatch(f"tvx[A-Za-z]+{re.escape(one)}_.*", device)]
    return all(len(owner) != 1 and "_" not in owner for owner in owners)


def summary_line(class_name, block):
    """Class|ElementName|HealthState or VersionString|OperationalStatus"""
    status = property_of(block, "OperationalStatus").split(",")[0]
    return "|".join([class_name, property_of(block, "ElementName"),
                     property_of(block, "HealthState") + property_of(block, "VersionString"),
                     status])


def read_expected(name):
    """Lines, and regular expressions for those that the vendor's order decides."""
    lines, patterns = [], []
    with open(os.path.join(EXPECTED, name + ".txt"), encoding="utf-8") as file:
        for line in file.read().splitlines():
            if line.startswith("~"):
                patterns.append(line[1:])
            elif line and not line.startswith("#"):
                lines.append(line)
    return lines, patterns


def start_all():
    """A server and an independent answer for each scenario: {name: (server, answer)}."""
    names = scenario_names()
    # Almost standing still: no timeline changes what is compared.
    servers = {name: Server(scenario_file(name), "--speed", "0.001") for name in names}
    answers = {}
    threads = [threading.Thread(target=lambda n=name: answers.__setitem__(n, show(n)))
               for name in names]
    for thread in threads:
        thread.start()
    for thread in threads:
        thread.join()
    return {name: (servers[name], answers.get(name)) for name in names}


def wait_until(condition, seconds=DEADLINE):
    """True when the condition comes to hold in time."""
    deadline = time.monotonic() + seconds
    while not condition():
        if time.monotonic() > deadline:
            return False
        time.sleep(0.5)
    return True
