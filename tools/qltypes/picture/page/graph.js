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

/**
 * Boxes with their levels, each below all that exceed it, and arrows from box to box by way of the levels between. There
 * they have places of their own, which are in the list of boxes too. Greater-than has no cycles.
 */
function boxesOf(known) {
    const boxes = known.classes.map((members) => {
        const lines = members.map((index) => known.nodes[index]);
        const widest = Math.max(...lines.map(({name, bounds}) => name.length + (bounds ? bounds.length + 2 : 0)));
        return {lines, width: Math.max(64, widest * 7.4 + 24), height: lines.length * lineHeight + 14, above: [], below: [], level: 0};
    });
    const boxOf = [];
    known.classes.forEach((members, index) => members.forEach((node) => (boxOf[node] = boxes[index])));
    const arrows = known.greater.map(({greater, smaller, blocks}) => ({way: [boxOf[greater], boxOf[smaller]], blocks}));
    setLevels(boxes, arrows);
    for (const {way} of arrows) {
        const [from, to] = way;
        for (let level = from.level + 1; level < to.level; ++level) {
            const stop = {lines: [], width: 4, height: 0, above: [], below: [], level};
            boxes.push(stop);
            way.splice(-1, 0, stop);
        }
        for (let i = 1; i < way.length; ++i) {
            way[i - 1].below.push(way[i]);
            way[i].above.push(way[i - 1]);
        }
    }
    return {boxes, arrows};
}

function setLevels(boxes, arrows) {
    const numAbove = new Map(boxes.map((box) => [box, 0]));
    const below = new Map(boxes.map((box) => [box, []]));
    for (const {way: [from, to]} of arrows) {
        below.get(from).push(to);
        numAbove.set(to, numAbove.get(to) + 1);
    }
    const waiting = boxes.filter((box) => numAbove.get(box) === 0);
    for (const box of waiting) { // grows while it is walked
        for (const next of below.get(box)) {
            next.level = Math.max(next.level, box.level + 1);
            numAbove.set(next, numAbove.get(next) - 1);
            if (numAbove.get(next) === 0) waiting.push(next);
        }
    }
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
        const bottom = y + Math.max(...level.map((box) => box.height));
        for (const box of level) {
            Object.assign(box, {x, y, bottom: box.lines.length > 0 ? y + box.height : bottom});
            x += box.width + boxGap;
        }
        y = bottom + levelGap;
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
    const {width, height} = place(boxes);
    const picture = draw("svg", {class: "graph", width, height, viewBox: `0 0 ${width} ${height}`, role: "img",
        "aria-label": "greater sizes stand above smaller ones"},
    draw("defs", {}, draw("marker", {id: "tip", viewBox: "0 0 8 8", refX: 8, refY: 4, markerWidth: 8, markerHeight: 8,
        orient: "auto"}, draw("path", {d: "M0 0L8 4L0 8Z", class: "tip"}))));
    const middle = (box) => box.x + box.width / 2;
    for (const {way, blocks} of arrows) {
        let line = `M${middle(way[0])} ${way[0].y}`;
        for (let i = 1; i < way.length; ++i) {
            const [from, to] = [way[i - 1], way[i]];
            const half = (from.bottom + to.y) / 2;
            line += `V${from.bottom}C${middle(from)} ${half} ${middle(to)} ${half} ${middle(to)} ${to.y}`;
        }
        const path = draw("path", {d: line, class: "arrow", "marker-end": "url(#tip)"});
        const [greater, smaller] = [way[0], way.at(-1)].map(({lines}) => lines[0].name);
        path.append(draw("title", {}, `${greater} > ${smaller}${blocks.length > 0 ? `, stated by ${blocks.join(", ")}` : ""}`));
        picture.append(path);
    }
    for (const box of boxes.filter(({lines}) => lines.length > 0)) {
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
