// A list of any number of rows of equal height, of which only those in sight exist.
"use strict";

/** Browsers do not scroll further than some ten million pixels: longer lists are scrolled in proportion. */
const mostPixels = 8_000_000;
/** Rows on paper. */
const mostPrinted = 2000;

class RowList {
    /** `draw(index)` makes the element of a row. */
    constructor(container, rowHeight, draw) {
        this.container = container;
        this.rowHeight = rowHeight;
        this.draw = draw;
        this.count = 0;
        this.sizer = document.createElement("div");
        this.sizer.className = "sizer";
        this.sizer.setAttribute("role", "presentation");
        container.replaceChildren(this.sizer);
        container.addEventListener("scroll", () => this.later());
        new ResizeObserver(() => this.later()).observe(container);
        for (const [event, isPrinted] of [["beforeprint", true], ["afterprint", false]]) {
            window.addEventListener(event, () => {
                this.isPrinted = isPrinted;
                this.refresh();
            });
        }
    }

    setCount(count) {
        this.count = count;
        this.sizer.style.height = `${Math.min(count * this.rowHeight, mostPixels)}px`;
        this.refresh();
    }

    later() {
        this.pending ??= requestAnimationFrame(() => this.refresh());
    }

    /** How many rows fit. */
    get inSight() {
        return Math.max(1, Math.floor(this.container.clientHeight / this.rowHeight));
    }

    /** The row at the upper edge, with its fraction. */
    get top() {
        const {scrollTop, clientHeight} = this.container;
        const all = this.count * this.rowHeight;
        if (all <= mostPixels) return scrollTop / this.rowHeight;
        return ((scrollTop / (mostPixels - clientHeight)) * (all - clientHeight)) / this.rowHeight;
    }

    set top(row) {
        const {clientHeight} = this.container;
        const all = this.count * this.rowHeight;
        const pixels = row * this.rowHeight;
        this.container.scrollTop = all <= mostPixels ? pixels : (pixels / (all - clientHeight)) * (mostPixels - clientHeight);
    }

    /** Scrolls as little as brings a row into sight, with some rows around it, or to the middle where it is far away. */
    reveal(row) {
        const top = this.top;
        const fitting = this.container.clientHeight / this.rowHeight;
        const around = Math.min(2, (fitting - 1) / 2);
        if (row - around >= top && row + 1 + around <= top + fitting) return;
        const isNear = row > top - fitting && row < top + 2 * fitting;
        if (!isNear) this.top = Math.max(0, row - Math.floor(fitting / 2));
        else this.top = row - around < top ? Math.max(0, row - around) : row + 1 + around - fitting;
        this.refresh();
    }

    refresh() {
        if (this.pending !== undefined) cancelAnimationFrame(this.pending);
        this.pending = undefined;
        const {scrollTop, clientHeight} = this.container;
        if (clientHeight === 0 && !this.isPrinted) return; // not in sight
        const top = this.top;
        const first = this.isPrinted ? 0 : Math.max(0, Math.floor(top) - 2);
        const end = this.isPrinted ? Math.min(this.count, mostPrinted)
            : Math.min(this.count, Math.ceil(top + clientHeight / this.rowHeight) + 2);
        const rows = [];
        for (let i = first; i < end; ++i) {
            const row = this.draw(i);
            row.style.transform = `translateY(${Math.round(scrollTop + (i - top) * this.rowHeight)}px)`;
            rows.push(row);
        }
        this.sizer.replaceChildren(...rows);
    }
}

/** An element of a class, with a text or children. */
function make(tag, className, ...children) {
    const element = document.createElement(tag);
    if (className) element.className = className;
    element.append(...children);
    return element;
}
