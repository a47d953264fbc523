// The page: what is chosen, its facts, and the tabs.
"use strict";

const byId = (id) => document.getElementById(id);
const model = new Model(JSON.parse(byId("data").textContent));

const tabs = ["map", "numbers", "types", "dimensions"];
let chosen = null; // {structure, depthFirst}, {type}, {refusal} or {isFacts}
let tab = "map";
let tabOfNodes = "map"; // to go back to from a type

const tree = new Tree(model, byId("tree"), choose);
const map = new ByteMap(model, byId("map"), byId("map-head"), byId("legend"), choose);
const numbers = new RowList(byId("numbers"), 26, drawNumbers);

function plural(count, what) {
    return `${count} ${what}${count === 1 ? "" : "s"}`;
}

/** A link that chooses something. */
function link(text, choice) {
    const button = make("button", "link", text);
    button.addEventListener("click", () => choose(choice));
    return button;
}

function linkToType(type) {
    if (type.structure !== undefined) return link(type.label, {structure: model.structures[type.structure], depthFirst: 0});
    return type.isDescribed ? link(type.label, {type}) : type.label;
}

function setFacts(title, sentence, facts) {
    byId("name").textContent = title;
    byId("sentence").replaceChildren(...[sentence].flat());
    byId("facts").replaceChildren(...facts.filter(([, value]) => value !== undefined && value !== "").map(([name, value]) =>
        make("div", "", make("dt", "", name), make("dd", "", ...[value].flat()))));
}

function showNode({structure, depthFirst}) {
    const node = model.node(structure, depthFirst);
    const {element} = node;
    if (!element) {
        const padding = structure.padding === 0 ? "no padding" : `${structure.padding} of them padding`;
        setFacts(structure.label, `${plural(structure.size, "byte")}, ${padding}; `
            + plural(Math.ceil(structure.size / cacheLine), "cache line"), [
            ["immediate elements", structure.elements.length],
            ["flat", structure.numFlat],
            ["raw", structure.numRaw],
            ["depth-first", structure.numDepthFirst],
        ]);
    } else {
        const type = model.types[element.type];
        const isInstance = node.sort === "structure" && element.width > 1;
        const notes = {array: `, ${element.width} of them`, leaf: "", structure: ""}[node.sort];
        setFacts(node.path, [(element.complex ? "complex " : ""), linkToType(type), notes, " in ",
            link(structure.label, {structure, depthFirst: 0})], [
            ["offset", node.offset],
            ["size", plural(node.size, "byte")],
            ["dimensions", isInstance || element.width === 1 ? undefined : element.dimensions.join(" by ")],
            ["depth-first", depthFirst],
            ["flat", node.flat],
            ["raw", node.raw && rawText(node.raw)],
            ["immediate", node.immediate],
            ["padding behind", element.padding || undefined],
            ["unit", element.unit],
            ["min", element.min],
            ["max", element.max],
            ["sampling", element.isFrameBased ? "frame" : undefined],
            ["dimensions mode", element.hasVariableDimensions ? "variable" : undefined],
            ["why it lies there", element.moved],
        ]);
    }
    map.show(structure, node);
    numbers.setCount(structure.numDepthFirst);
    numbers.reveal(depthFirst);
    showTypes(structure);
}

function rawText([first, last]) {
    return first === last ? String(first) : `${first}\u2013${last}`;
}

function drawNumbers(index) {
    const node = model.node(chosen.structure, index);
    const type = node.element ? model.typeText(node.element) : node.structure.label;
    const row = make("div", "row numbers");
    row.dataset.node = index;
    if (index === chosen.depthFirst) row.classList.add("chosen");
    const path = node.path === "" ? "(the structure)" : node.path;
    for (const value of [index, node.flat, node.raw && rawText(node.raw), node.immediate, node.offset, type, path])
        row.append(make("span", "", String(value ?? "")));
    row.lastChild.title = path;
    return row;
}

byId("numbers").addEventListener("click", (event) => {
    const row = event.target.closest("[data-node]");
    if (row) choose({structure: chosen.structure, depthFirst: Number(row.dataset.node)});
});

/** A table of all types that a structure is made of, nested ones included, with the elements that have them. */
function showTypes(structure) {
    const uses = new Map(); // type -> names of elements
    const seen = new Set();
    const waiting = [structure];
    while (waiting.length > 0) {
        const each = waiting.shift();
        if (seen.has(each)) continue;
        seen.add(each);
        for (const element of each.elements) {
            const type = model.types[element.type];
            if (!uses.has(type)) uses.set(type, []);
            uses.get(type).push(`${each.label}.${element.name}`);
            const nested = model.nested(element);
            if (nested) waiting.push(nested);
        }
    }
    const rows = [...uses].map(([type, names]) => [make("span", "", make("span", `swatch ${type.style}`), linkToType(type)),
        type.kind, plural(type.size, "byte"), some(names)]);
    byId("types").replaceChildren(table(["type", "what it is", "size", "elements"], rows));
}

function some(names) {
    const most = 12;
    return names.slice(0, most).join(", ") + (names.length > most ? ` and ${names.length - most} more` : "");
}

function table(heads, rows) {
    return make("table", "", make("thead", "", make("tr", "", ...heads.map((head) => make("th", "", head)))),
        make("tbody", "", ...rows.map((cells) => make("tr", "", ...cells.map((cell) => make("td", "", cell))))));
}

/** A type that is no structure. */
function showType({type}) {
    setFacts(type.label, type.target ? ["alias of ", linkToTarget(type.target)] : type.kind,
        [["size", plural(type.size, "byte")], ["storage", type.storage]]);
    const users = model.structures.flatMap((structure) => structure.elements
        .filter((element) => model.types[element.type] === type).map((element) => [structure, element]));
    const parts = [];
    if (type.members) {
        parts.push(make("h3", "", "Members"),
            table(["name", "value"], type.members.map(({name, value}) => [name, String(value)])));
    }
    parts.push(make("h3", "", users.length > 0 ? "Elements of this type" : "No element is of this type"));
    if (users.length > 0) {
        parts.push(table(["structure", "element"], users.slice(0, 1000).map(([structure, element]) => [
            link(structure.label, {structure, depthFirst: 0}),
            link(element.name, {structure, depthFirst: element.depthFirst})])));
    }
    byId("types").replaceChildren(...parts);
}

/** What one script states: the graph, and all facts in a table. */
function factsSection(known) {
    const rows = known.facts.map(({expression, blocks}) => [expression, blocks.join(", ")]);
    return [make("h3", "", known.source), drawGraph(known), table(["fact", "stated by"], rows)];
}

function linkToTarget(label) {
    const type = model.types.find((each) => each.label === label);
    return type ? linkToType(type) : label;
}

function showRefusal({refusal}) {
    setFacts(refusal.name, `cannot be expressed: ${refusal.reason}`, [["where", refusal.place]]);
    byId("types").replaceChildren();
}

function choose(choice) {
    const isNode = choice.structure !== undefined;
    const wasNode = chosen === null || chosen.structure !== undefined;
    chosen = choice;
    byId("tab-map").hidden = byId("tab-numbers").hidden = !isNode;
    byId("tab-types").hidden = !isNode && choice.type === undefined;
    byId("tab-types").textContent = isNode ? "Types used" : "Type";
    if (isNode) {
        tree.show(choice.structure, choice.depthFirst);
        showNode(choice);
        const {path} = model.node(choice.structure, choice.depthFirst);
        setHash(path === "" ? [choice.structure.label] : [choice.structure.label, path]);
        if (!wasNode && tab !== "dimensions") setTab(tabOfNodes);
    } else {
        tree.chosen = choice;
        tree.list.refresh();
        if (choice.type) showType(choice);
        else if (choice.refusal) showRefusal(choice);
        else setFacts("Dimension facts", "", []);
        if (choice.type) setHash([choice.type.label]);
        if (wasNode) tabOfNodes = tab;
        if (choice.isFacts) setTab("dimensions");
        else if (tab !== "dimensions") setTab("types");
    }
}

// --- The choice stands in the address, so that it can be linked to: #Outer:y(1).b

function setHash(parts) {
    const hash = "#" + parts.map(encodeURIComponent).join(":");
    if (decodeURIComponent(location.hash) !== decodeURIComponent(hash)) history.replaceState(null, "", hash);
}

function chooseFromHash() {
    let label = "";
    let path = "";
    try {
        [label, path = ""] = location.hash.slice(1).split(":").map(decodeURIComponent);
    } catch {
        // an address that is not ours
    }
    const structure = model.structures.find((each) => each.label === label);
    const node = structure && model.find(structure, path);
    if (node) return choose({structure, depthFirst: node.depthFirst});
    const type = model.types.find((each) => each.isDescribed && each.label === label);
    if (type) return choose({type});
    if (model.shown.length > 0) return choose({structure: model.structures[model.shown[0]], depthFirst: 0});
    const first = model.types.find((each) => each.isDescribed);
    if (first) choose({type: first});
    else if (model.data.dimensions) choose({isFacts: true});
    else if (model.data.refused.length > 0) choose({refusal: model.data.refused[0]});
}

// --- Tabs

function setTab(name) {
    tab = name;
    for (const each of tabs) {
        byId(`tab-${each}`).setAttribute("aria-selected", each === name);
        byId(`tab-${each}`).tabIndex = each === name ? 0 : -1;
        byId(`panel-${each}`).hidden = each !== name;
    }
    map.list.refresh();
    numbers.refresh();
    if (!chosen?.structure) return;
    numbers.reveal(chosen.depthFirst);
    map.list.reveal(Math.floor(map.selected.offset / 8));
}

for (const each of tabs) {
    byId(`tab-${each}`).addEventListener("click", () => setTab(each));
    byId(`tab-${each}`).addEventListener("keydown", ({key}) => {
        if (key !== "ArrowRight" && key !== "ArrowLeft") return;
        const visible = tabs.filter((one) => !byId(`tab-${one}`).hidden);
        const next = visible[(visible.indexOf(each) + (key === "ArrowRight" ? 1 : visible.length - 1)) % visible.length];
        setTab(next);
        byId(`tab-${next}`).focus();
    });
}

// --- Search

const search = new Search(model, (results, {isDone, isCut}) => {
    tree.terms = search.terms;
    tree.setResults(results);
    const count = plural(results.length, "result");
    byId("found").textContent = isCut ? `the first ${count}` : isDone ? count : `${count}, searching \u2026`;
});

let typing;
byId("search").addEventListener("input", () => {
    clearTimeout(typing);
    typing = setTimeout(() => {
        const text = byId("search").value.trim();
        if (text !== "") return search.start(text);
        search.stop();
        byId("found").textContent = "";
        tree.setResults(null);
        if (chosen.structure) tree.show(chosen.structure, chosen.depthFirst);
    }, 80);
});
byId("search").addEventListener("keydown", (event) => {
    if (event.key === "Escape" && byId("search").value !== "") {
        byId("search").value = "";
        byId("search").dispatchEvent(new Event("input"));
    } else if (event.key === "Enter" && tree.results?.length > 0) {
        tree.pick(tree.results[0]);
    } else if (event.key === "ArrowDown") {
        byId("tree").focus();
    } else {
        return;
    }
    event.preventDefault();
});
document.addEventListener("keydown", (event) => {
    if (event.key !== "/" || event.target === byId("search")) return;
    byId("search").focus();
    event.preventDefault();
});

document.title = `${model.data.title} \u2013 qltypes`;
byId("title").textContent = model.data.title;
byId("summary").textContent = model.data.summary;
byId("tab-dimensions").hidden = !model.data.dimensions;
byId("dimensions").append(...(model.data.dimensions ?? []).flatMap(factsSection));
setTab("map");
chooseFromHash();
window.addEventListener("hashchange", chooseFromHash);
