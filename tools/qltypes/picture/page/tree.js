// The tree of structures, nodes and other types, and the results of a search in its place.
//
// Only opened nodes are kept, each with its opened children and the number of rows that it takes: a row is found by going
// down, however many rows there are.
"use strict";

class Tree {
    constructor(model, container, choose) {
        this.model = model;
        this.choose = choose;
        this.container = container;
        this.roots = this.makeRoots();
        this.results = null; // of a search, in place of the tree
        this.active = 0;
        this.list = new RowList(container, 26, (index) => this.draw(index));
        container.addEventListener("click", (event) => this.click(event));
        container.addEventListener("keydown", (event) => this.press(event));
        this.recount();
    }

    makeRoots() {
        const {model} = this;
        const heading = (text) => ({sort: "heading", text, rows: 1, opened: new Map(), numChildren: 0, depth: 0});
        const roots = [];
        const structures = model.shown.map((index) => model.structures[index]);
        if (structures.length > 0) roots.push(heading(`Structures (${structures.length})`));
        for (const structure of structures) roots.push(this.entry(structure, 0, 0, null));
        const others = model.types.filter((type) => type.isDescribed);
        if (others.length > 0) roots.push(heading(`Other types (${others.length})`));
        for (const type of others) roots.push({sort: "type", type, rows: 1, opened: new Map(), numChildren: 0, depth: 0});
        if (model.data.refused.length > 0) roots.push(heading(`Not expressible (${model.data.refused.length})`));
        for (const refusal of model.data.refused)
            roots.push({sort: "refusal", refusal, rows: 1, opened: new Map(), numChildren: 0, depth: 0});
        return roots;
    }

    entry(structure, depthFirst, depth, parent) {
        const node = this.model.node(structure, depthFirst);
        return {sort: "node", node, depth, parent, isOpen: false, rows: 1, opened: new Map(), numChildren: node.numChildren};
    }

    /** The entry of a row. */
    at(row) {
        if (this.results) return this.results[row];
        const children = this.roots;
        for (const root of children) {
            if (row < root.rows) return this.within(root, row);
            row -= root.rows;
        }
        return null;
    }

    within(entry, row) {
        while (row > 0) {
            --row;
            let position = 0; // of the child at the row
            let inside = null;
            for (const [at, child] of [...entry.opened].sort(([one], [other]) => one - other)) {
                const before = at - position;
                if (row < before) break;
                row -= before;
                if (row < child.rows) {
                    inside = child;
                    break;
                }
                row -= child.rows;
                position = at + 1;
            }
            if (!inside) return this.childEntry(entry, position + row);
            entry = inside;
        }
        return entry;
    }

    /** The entry of a child, the kept one if it is open. */
    childEntry(entry, position) {
        const kept = entry.opened.get(position);
        if (kept) return kept;
        const child = this.entry(entry.node.structure, this.model.child(entry.node, position), entry.depth + 1, entry);
        child.position = position;
        return child;
    }

    /** The row of an entry whose ancestors are open. */
    rowOf(entry) {
        if (!entry.parent) {
            let row = 0;
            for (const root of this.roots) {
                if (root === entry) return row;
                row += root.rows;
            }
        }
        let row = this.rowOf(entry.parent) + 1 + entry.position;
        for (const [position, child] of entry.parent.opened) {
            if (position < entry.position) row += child.rows - 1;
        }
        return row;
    }

    setOpen(entry, isOpen) {
        if (entry.numChildren === 0 || entry.isOpen === isOpen) return;
        entry.isOpen = isOpen;
        entry.opened.clear();
        if (entry.parent) {
            if (isOpen) entry.parent.opened.set(entry.position, entry);
            else entry.parent.opened.delete(entry.position);
        }
        const change = (isOpen ? 1 + entry.numChildren : 1) - entry.rows;
        for (let each = entry; each; each = each.parent) each.rows += change;
        this.recount();
    }

    recount() {
        const count = this.results ? this.results.length : this.roots.reduce((sum, root) => sum + root.rows, 0);
        this.list.setCount(count);
    }

    /** Opens the way to a node and marks it. */
    show(structure, depthFirst) {
        this.chosen = {structure, depthFirst};
        if (this.results) {
            this.list.refresh();
            return;
        }
        let entry = this.roots.find((root) => root.sort === "node" && root.node.structure === structure);
        if (!entry) {
            this.list.refresh();
            return;
        }
        const node = this.model.node(structure, depthFirst);
        for (const next of [...node.chain, depthFirst]) {
            if (next === 0) break;
            this.setOpen(entry, true);
            entry = this.childEntry(entry, this.positionOf(entry.node, next));
        }
        this.active = this.rowOf(entry);
        this.list.reveal(this.active);
        this.list.refresh();
    }

    positionOf(node, depthFirst) {
        if (node.sort === "array") return Math.floor((depthFirst - node.depthFirst - 1) / node.typeStructure.numDepthFirst);
        return Model.lastNotBeyond(node.typeStructure.elements, "depthFirst", depthFirst - node.depthFirst);
    }

    /** Shows results, which may grow, or the tree again where there are none. */
    setResults(results) {
        if (this.results !== results) {
            this.results = results;
            this.active = 0;
            this.list.top = 0;
        }
        this.recount();
    }

    draw(index) {
        const entry = this.at(index);
        const row = make("div", "row entry");
        row.id = `entry-${index}`;
        row.dataset.row = index;
        row.setAttribute("role", entry.sort === "heading" ? "presentation" : "treeitem");
        if (index === this.active) {
            row.classList.add("active");
            this.container.setAttribute("aria-activedescendant", row.id);
        }
        if (entry.sort === "heading") row.classList.add("heading");
        row.style.paddingLeft = `${8 + Math.min(entry.depth ?? 0, 24) * 14}px`;
        if (entry.sort === "heading") row.append(entry.text);
        else if (entry.sort === "type") this.fillType(row, entry);
        else if (entry.sort === "refusal") row.append(make("span", "twisty"), make("span", "name", entry.refusal.name));
        else this.fillNode(row, entry);
        return row;
    }

    fillType(row, {type, isResult}) {
        row.append(make("span", "twisty"), make("span", `swatch ${type.style}`),
            make("span", "name", ...(isResult ? marked(type.label, this.terms) : [type.label])),
            make("span", "type", type.kind));
        if (this.chosen?.type === type) row.classList.add("chosen");
    }

    fillNode(row, entry) {
        const {node} = entry;
        const isOpenable = entry.numChildren > 0 && !entry.isResult;
        row.setAttribute("aria-level", entry.depth + 1);
        if (isOpenable) row.setAttribute("aria-expanded", entry.isOpen);
        if (this.chosen?.structure === node.structure && this.chosen.depthFirst === node.depthFirst) {
            row.classList.add("chosen");
            row.setAttribute("aria-selected", "true");
        }
        row.append(make("span", "twisty", isOpenable ? (entry.isOpen ? "\u25be" : "\u25b8") : ""));
        const style = node.element ? this.model.types[node.element.type].style : "structure";
        row.append(make("span", `swatch ${style}`));
        if (entry.isResult) {
            const {label} = node.structure;
            if (node.path !== "") row.append(make("span", "around", ...marked(`${label}.`, this.terms)));
            row.append(make("span", "name", ...marked(node.path || label, this.terms)));
            row.title = node.path === "" ? label : `${label}.${node.path}`;
        } else {
            const isInstance = node.element && node.sort === "structure" && node.element.width > 1;
            row.append(make("span", "name", node.element && !isInstance ? Model.nameText(node.element) : node.name));
        }
        if (!entry.isResult || !node.element)
            row.append(make("span", "type", node.element ? this.model.typeText(node.element) : `${node.size} bytes`));
        if (node.element) row.append(make("span", "offset", String(node.offset)));
    }

    click(event) {
        const row = event.target.closest(".entry");
        if (!row) return;
        this.active = Number(row.dataset.row);
        const entry = this.at(this.active);
        if (event.target.classList.contains("twisty") && entry.numChildren > 0 && !entry.isResult)
            this.setOpen(entry, !entry.isOpen);
        else this.pick(entry);
    }

    pick(entry) {
        if (entry.sort === "node") this.choose({structure: entry.node.structure, depthFirst: entry.node.depthFirst});
        else if (entry.sort === "type") this.choose({type: entry.type});
        else if (entry.sort === "refusal") this.choose({refusal: entry.refusal});
    }

    press(event) {
        const entry = this.at(this.active);
        const page = this.list.inSight - 1;
        const moves = {ArrowDown: 1, ArrowUp: -1, PageDown: page, PageUp: -page, Home: -Infinity, End: Infinity};
        if (event.key in moves) {
            this.move(moves[event.key]);
        } else if (event.key === "ArrowRight" && entry?.numChildren > 0 && !entry.isResult) {
            if (entry.isOpen) this.move(1);
            else this.setOpen(entry, true);
        } else if (event.key === "ArrowLeft" && entry && !entry.isResult) {
            if (entry.isOpen) this.setOpen(entry, false);
            else if (entry.parent) this.move(this.rowOf(entry.parent) - this.active);
        } else if ((event.key === "Enter" || event.key === " ") && entry) {
            this.pick(entry);
        } else {
            return;
        }
        event.preventDefault();
    }

    move(by) {
        this.active = Math.max(0, Math.min(this.list.count - 1, this.active + by));
        this.list.reveal(this.active);
        this.list.refresh();
    }
}

/** A text with all occurrences of some terms marked. */
function marked(text, terms) {
    const parts = [];
    const small = text.toLowerCase();
    let from = 0;
    while (from < text.length) {
        let best = null;
        for (const term of terms) {
            const at = small.indexOf(term, from);
            if (at >= 0 && (!best || at < best.at)) best = {at, end: at + term.length};
        }
        if (!best) break;
        parts.push(text.slice(from, best.at), make("mark", "", text.slice(best.at, best.end)));
        from = best.end;
    }
    parts.push(text.slice(from));
    return parts;
}

/**
 * Looks for nodes and types whose path or type has all words, a slice at a time so that typing is never held up.
 * Ends at `most` results and at a number of nodes looked at.
 */
class Search {
    static most = 1000;
    static mostLookedAt = 500_000;

    constructor(model, report) {
        this.model = model;
        this.report = report; // called with results and whether more may come
    }

    start(text) {
        clearTimeout(this.timer);
        this.terms = text.toLowerCase().split(/\s+/).filter(Boolean);
        this.results = [];
        this.numLookedAt = 0;
        this.steps = this.walk();
        this.go();
    }

    stop() {
        clearTimeout(this.timer);
    }

    go() {
        const end = performance.now() + 12;
        let isDone = false;
        while (!isDone && performance.now() < end) {
            for (let i = 0; i < 200 && !isDone; ++i) isDone = this.steps.next().done || this.results.length >= Search.most;
        }
        const isCut = this.results.length >= Search.most || this.numLookedAt >= Search.mostLookedAt;
        this.report(this.results, {isDone, isCut});
        if (!isDone) this.timer = setTimeout(() => this.go(), 0);
    }

    /** Whether all words are there, one of them reaching into what begins at `own`: no node is found by its parents alone. */
    matches(text, own) {
        return this.terms.every((term) => text.includes(term))
            && this.terms.some((term) => text.lastIndexOf(term) + term.length > own);
    }

    *walk() {
        const {model} = this;
        for (const type of model.types) {
            if (type.isDescribed && this.matches(`${type.label} ${type.kind}`.toLowerCase(), 0))
                this.results.push({sort: "type", type, depth: 0, numChildren: 0, isResult: true});
        }
        for (const index of model.shown) {
            const structure = model.structures[index];
            const count = structure.numDepthFirst;
            for (let i = 0; i < count; ++i) {
                if (++this.numLookedAt > Search.mostLookedAt) return;
                const node = model.node(structure, i);
                const type = node.element ? model.typeText(node.element) : "";
                const path = node.path === "" ? structure.label : `${structure.label}.${node.path}`;
                if (this.matches(`${path} ${type}`.toLowerCase(), path.length - node.name.length))
                    this.results.push({sort: "node", node, depth: 0, numChildren: 0, isResult: true});
                yield;
            }
        }
    }
}
