"""Reads a gateway's /metrics with the Prometheus client library's own parser
(python3-prometheus-client) and compares samples with what the test expects.

    check-metrics.py URL NAME{LABEL="VALUE",...}=NUMBER ...

Each expectation names one sample exactly as exposed; the run fails when the
text does not parse, a family lacks its TYPE, or a sample is missing or
differs.
"""
import re
import sys
import urllib.error
import urllib.request

from prometheus_client.parser import text_string_to_metric_families


def main():
    url, expectations = sys.argv[1], sys.argv[2:]
    with urllib.request.urlopen(url, timeout=10) as response:
        content_type = response.headers.get("Content-Type", "")
        text = response.read().decode("utf-8")
    if not content_type.startswith("text/plain") or "version=0.0.4" not in content_type:
        sys.exit(f"unexpected Content-Type {content_type!r}")
    samples = {}
    for family in text_string_to_metric_families(text):
        if family.type == "unknown":
            sys.exit(f"family {family.name} has no TYPE")
        for sample in family.samples:
            labels = ",".join(f'{k}="{v}"' for k, v in sorted(sample.labels.items()))
            samples[f"{sample.name}{{{labels}}}" if labels else sample.name] = sample.value
    failed = False
    for expectation in expectations:
        name, _, number = expectation.rpartition("=")
        match = re.fullmatch(r"([^{]+)\{(.*)\}", name)
        if match:
            labels = ",".join(sorted(match.group(2).split(",")))
            name = f"{match.group(1)}{{{labels}}}"
        if samples.get(name) != float(number):
            print(f"{name}: expected {number}, got {samples.get(name)}", file=sys.stderr)
            failed = True
    base = url.rsplit("/", 1)[0]
    try:
        urllib.request.urlopen(base + "/other", timeout=10)
        print("/other was answered", file=sys.stderr)
        failed = True
    except urllib.error.HTTPError as error:
        if error.code != 404:
            print(f"/other got {error.code}, not 404", file=sys.stderr)
            failed = True
    if failed:
        sys.stderr.write(text)
        sys.exit(1)


main()
