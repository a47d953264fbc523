// The facts of dimensions as a graph: a box for each class of equal ones, an arrow from the greater to the smaller.
"use strict";

const lineHeight = 18;
const levelGap = 46;
const boxGap = 28;

/** An element of a drawing. */
function draw(tag, attributes, ...children) {
    const element = document.createElementNS("http://www.w3.org/2000/svg", tag);
    for (const [name, value] of Object.entries(attributes)) element.setAttribute(name, value);
    element.append(...children);
    return element;
}

/** Boxes with their levels: each lies below all that exceed it. Greater-than has no cycles. */
function boxesOf(known) {
    const boxes = known.classes.map((members) => {
        const lines = members.map((index) => known.nodes[index]);
        const widest = Math.max(...lines.map(({name, bounds}) => name.length + (bounds ? bounds.length + 2 : 0)));
        return {lines, width: Math.max(64, widest * 7.4 + 24), height: lines.length * lineHeight + 14, above: [], below: []};
    });
    const boxOf = [];
    known.classes.forEach((members, index) => members.forEach((node) => (boxOf[node] = boxes[index])));
    const arrows = known.greater.map(({greater, smaller, blocks}) => ({from: boxOf[greater], to: boxOf[smaller], blocks}));
    for (const {from, to} of arrows) {
        from.below.push(to);
        to.above.push(from);
    }
    const waiting = boxes.filter((box) => box.above.length === 0);
    for (const box of waiting) box.level = 0;
    const left = new Map(boxes.map((box) => [box, box.above.length]));
    while (waiting.length > 0) {
        const box = waiting.shift();
        for (const next of box.below) {
            next.level = Math.max(next.level ?? 0, box.level + 1);
            left.set(next, left.get(next) - 1);
            if (left.get(next) === 0) waiting.push(next);
        }
    }
    return {boxes, arrows};
}

/** Orders each level by what its boxes are tied to, and places all. Returns the size of the whole. */
function place(boxes) {
    const levels = [];
    for (const box of boxes) (levels[box.level] ??= []).push(box);
    const setPositions = () => levels.forEach((level) => level.forEach((box, position) => (box.position = position)));
    setPositions();
    const middle = (ties, box) => (ties.length > 0 ? ties.reduce((sum, tie) => sum + tie.position, 0) / ties.length : box.position);
    for (const ties of ["above", "below", "above"]) {
        for (const level of levels) level.sort((one, other) => middle(one[ties], one) - middle(other[ties], other));
        setPositions();
    }
    const widthOf = (level) => level.reduce((sum, box) => sum + box.width + boxGap, -boxGap);
    const width = Math.max(...levels.map(widthOf));
    let y = 1;
    for (const level of levels) {
        let x = 1 + (width - widthOf(level)) / 2;
        for (const box of level) {
            box.x = x;
            box.y = y;
            x += box.width + boxGap;
        }
        y += Math.max(...level.map((box) => box.height)) + levelGap;
    }
    return {width: width + 2, height: y - levelGap + 1};
}

/** Classes that no greater-than is stated of. */
function drawLoose(boxes) {
    return make("div", "loose", ...boxes.map(({lines}) => make("div", "box", ...lines.map(({name, bounds}) =>
        make("div", "", name, make("span", "bounds", bounds))))));
}

function drawGraph(known) {
    if (known.nodes.length === 0) return make("p", "", "Nothing is known.");
    const {boxes, arrows} = boxesOf(known);
    const isTied = (box) => box.above.length + box.below.length > 0;
    const tied = boxes.filter(isTied);
    const loose = drawLoose(boxes.filter((box) => !isTied(box)));
    return make("div", "picture", ...(tied.length > 0 ? [drawTied(tied, arrows)] : []), loose);
}

function drawTied(boxes, arrows) {
    const {width: ofBoxes, height} = place(boxes);
    const width = ofBoxes + boxGap; // for arrows that go around boxes
    const picture = draw("svg", {class: "graph", width, height, viewBox: `0 0 ${width} ${height}`, role: "img",
        "aria-label": "greater sizes stand above smaller ones"},
    draw("defs", {}, draw("marker", {id: "tip", viewBox: "0 0 8 8", refX: 8, refY: 4, markerWidth: 8, markerHeight: 8,
        orient: "auto"}, draw("path", {d: "M0 0L8 4L0 8Z", class: "tip"}))));
    for (const {from, to, blocks} of arrows) {
        const [x, y] = [from.x + from.width / 2, from.y + from.height];
        const [endX, endY] = [to.x + to.width / 2, to.y];
        const bend = (endY - y) / 2;
        // Around the boxes of the levels between: a curve goes three quarters of the way to its control points.
        const between = boxes.filter((box) => box.level > from.level && box.level < to.level);
        const right = Math.max(...between.map((box) => box.x + box.width)) + boxGap / 2;
        const [first, second] = between.length === 0 ? [x, endX] : [x, endX].map((end) => end + ((right - end) * 4) / 3);
        const path = draw("path", {d: `M${x} ${y}C${first} ${y + bend} ${second} ${endY - bend} ${endX} ${endY}`, class: "arrow",
            "marker-end": "url(#tip)"});
        const names = `${from.lines[0].name} > ${to.lines[0].name}${blocks.length > 0 ? `, stated by ${blocks.join(", ")}` : ""}`;
        path.append(draw("title", {}, names));
        picture.append(path);
    }
    for (const box of boxes) {
        const group = draw("g", {class: "box"}, draw("rect", {x: box.x, y: box.y, width: box.width, height: box.height, rx: 6}));
        box.lines.forEach(({name, bounds}, index) => {
            const line = draw("text", {x: box.x + 12, y: box.y + 20 + index * lineHeight}, name);
            if (bounds) line.append(draw("tspan", {class: "bounds", dx: 14}, bounds));
            group.append(line);
        });
        picture.append(group);
    }
    return picture;
}
