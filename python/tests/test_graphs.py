"""Patches, indexes, edits, changes and documents."""

import copy
import gc
import pickle
import random
import threading
import time
from pathlib import Path as FilePath
from typing import Any

import pytest

import tarn_engine_base as tarn
from tarn_engine_base import Connection, ModelLayer, Patch, PatchEdit, PatchIndex, Port, Type, TypeInfo, Unsigned, Value

DOCUMENTS = FilePath(__file__).parents[2] / "examples" / "documents"


def graph() -> Patch:
    fade = Patch(
        id=2,
        builtin=6,
        name="fade",
        outputs=[Port(20, 1, "out", TypeInfo(Type.VEC2), (1, 2), {"x": [1, Unsigned(2)]})],
        attributes={"position": [10, 20.5]},
        descriptor="second",
        model_layer=ModelLayer(1, [ModelLayer(2)], [ModelLayer(3)]),
    )
    ring = Patch(id=3, name="ring", inputs=[Port(30, type_info=TypeInfo(Type.FLOAT, min=0, max=1))])
    return Patch(id=1, name="root", children=[fade, ring], connections=[Connection(2, 20, 3, 30)])


def test_records_have_their_fields() -> None:
    fade, ring = graph().children
    assert (fade.id, fade.builtin, fade.name, fade.descriptor) == (2, 6, "fade", "second")
    assert fade.attributes == {"position": [10, 20.5]}
    assert fade.model_layer.children == (ModelLayer(2),)
    port = fade.outputs[0]
    assert (port.id, port.tag, port.name) == (20, 1, "out")
    assert port.default_value == Value((1, 2))
    assert port.attributes == {"x": [1, 2]}
    assert type(port.attributes["x"][1]) is Unsigned
    assert ring.inputs[0].type_info.max == Value(1)
    connection = graph().connections[0]
    assert (connection.from_patch_id, connection.to_port_id) == (2, 30)
    assert {connection, Connection(2, 20, 3, 30)} == {connection}


def test_records_change_only_by_assignment() -> None:
    patch = graph()
    with pytest.raises(TypeError):
        patch.attributes["x"] = 1
    with pytest.raises(AttributeError):
        patch.children.append(Patch())
    with pytest.raises(AttributeError):
        patch.connections[0].to_port_id = 7
    before = copy.copy(patch)
    patch.name = "other"
    patch.children = [*patch.children, Patch(id=9)]
    patch.attributes = {"a": None}
    assert before == graph()
    assert [child.id for child in patch.children] == [2, 3, 9]
    with pytest.raises(TypeError, match="elements of type Patch, not int"):
        patch.children = [1]
    assert [child.id for child in patch.children] == [2, 3, 9]


def test_records_are_pickled_and_printed() -> None:
    patch = graph()
    for copied in (pickle.loads(pickle.dumps(patch)), copy.deepcopy(patch)):
        assert copied == patch
    port = patch.children[0].outputs[0]
    assert eval(repr(port)) == port
    assert pickle.loads(pickle.dumps(port)) == port
    connection = patch.connections[0]
    assert eval(repr(connection)) == connection
    assert pickle.loads(pickle.dumps(connection)) == connection
    assert str(connection) == "[connection:20->30]"
    assert repr(patch) == "<Patch 1 'root': 0 inputs, 0 outputs, 2 children>"


def test_index_queries() -> None:
    index = PatchIndex(graph())
    gc.collect()  # The index keeps its graph.
    assert index.root == graph()
    found = index.find_patch(3)
    assert found is not None and found.name == "ring"
    parent = index.parent_of(3)
    assert parent is not None and parent.id == 1
    assert index.parent_of(1) is None
    assert index.find_patch(99) is None
    port = index.find_output_port(20)
    assert port is not None and port.name == "out"
    assert index.find_input_port(20) is None
    owner = index.owner_of_port(30)
    assert owner is not None and owner.id == 3
    assert index.incoming_connection(30) == Connection(2, 20, 3, 30)
    assert index.incoming_connection(20) is None
    assert index.outgoing_connections(20) == [Connection(2, 20, 3, 30)]
    assert index.outgoing_connections(99) == []
    assert index.incoming_connections_to_patch(3) == [Connection(2, 20, 3, 30)]
    assert index.outgoing_connections_from_patch(2) == [Connection(2, 20, 3, 30)]
    index.update(Patch(id=5))
    assert index.find_patch(3) is None
    assert found.name == "ring"
    assert tarn.find_patch_recursive(graph(), 2) == graph().children[0]
    assert tarn.find_patch_recursive(graph(), 0) is None
    assert tarn.out_port_for_tag(graph().children[0], 1) == graph().children[0].outputs[0]
    assert tarn.in_port_for_tag(graph(), 1) is None


def test_edit_and_changes() -> None:
    before = graph()
    index = PatchIndex(before)
    edit = PatchEdit(index)
    ring = edit.patch(3)
    port = edit.input_port(30)
    assert ring is not None and port is not None
    ring.name = "circle"
    port.default_value = 0.5
    assert edit.patch(99) is None
    assert edit.output_port(30) is None
    assert edit.add_patch(1, Patch(id=edit.fresh_patch_id(), name="new"), 0)
    assert not edit.add_patch(99, Patch(id=50))
    assert not edit.connect(Connection(2, 20, 3, 30))
    assert edit.disconnect(Connection(2, 20, 3, 30))
    after = edit.commit()
    assert before == graph()
    assert [child.name for child in after.children] == ["new", "fade", "circle"]
    assert after.connections == ()
    for use in (lambda: ring.name, lambda: setattr(ring, "name", "late"), lambda: port.default_value):
        with pytest.raises(ValueError, match="committed"):
            use()
    changes = tarn.patch_changes(before, after)
    assert {change.kind.name for change in changes} == {"ADDED", "CHANGED"}
    added = next(change for change in changes if change.kind is tarn.PatchChangeKind.ADDED)
    assert added.before is None
    assert added.after is not None and added.after.name == "new"
    del before, after
    gc.collect()
    assert added.after.name == "new"
    assert 'changed patch 3 "ring": name "ring" -> "circle"; input 30 default 0.0 -> 0.5' in [str(change) for change in changes]
    assert tarn.patch_changes(graph(), graph()) == []


def test_updating_an_index_costs_as_much_as_the_edit() -> None:
    groups = [Patch(id=1000 * i + 2, children=[Patch(id=1000 * i + j + 3) for j in range(500)]) for i in range(100)]
    root = Patch(id=1, children=groups)
    start = time.perf_counter()
    index = PatchIndex(root)
    built = time.perf_counter() - start
    followed = []
    for i in range(10):
        edit = PatchEdit(index)
        patch = edit.patch(5)
        assert patch is not None
        patch.name = str(i)
        after = edit.commit()
        start = time.perf_counter()
        index.update(after)
        followed.append(time.perf_counter() - start)
    assert min(followed) < built / 4
    found = index.find_patch(5)
    assert found is not None and found.name == "9"
    assert edit.commit() == after
    assert not edit.add_patch(1, Patch(id=9999999))
    assert not edit.move_patch(5, 1)


def test_removed_parts_raise() -> None:
    edit = PatchEdit(PatchIndex(graph()))
    ring = edit.patch(3)
    assert ring is not None
    assert edit.remove_patch(3)
    with pytest.raises(ValueError, match="removed"):
        ring.name = "gone"
    assert len(edit.commit().children) == 1


def test_documents_round_trip() -> None:
    patch = graph()
    text = tarn.write_document(patch, 25.0)
    again, info = tarn.read_document_with_info(text)
    assert again == patch
    assert info.frames_per_second == 25.0
    assert info.form is tarn.DocumentForm.OWN
    assert info.summary() == ""
    assert tarn.read_document(text.encode()) == patch


def test_files(tmp_path: FilePath) -> None:
    file = tmp_path / "graph.json"
    tarn.save_document(file, graph())
    assert tarn.load_document(file) == graph()
    assert tarn.load_document(str(file)) == graph()
    with pytest.raises(OSError):
        tarn.save_document(tmp_path / "none" / "graph.json", graph())
    with pytest.raises(FileNotFoundError):
        tarn.load_document(tmp_path / "missing.json")
    file.write_text("{}")
    with pytest.raises(tarn.DocumentError) as caught:
        tarn.load_document(file)
    assert caught.value.file == str(file)
    assert str(caught.value).startswith(f"{file}: ")


def test_reads_the_bundled_documents() -> None:
    for file in sorted(DOCUMENTS.glob("*.json")):
        root, info = tarn.load_document_with_info(file)
        assert len(root.children) > 0
        assert (info.form is tarn.DocumentForm.NODE_GRAPH) == (file.name == "node_graph.json")
        assert bool(info.summary()) == (file.name == "node_graph.json")


@pytest.mark.parametrize(
    "text, line, column, pointer",
    [
        ("", 0, 0, ""),
        ("{}", 1, 1, ""),
        ('{"root":\n {"id": 1,', 2, 11, "/root/id"),
        ('{"root":{"id":1,"inputs":[{"id":2,"type":"vec5"}]}}', 1, 42, "/root/inputs/0/type"),
    ],
)
def test_errors_have_a_position(text: str, line: int, column: int, pointer: str) -> None:
    with pytest.raises(tarn.DocumentError) as caught:
        tarn.read_document(text)
    error = caught.value
    assert isinstance(error, ValueError)
    assert (error.line, error.column, error.pointer) == (line, column, pointer)
    assert error.message in str(error)


def test_deep_graphs_need_no_python_stack() -> None:
    def check() -> None:
        patch = Patch(id=10_000)
        for i in range(9_999, 0, -1):
            patch = Patch(id=i, children=[patch])
        assert patch == pickle.loads(pickle.dumps(patch))
        assert str(patch).count("[patch:") == 10_000
        index = PatchIndex(patch)
        edit = PatchEdit(index)
        deepest = edit.patch(10_000)
        assert deepest is not None
        deepest.name = "deepest"
        assert len(tarn.patch_changes(patch, edit.commit())) == 1
        checked.append(True)

    checked: list[bool] = []
    check()
    thread = threading.Thread(target=check)
    thread.start()
    thread.join()
    assert checked == [True, True]


def test_graphs_cannot_exceed_the_depth_limit() -> None:
    patch, made = Patch(id=1), 1
    with pytest.raises(ValueError, match="10,000 levels"):
        while made < 20_000:
            patch = Patch(id=made + 1, children=[patch])
            made += 1
    assert made == 10_000
    with pytest.raises(ValueError, match="10,000 levels"):
        Patch().children = [patch]
    layer = ModelLayer(1)
    with pytest.raises(ValueError, match="10,000 levels"):
        for i in range(20_000):
            layer = ModelLayer(i, [layer]) if i % 2 else ModelLayer(i, [], [layer])


def test_edits_cannot_exceed_the_depth_limit() -> None:
    edit = PatchEdit(PatchIndex(Patch(id=1)))
    for i in range(1, 10_000):
        assert edit.add_patch(i, Patch(id=i + 1))
    with pytest.raises(ValueError, match="10,000 levels"):
        edit.add_patch(10_000, Patch(id=10_001))
    deepest = edit.patch(10_000)
    assert deepest is not None
    with pytest.raises(ValueError, match="10,000 levels"):
        deepest.children = [Patch(id=20_000)]
    assert edit.add_patch(1, Patch(id=10_001))
    with pytest.raises(ValueError, match="10,000 levels"):
        edit.move_patch(2, 10_001)
    assert edit.remove_patch(5)
    index = PatchIndex(edit.commit())
    edit = PatchEdit(index)
    assert edit.move_patch(2, 10_001)
    assert edit.add_patch(4, Patch(id=5, children=[Patch(id=6)]))
    assert edit.add_patch(6, Patch(id=7))
    moved = PatchIndex(edit.commit())
    levels, patch = 1, moved.find_patch(7)
    while patch is not None and patch.id != 1:
        levels, patch = levels + 1, moved.parent_of(patch.id)
    assert levels == 8


def test_shared_lists_are_visited_once() -> None:
    patch = Patch(id=1)
    for _ in range(5_000):
        patch = Patch(id=1, children=[patch, patch])
    assert len(patch.children) == 2


def test_random_graphs_round_trip() -> None:
    source = random.Random(18)

    def data(depth: int) -> Any:
        kinds = 5 if depth == 0 else 7
        kind = source.randrange(kinds)
        if kind == 5:
            return [data(depth - 1) for _ in range(source.randrange(4))]
        if kind == 6:
            return {f"k{i}": data(depth - 1) for i in range(source.randrange(4))}
        return [None, source.randrange(-5, 5), Unsigned(source.randrange(9)), source.random(), "text"][kind]

    for _ in range(200):
        ports = [Port(i + 1, i, str(i), default_value=Value(tarn.Unstructured(data(3)))) for i in range(3)]
        patch = Patch(id=1, inputs=ports, attributes={"a": data(3)})
        assert tarn.read_document(tarn.write_document(patch)) == patch
        for port in ports:
            assert Value(tarn.Unstructured(port.default_value.data)) == port.default_value
