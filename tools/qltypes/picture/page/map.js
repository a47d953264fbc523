// The bytes of a structure in rows of eight, of which only those in sight exist.
"use strict";

const cacheLine = 64;
const mostNestColumns = 5;

class ByteMap {
    constructor(model, container, head, legend, choose) {
        this.model = model;
        this.head = head;
        this.legend = legend;
        this.list = new RowList(container, 38, (index) => this.draw(index));
        container.addEventListener("click", (event) => {
            const part = event.target.closest("[data-node]");
            if (part) choose({structure: this.structure, depthFirst: Number(part.dataset.node)});
        });
        container.addEventListener("keydown", (event) => {
            const page = this.list.inSight;
            const moves = {ArrowDown: 1, ArrowUp: -1, PageDown: page, PageUp: -page};
            if (!(event.key in moves)) return;
            this.list.top = Math.max(0, this.list.top + moves[event.key]);
            event.preventDefault();
        });
    }

    /** Shows a structure with one node marked. */
    show(structure, node) {
        this.selected = node;
        if (this.structure !== structure) {
            this.structure = structure;
            this.numColumns = Math.min(this.model.depth(structure), mostNestColumns);
            this.drawHead();
            this.drawLegend();
            this.list.top = 0;
            this.list.setCount(Math.ceil(structure.size / 8));
        }
        this.list.reveal(Math.floor(node.offset / 8));
        this.list.refresh();
    }

    drawHead() {
        const nests = make("span", "nests");
        nests.style.setProperty("--columns", this.numColumns);
        const cells = make("span", "cells");
        for (let byte = 0; byte < 8; ++byte) cells.append(make("span", "byte", `+${byte}`));
        this.head.replaceChildren(make("span", "at", "offset"), nests, cells, make("span", "line-name"));
    }

    drawLegend() {
        const kinds = new Map();
        const seen = new Set();
        const stack = [this.structure];
        let hasPadding = false;
        while (stack.length > 0) {
            const structure = stack.pop();
            if (seen.has(structure)) continue;
            seen.add(structure);
            for (const element of structure.elements) {
                hasPadding ||= element.padding > 0;
                const nested = this.model.nested(element);
                if (nested) stack.push(nested);
                else kinds.set(this.model.types[element.type].style, this.model.types[element.type].styleName);
            }
        }
        const items = [...kinds].map(([style, name]) => make("span", "key", make("span", `swatch ${style}`), name));
        if (hasPadding) items.push(make("span", "key", make("span", "swatch padding"), "padding"));
        items.push(make("span", "key", make("span", "swatch line"), "start of a cache line (64 bytes)"));
        this.legend.replaceChildren(...items);
    }

    draw(index) {
        const from = index * 8;
        const {nests, parts} = this.model.row(this.structure, from, from + 8);
        const row = make("div", "row bytes");
        const isLine = from % cacheLine === 0;
        if (isLine) row.classList.add("starts-line");
        row.append(make("span", "at", String(from)), this.drawNests(nests, from, isLine));
        const cells = make("span", "cells");
        for (const part of parts) this.drawPart(cells, part, from, isLine);
        row.append(cells, make("span", "line-name", isLine ? `line ${from / cacheLine}` : ""));
        return row;
    }

    // Where there are more levels than columns the innermost ones are shown.
    drawNests(nests, from, isLine) {
        const columns = make("span", "nests");
        columns.style.setProperty("--columns", this.numColumns);
        const shown = nests.slice(-mostNestColumns);
        shown.forEach((nest, column) => {
            const cell = make("span", "nest");
            cell.style.gridColumn = column === shown.length - 1 ? `${column + 1} / -1` : `${column + 1}`;
            cell.dataset.node = nest.depthFirst;
            cell.title = `${nest.name}: ${nest.type}\noffset ${nest.offset}, ${nest.end - nest.offset} bytes`;
            if (nest.offset === from) cell.classList.add("starts");
            if (nest.end === from + 8) cell.classList.add("ends");
            if (nest.offset === from || isLine) cell.append(make("b", "", nest.name), make("i", "", nest.type));
            if (this.isSelected(nest.offset, nest.end)) cell.classList.add("selected");
            columns.append(cell);
        });
        return columns;
    }

    isSelected(start, end) {
        const {offset, size, depthFirst} = this.selected;
        return depthFirst > 0 && start >= offset && end <= offset + size;
    }

    drawPart(cells, part, from, isLine) {
        const first = Math.max(part.start, from);
        const end = Math.min(part.end, from + 8);
        const type = part.isPadding ? null : this.model.types[part.element.type];
        const cell = make("span", `part ${part.isPadding ? "padding" : type.style}`);
        cell.style.left = `${(first - from) * 12.5}%`;
        cell.style.width = `${(end - first) * 12.5}%`;
        cell.dataset.node = part.depthFirst;
        if (part.start >= from) cell.classList.add("starts");
        if (part.end <= from + 8) cell.classList.add("ends");
        if (part.start > from) cell.classList.add("inner");
        // The row above holds bytes of the same part from here on.
        const sameAbove = Math.min(end, Math.max(first, part.start + 8));
        if (sameAbove > first) {
            const edge = make("span", "upper");
            edge.style.width = `${((sameAbove - first) / (end - first)) * 100}%`;
            cell.append(edge);
        }
        if (part.isPadding) {
            cell.title = `(padding)\noffset ${part.start}, ${part.end - part.start} bytes`;
            cell.append(make("span", "unused", `${part.end - part.start} unused`));
        } else {
            const name = Model.nameText(part.element);
            const typeText = this.model.typeText(part.element);
            cell.title = `${part.path}: ${typeText}\noffset ${part.start}, ${part.end - part.start} bytes`;
            if (this.hasText(part, from) || (isLine && first === from && end - first >= 4))
                cell.append(make("b", "", name), make("i", "", typeText));
            this.drawValues(cell, part, from, first, end);
            if (this.isSelected(part.start, part.end)) cell.classList.add("selected");
        }
        cells.append(cell);
    }

    // Name and type stand in the wider of the first two rows.
    hasText(part, from) {
        const inFirst = Math.min(part.end, part.start - (part.start % 8) + 8) - part.start;
        const inSecond = Math.min(part.end - part.start - inFirst, 8);
        return inSecond > inFirst ? part.start < from && part.start >= from - 8 : part.start >= from;
    }

    // Marks between the values of an array.
    drawValues(cell, part, from, first, end) {
        const valueSize = (part.end - part.start) / part.element.width;
        if (part.element.width === 1 || valueSize >= 8) return;
        const next = part.start + Math.ceil((first - part.start) / valueSize) * valueSize;
        for (let byte = next; byte < end; byte += valueSize) {
            if (byte === first) continue;
            const tick = make("span", "tick");
            tick.style.left = `${((byte - first) / (end - first)) * 100}%`;
            cell.append(tick);
        }
    }
}
