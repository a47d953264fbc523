// The types as data, and the nodes of a structure by their depth-first index.
//
// Only the immediate elements of each structure are stored, with the numbers that the library gave. A node anywhere below
// is found by going down from one structure to the next, so that no size of a structure costs memory here.
"use strict";

class Model {
    constructor(data) {
        this.data = data;
        this.types = data.types;
        this.structures = data.structures;
        this.shown = data.shown;
        for (const structure of this.structures) {
            for (const element of structure.elements) {
                element.dimensions ??= [1];
                element.width = element.dimensions.reduce((product, dimension) => product * dimension, 1);
                element.padding ??= 0;
            }
        }
        for (const type of this.types) type.index = this.types.indexOf(type);
    }

    /** The structure that an element's values are, or null. */
    nested(element) {
        const index = this.types[element.type].structure;
        return index === undefined ? null : this.structures[index];
    }

    typeText(element) {
        return (element.complex ? "complex " : "") + this.types[element.type].label;
    }

    /** "y[2]". */
    static nameText(element) {
        const isOne = element.dimensions.length === 1 && element.dimensions[0] === 1;
        return element.name + (isOne ? "" : element.dimensions.map((dimension) => `[${dimension}]`).join(""));
    }

    /** The last element whose `key` is not beyond a value. */
    static lastNotBeyond(elements, key, value) {
        let low = 0;
        let high = elements.length - 1;
        while (low < high) {
            const middle = (low + high + 1) >> 1;
            if (elements[middle][key] <= value) low = middle;
            else high = middle - 1;
        }
        return low;
    }

    /** A node of a structure: what it is, where it lies, its numbers. */
    node(structure, depthFirst) {
        const root = {sort: "structure", structure, depthFirst: 0, path: "", name: structure.label, offset: 0,
            size: structure.size, width: 1, numChildren: structure.elements.length, typeStructure: structure, chain: []};
        if (depthFirst === 0) return root;
        let around = structure;
        let at = {depthFirst: 0, flat: 0, raw: 0, offset: 0};
        let path = "";
        const chain = []; // depth-first indices of the nodes around
        for (;;) {
            const index = Model.lastNotBeyond(around.elements, "depthFirst", depthFirst - at.depthFirst);
            const element = around.elements[index];
            const nested = this.nested(element);
            const here = {depthFirst: at.depthFirst + element.depthFirst, flat: at.flat + element.flat,
                raw: at.raw + element.raw, offset: at.offset + element.offset};
            const node = {sort: "leaf", structure, depthFirst, path: path + element.name, name: element.name, element,
                parent: around, index, offset: here.offset, size: element.size, width: element.width, numChildren: 0,
                typeStructure: nested, chain: [...chain]};
            if (chain.length === 0) node.immediate = index;
            if (!nested) {
                node.flat = here.flat;
                node.raw = [here.raw, here.raw + element.width * (element.complex ? 2 : 1) - 1];
                return node;
            }
            let name = element.name;
            if (element.width > 1) {
                if (here.depthFirst === depthFirst) return {...node, sort: "array", numChildren: element.width};
                chain.push(here.depthFirst);
                const instance = Math.floor((depthFirst - here.depthFirst - 1) / nested.numDepthFirst);
                here.depthFirst += 1 + instance * nested.numDepthFirst;
                here.flat += instance * nested.numFlat;
                here.raw += instance * nested.numRaw;
                here.offset += instance * nested.size;
                name = `${element.name}(${instance})`;
            }
            if (here.depthFirst === depthFirst) {
                const own = {...node, sort: "structure", path: path + name, name, offset: here.offset, width: 1,
                    size: nested.size, numChildren: nested.elements.length, chain: [...chain]};
                if (element.width > 1) delete own.immediate;
                return own;
            }
            chain.push(here.depthFirst);
            path += name + ".";
            at = here;
            around = nested;
        }
    }

    /** The depth-first index of a child by its position. */
    child(node, position) {
        if (node.sort === "array") return node.depthFirst + 1 + position * node.typeStructure.numDepthFirst;
        return node.depthFirst + node.typeStructure.elements[position].depthFirst;
    }

    /** The node of a path such as "y(1).b", or null. */
    find(structure, path) {
        let node = this.node(structure, 0);
        if (path === "") return node;
        for (const step of path.split(".")) {
            const [, name, instance] = /^([^(]*)(?:\((\d+)\))?$/.exec(step) ?? [];
            const position = node.sort === "structure"
                ? node.typeStructure.elements.findIndex((element) => element.name === name) : -1;
            if (position < 0) return null;
            node = this.node(structure, this.child(node, position));
            if (instance === undefined) continue;
            if (node.sort !== "array" || Number(instance) >= node.width) return null;
            node = this.node(structure, this.child(node, Number(instance)));
        }
        return node;
    }

    /** What lies in the bytes [from, to) of one row, in order: leaves and padding, and the structures around all of them. */
    row(structure, from, to) {
        let around = structure;
        let base = 0;
        let depthFirst = 0;
        let path = "";
        const nests = [];
        for (;;) {
            const index = Model.lastNotBeyond(around.elements, "offset", from - base);
            const element = around.elements[index];
            const nested = this.nested(element);
            const offset = base + element.offset;
            if (!nested || from >= offset + element.size) return {nests, parts: this.parts(around, base, depthFirst, path, index, from, to)};
            const instance = Math.floor((from - offset) / nested.size);
            const isArray = element.width > 1;
            const name = isArray ? `${element.name}(${instance})` : element.name;
            depthFirst += element.depthFirst + (isArray ? 1 + instance * nested.numDepthFirst : 0);
            base = offset + instance * nested.size;
            path += name + ".";
            nests.push({name, type: this.types[element.type].label, depthFirst, offset: base, end: base + nested.size});
            around = nested;
        }
    }

    parts(structure, base, depthFirst, path, first, from, to) {
        const parts = [];
        for (let i = first; i < structure.elements.length; ++i) {
            const element = structure.elements[i];
            const start = base + element.offset;
            if (start >= to) break;
            const end = start + element.size;
            if (end > from && !this.nested(element)) // a nested one has whole rows of its own
                parts.push({start, end, element, path: path + element.name, depthFirst: depthFirst + element.depthFirst});
            if (element.padding > 0 && end + element.padding > from && end < to)
                parts.push({start: end, end: end + element.padding, isPadding: true, path, depthFirst: depthFirst + element.depthFirst});
        }
        return parts;
    }

    /** The deepest nesting below a structure. */
    depth(structure) {
        if (structure.depth === undefined) {
            const stack = [[structure, 0]];
            structure.depth = 0;
            const best = new Map();
            while (stack.length > 0) {
                const [each, depth] = stack.pop();
                if ((best.get(each) ?? -1) >= depth) continue;
                best.set(each, depth);
                structure.depth = Math.max(structure.depth, depth);
                for (const element of each.elements) {
                    const nested = this.nested(element);
                    if (nested) stack.push([nested, depth + 1]);
                }
            }
        }
        return structure.depth;
    }
}
