// Paths and easing.

import assert from "node:assert/strict";
import { test } from "node:test";

import * as engine from "../../build/web/engine_base.mjs";

const { EasingFunction, Path, PathBuilder, PathInstruction, Value } = engine;

test("builders append instructions", () => {
  for (const [draw, data] of [
    [(b) => b.moveTo([1, 2]).lineTo({ x: 3, y: 4 }).close(), "M1 2L3 4Z"],
    [(b) => b.moveTo([0, 0]).curveTo([1, 2], [3, 4], [5, 6]), "M0 0C1 2 3 4 5 6"],
    [(b) => b.moveTo([0, 0]).quadCurveTo([1, 2], [3, 4]), "M0 0Q1 2 3 4"],
    [(b) => b.append(new PathBuilder().moveTo([1, 1]).lineTo([2, 2]).build()), "M1 1L2 2"],
    [(b) => b.hexaRect([0, 0], [4, 4], 1), "M1 0L3 0L4 1L4 3L3 4L1 4L0 3L0 1Z"],
  ]) {
    assert.equal(engine.svgPathData(draw(new PathBuilder()).build()), data);
  }
  for (const [draw, length] of [
    [(b) => b.circle([0, 0], 5), 6], [(b) => b.ellipse([0, 0], [5, 3]), 6], [(b) => b.roundRect([0, 0], [4, 4], 1), 10],
    [(b) => b.moveTo([0, 0]).arcTo([1, 1], true), 2],
  ]) {
    assert.equal(draw(new PathBuilder()).build().length, length);
  }
  const builder = new PathBuilder();
  assert.deepEqual(builder.currentPoint, [0, 0]);
  assert.deepEqual(builder.moveTo([1, 2]).currentPoint, [1, 2]);
  assert.deepEqual(builder.lineTo([3, 4]).currentPoint, [3, 4]);
  const before = builder.build();
  builder.close();
  assert.equal(before.length, 2);
  assert.equal(builder.build().length, 3);
});

test("paths have elements", () => {
  const path = new PathBuilder().moveTo([1, 2]).lineTo([3, 4]).close().build();
  assert.deepEqual(path.elements, [
    { instruction: PathInstruction.moveTo, points: [[1, 2]] }, { instruction: PathInstruction.lineTo, points: [[3, 4]] },
    { instruction: PathInstruction.close, points: [] },
  ]);
  assert.ok(Object.isFrozen(path.elements) && Object.isFrozen(path.elements[0].points[0]));
  assert.ok(new Path(path.elements).equals(path));
  assert.ok(!new Path().equals(path));
  assert.equal(`${path}`, "M1 2L3 4Z");
  for (const [name, instruction] of Object.entries(PathInstruction)) {
    assert.equal(engine.pathInstructionToString(instruction), name);
    assert.equal(engine.stringToPathInstruction(name), instruction);
  }
  assert.equal(engine.stringToPathInstruction("Close"), null);
});

test("paths have bounds, transformations and interpolation", () => {
  const square = new PathBuilder().moveTo([0, 0]).lineTo([2, 0]).lineTo([2, 4]).build();
  assert.deepEqual(engine.bounds(square), { min: [0, 0], max: [2, 4] });
  assert.equal(engine.bounds(new Path()), null);
  assert.equal(`${engine.translated(square, [1, 1])}`, "M1 1L3 1L3 5");
  assert.equal(`${engine.scaled(square, [2, 0.5])}`, "M0 0L4 0L4 2");
  assert.equal(`${engine.interpolate(square, engine.translated(square, [2, 2]), 0.5)}`, "M1 1L3 1L3 5");
  assert.equal(engine.interpolate(square, new Path(), 0.5), null);
  assert.equal(`${engine.pathFromSvgPathData("m1 1 h2 v3 z")}`, "M1 1L3 1L3 4Z");
  assert.throws(() => engine.pathFromSvgPathData("M 1 x"), { name: "SyntaxError", message: "invalid SVG path data at byte 4" });
});

test("curves ease numbers, vectors, integers and values", () => {
  assert.deepEqual(Object.keys(EasingFunction).length, 13);
  for (const [number, name] of engine.easingFunctionNames().entries()) {
    assert.equal(engine.stringToEasingFunction(name), number);
    assert.equal(engine.ease(number, 3, 10, 1), 10);
  }
  assert.equal(engine.stringToEasingFunction("cubic"), null);
  assert.equal(engine.ease(EasingFunction.CubicOut, 0, 10, 0.5), 8.75);
  assert.deepEqual([...engine.ease(EasingFunction.Linear, [0, 1], [10, 21], 0.5)], [5, 11]);
  assert.deepEqual([...engine.ease(EasingFunction.Linear, [0, 0, 0, 0], [1, 2, 3, 4], 0.5)], [0.5, 1, 1.5, 2]);
  assert.equal(engine.ease(EasingFunction.Linear, 0n, 10n, 0.55), 5n);
  assert.equal(`${engine.ease(EasingFunction.Linear, new Value([0, 0]), [1, 2], 0.5)}`, "0.5, 1");
  assert.equal(engine.ease(EasingFunction.Linear, 0, new Value(1), 0.5).number, 0.5);
});

test("easing many points at once matches single calls bit for bit", () => {
  const progress = Float64Array.from({ length: 1001 }, (_, i) => i / 1000);
  for (const curve of Object.values(EasingFunction)) {
    const eased = engine.ease(curve, 1, 7, progress);
    const vectors = engine.ease(curve, [1, 2, 3], [7, 9, 2], progress);
    for (const [i, t] of progress.entries()) {
      assert.ok(Object.is(eased[i], engine.ease(curve, 1, 7, t)));
      if (i % 100 === 0) assert.deepEqual(vectors.slice(3 * i, 3 * i + 3), engine.ease(curve, [1, 2, 3], [7, 9, 2], t));
    }
  }
  assert.deepEqual([...engine.ease(0, 0, 2, [0.25, 1])], [0.5, 2]);
  assert.equal(engine.ease(0, 0, 2, []).length, 0);
});

test("invalid paths, points and ends are rejected", () => {
  const builder = new PathBuilder().moveTo([1, 1]);
  const path = builder.build();
  for (const [call, error] of [
    [() => builder.lineTo([1]), TypeError], [() => builder.lineTo(1, 2), TypeError], [() => builder.lineTo(null), TypeError],
    [() => builder.curveTo([1, 2], [3, 4]), TypeError], [() => builder.circle([0, 0]), TypeError],
    [() => builder.circle([0, 0], "5"), TypeError], [() => builder.append({}), TypeError],
    [() => builder.arcTo([1, 2]), TypeError], [() => builder.roundRect([0, 0], [1, 1], null), TypeError],
    [() => new Path(5), TypeError], [() => new Path([{ instruction: 5 }]), TypeError], [() => new Path([null]), TypeError],
    [() => new Path([{ instruction: 0, points: [[1]] }]), TypeError], [() => new Path("M0 0"), TypeError],
    [() => engine.bounds({}), TypeError], [() => engine.svgPathData("M0 0"), TypeError],
    [() => engine.scaled(path, 2), TypeError], [() => engine.interpolate(path, path, "x"), TypeError],
    [() => engine.pathFromSvgPathData(5), TypeError], [() => engine.pathInstructionToString(5), TypeError],
    [() => engine.ease(13, 0, 1, 0.5), TypeError], [() => engine.ease("Linear", 0, 1, 0.5), TypeError],
    [() => engine.ease(0, 0, [1, 2], 0.5), TypeError], [() => engine.ease(0, 0, 1), TypeError],
    [() => engine.ease(0, 0, 1, "x"), TypeError], [() => engine.ease(0, 0, 1, [0.5, "x"]), TypeError],
    [() => engine.ease(0, 0n, 1n, [0.5]), TypeError], [() => engine.ease(0, path, path, 0.5), TypeError],
    [() => engine.ease(0, [1], [2], 0.5), TypeError],
  ]) {
    assert.throws(call, (thrown) => thrown instanceof error && thrown.message.includes(" "), call.toString());
  }
  assert.equal(`${builder.build()}`, "M1 1");
});
