// Documents for the checks.

// This many patches in one group, each with two connected inputs.
export function largeDocument(patches) {
    const children = [];
    const connections = [];
    for (let i = 0; i < patches; ++i) {
        const id = i + 2;
        children.push({
            id, kind: "add", name: `patch ${id}`, attributes: { place: [i % 50, i / 50] },
            inputs: [{ id: id * 10, name: "a", type: "float" }, { id: id * 10 + 1, name: "b", type: "vec2" }],
            outputs: [{ id: id * 10 + 2, name: "sum", type: "vec2" }],
        });
        for (const input of [0, 1]) {
            const from = 2 + Math.floor(i / (2 + input));
            if (i > 1) connections.push({ from: [from, from * 10 + 2], to: [id, id * 10 + input] });
        }
    }
    return { root: { id: 1, name: "large", children, connections } };
}
