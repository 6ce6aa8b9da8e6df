"""The examples print what they should, and so do the programs of the guide's page."""

import re
import subprocess
import sys
from pathlib import Path

import pytest

import tarn_engine_base as tarn

ROOT = Path(__file__).parents[2]
DOCUMENTS = ROOT / "examples" / "documents"


def output(example: str, *arguments: object) -> str:
    command = [sys.executable, ROOT / "python" / "examples" / example, *map(str, arguments)]
    return subprocess.run(command, check=True, capture_output=True, text=True).stdout


def test_list_ports() -> None:
    lines = output("list_ports.py", DOCUMENTS, "sound").splitlines()
    assert lines == [
        "animation.json: patch 32 'media', port 3203 'jingle'",
        "animation.json: patch 32 'media', port 3253 'jingle'",
    ]


def test_list_ports_continues_after_invalid_documents(tmp_path: Path) -> None:
    (tmp_path / "a.json").write_text("{}")
    (tmp_path / "b.json").write_text('{"root":{"id":1,"inputs":[{"id":2,"type":"float"}]}}')
    assert output("list_ports.py", tmp_path, "float") == "b.json: patch 1 '', port 2 ''\n"


def test_bypass(tmp_path: Path) -> None:
    result = tmp_path / "result.json"
    printed = output("bypass.py", DOCUMENTS / "animation.json", "choose", 3, result)
    assert printed.splitlines() == [
        'changed patch 13 "colors": disconnected 1651->1701; disconnected 1551->1703; disconnected 1751->1801; '
        "connected 1551->1801",
        'changed patch 15 "fade": name "fade" -> "fade, without flash"',
        'removed patch 17 "flash" from patch 13 "colors"',
    ]
    root = tarn.load_document(result)
    index = tarn.PatchIndex(root)
    arriving = index.incoming_connection(1801)
    assert arriving is not None and arriving.from_port_id == 1551


def test_plot_outputs(tmp_path: Path) -> None:
    picture = tmp_path / "plot.png"
    printed = output("plot_outputs.py", DOCUMENTS / "animation.json", picture, 3)
    # The numbers that the program document_road computes for these frames.
    assert printed.splitlines() == [
        "bouncing badge: radius from 20 to 21.5",
        "bouncing badge: spin from 0 to 24.1154",
        "motion: radius from 20 to 21.5",
        "motion: spin from 0 to 24.1154",
        "motion: progress from 0 to 0.166667",
    ]
    assert picture.read_bytes().startswith(b"\x89PNG")


PAGE = (ROOT / "docs" / "python.md").read_text()
PROGRAMS = re.findall(r"```python\n(.*?)```\n\n```text\n(.*?)```", PAGE, re.DOTALL)


@pytest.mark.parametrize("program, text", PROGRAMS, ids=range(len(PROGRAMS)))
def test_a_program_in_the_guide(program: str, text: str) -> None:
    done = subprocess.run([sys.executable, "-c", program], check=True, capture_output=True, text=True, cwd=ROOT)
    assert done.stdout == text


def test_the_guide_shows_the_output_of_each_program() -> None:
    assert len(PROGRAMS) == PAGE.count("```python\n") >= 5
