// Page building blocks: elements, messages, dialogs, busy buttons and the paged grid.
import { RequestError } from './api.js';

// el('tag.class', {attributes and on* handlers}, children...)
export function el(spec, props = {}, ...children) {
  const [tag, ...classes] = spec.split('.');
  const node = document.createElement(tag || 'div');
  if (classes.length) node.className = classes.join(' ');
  for (const [key, value] of Object.entries(props || {})) {
    if (value == null || value === false) continue;
    if (key.startsWith('on')) node.addEventListener(key.slice(2), value);
    else if (key === 'text') node.textContent = value;
    else if (key in node && typeof value !== 'string') node[key] = value;
    else node.setAttribute(key, value === true ? '' : value);
  }
  for (const child of children.flat(Infinity)) {
    if (child == null || child === false) continue;
    node.append(child instanceof Node ? child : document.createTextNode(String(child)));
  }
  return node;
}

let uid = 0;
export function nextId(prefix) {
  uid += 1;
  return `${prefix}-${uid}`;
}

// A labelled input: returns { row, input }. kind: text, password, number, email,
// checkbox, select (options: [[value, label]]), textarea.
export function input(label, name, { kind = 'text', value = '', options = [], hint, ...attrs } = {}) {
  const id = nextId(name);
  let control;
  if (kind === 'select') {
    control = el('select', { id, name, ...attrs },
      options.map(([v, l]) => el('option', { value: v, text: l, selected: String(v) === String(value) })));
  } else if (kind === 'textarea') {
    control = el('textarea', { id, name, ...attrs });
    control.value = value;
  } else {
    control = el('input', { id, name, type: kind, ...attrs });
    if (kind === 'checkbox') control.checked = Boolean(value);
    else control.value = value;
  }
  const hintNode = hint ? el('small.hint', { id: `${id}-hint`, text: hint }) : null;
  if (hintNode) control.setAttribute('aria-describedby', hintNode.id);
  const row = kind === 'checkbox'
    ? el('div.field.check', {}, control, el('label', { for: id, text: label }), hintNode)
    : el('div.field', {}, el('label', { for: id, text: label }), control, hintNode);
  return { row, input: control };
}

// A group of checkboxes, one per name, in a fieldset with its legend.
export function checklist(legend, names, checked = [], name = 'item') {
  const boxes = names.map((n) => {
    const id = nextId(name);
    const box = el('input', { type: 'checkbox', id, value: n, checked: checked.includes(n) });
    return { box, row: el('div.check', {}, box, el('label', { for: id, text: n })) };
  });
  const set = el('fieldset.checklist', {}, el('legend', { text: legend }),
    boxes.length ? boxes.map((b) => b.row) : el('p.muted', { text: 'None.' }));
  return { set, selected: () => boxes.filter((b) => b.box.checked).map((b) => b.box.value) };
}

// The message line of a section or dialog.
export function messageLine() {
  const node = el('p.msg', { role: 'status', 'aria-live': 'polite' });
  node.hidden = true;
  const show = (text, kind) => {
    node.textContent = text;
    node.className = `msg ${kind}`;
    node.setAttribute('role', kind === 'error' ? 'alert' : 'status');
    node.hidden = !text;
  };
  return {
    node,
    ok: (text) => show(text, 'ok'),
    error: (text) => show(text, 'error'),
    info: (text) => show(text, 'info'),
    clear: () => show('', ''),
  };
}

// A value the page itself refuses, with the message to show.
export class Refusal extends Error {}

export function describe(error) {
  if (error instanceof Refusal || error instanceof RequestError) return error.message;
  console.warn(error);
  return 'Something went wrong on the page; reload it and try again.';
}

// Runs fn while the buttons of the button's form or panel are disabled; a refusal
// or a failed request goes to the message line.
export async function busy(button, message, fn) {
  const scope = button.closest('form, dialog, .panel') || button;
  const buttons = Array.from(scope.querySelectorAll('button:not(:disabled)'));
  for (const b of buttons) b.disabled = true;
  scope.setAttribute('aria-busy', 'true');
  try {
    if (message) message.clear();
    return await fn();
  } catch (error) {
    if (message) message.error(describe(error));
    return undefined;
  } finally {
    for (const b of buttons) b.disabled = false;
    scope.removeAttribute('aria-busy');
  }
}

// A modal form. onSubmit(message) resolves to true to close the dialog.
export function formDialog({ title, body, submit = 'Save', onSubmit, danger = false }) {
  const message = messageLine();
  const submitButton = el(`button.${danger ? 'danger' : 'primary'}`, { type: 'submit', text: submit });
  const cancel = el('button', { type: 'button', text: 'Cancel', onclick: () => dialog.close() });
  const titleId = nextId('dialog-title');
  const form = el('form', { method: 'dialog', novalidate: true },
    el('h2', { id: titleId, text: title }),
    el('div.dialog-body', {}, body),
    message.node,
    el('div.buttons', {}, submitButton, cancel));
  const dialog = el('dialog', { 'aria-labelledby': titleId }, form);
  form.addEventListener('submit', async (event) => {
    event.preventDefault();
    const done = await busy(submitButton, message, () => onSubmit(message));
    if (done) dialog.close();
  });
  dialog.addEventListener('close', () => dialog.remove());
  document.body.append(dialog);
  dialog.showModal();
  const first = form.querySelector('input:not([type=hidden]), select, textarea');
  (first || submitButton).focus();
  return { dialog, message };
}

// Asks before something is removed; resolves to true when confirmed.
export function confirmDialog(title, text, action = 'Delete') {
  return new Promise((resolve) => {
    let confirmed = false;
    const { dialog } = formDialog({
      title, body: el('p', { text }), submit: action, danger: true,
      onSubmit: async () => { confirmed = true; return true; },
    });
    dialog.addEventListener('close', () => resolve(confirmed));
    dialog.querySelector('button.danger').focus();
  });
}

export function button(text, onclick, cls = '') {
  return el(`button${cls ? `.${cls}` : ''}`, { type: 'button', text, onclick });
}

// A panel: heading, optional tools, content.
export function panel(title, ...content) {
  return el('section.panel', {}, el('h2', { text: title }), ...content);
}

// A paged, searchable table. fetchPage({page, rp, query}) resolves to
// { rows: [{ key, cells: [...] }], total }. The state object outlives the grid, so
// paging and search stay as they were when the section is shown again.
export class Grid {
  constructor({ caption, columns, fetchPage, state, selectable = true, actions, search = true, message }) {
    Object.assign(this, { columns, fetchPage, state, selectable, actions, message });
    state.page ??= 1;
    state.rp ??= 10;
    state.query ??= '';
    this.selected = new Set();
    const searchInput = input('Search by name', 'search', { kind: 'search', value: state.query });
    this.searchInput = searchInput.input;
    const rpInput = input('Rows per page', 'rp', {
      kind: 'select', value: state.rp, options: [[10, '10'], [20, '20'], [50, '50'], [100, '100']],
    });
    rpInput.input.addEventListener('change', () => { state.rp = Number(rpInput.input.value); state.page = 1; this.load(); });
    const searchForm = el('form.search', { role: 'search', onsubmit: (e) => { e.preventDefault(); state.query = this.searchInput.value.trim(); state.page = 1; this.load(); } },
      searchInput.row, el('button', { type: 'submit', text: 'Search' }),
      el('button', { type: 'button', text: 'Clear', onclick: () => { this.searchInput.value = ''; state.query = ''; state.page = 1; this.load(); } }));
    this.body = el('tbody');
    this.head = el('thead', {}, el('tr', {},
      selectable ? el('th.select', { scope: 'col' }, el('span.sr', { text: 'Select' })) : null,
      columns.map((c) => el('th', { scope: 'col', text: c })),
      actions ? el('th', { scope: 'col' }, el('span.sr', { text: 'Actions' })) : null));
    this.pageInfo = el('span.page-info', { 'aria-live': 'polite' });
    this.prev = button('‹ Previous', () => { state.page -= 1; this.load(); });
    this.next = button('Next ›', () => { state.page += 1; this.load(); });
    this.first = button('« First', () => { state.page = 1; this.load(); });
    this.last = button('Last »', () => { state.page = this.pages; this.load(); });
    this.node = el('div.grid', {},
      el('div.grid-tools', {}, search ? searchForm : null, rpInput.row),
      el('div.table-wrap', {}, el('table', {}, el('caption.sr', { text: caption }), this.head, this.body)),
      el('nav.pager', { 'aria-label': `${caption} pages` }, this.first, this.prev, this.pageInfo, this.next, this.last));
  }

  selection() {
    return Array.from(this.selected);
  }

  async load() {
    const { state } = this;
    if (state.page < 1) state.page = 1;
    this.node.setAttribute('aria-busy', 'true');
    try {
      const { rows, total } = await this.fetchPage({ page: state.page, rp: state.rp, query: state.query });
      this.pages = Math.max(1, Math.ceil(total / state.rp));
      if (state.page > this.pages && total > 0) {
        state.page = this.pages;
        return this.load();
      }
      this.render(rows, total);
    } catch (error) {
      if (this.message) this.message.error(describe(error));
    } finally {
      this.node.removeAttribute('aria-busy');
    }
    return undefined;
  }

  render(rows, total) {
    const { state } = this;
    this.selected.clear();
    this.body.replaceChildren();
    const span = this.columns.length + (this.selectable ? 1 : 0) + (this.actions ? 1 : 0);
    if (!rows.length) {
      this.body.append(el('tr', {}, el('td.empty', { colspan: span, text: state.query ? `Nothing matches "${state.query}".` : 'Nothing here yet.' })));
    }
    for (const row of rows) {
      const cells = row.cells.map((text, i) => el('td', { 'data-label': this.columns[i], text }));
      let box = null;
      if (this.selectable) {
        box = el('input', { type: 'checkbox', 'aria-label': `Select ${row.key}`,
          onchange: () => (box.checked ? this.selected.add(row.key) : this.selected.delete(row.key)) });
      }
      this.body.append(el('tr', { 'data-key': row.key },
        this.selectable ? el('td.select', {}, box) : null,
        cells,
        this.actions ? el('td.actions', {}, this.actions(row)) : null));
    }
    this.pageInfo.textContent = `Page ${state.page} of ${this.pages} · ${total} in all`;
    this.prev.disabled = this.first.disabled = state.page <= 1;
    this.next.disabled = this.last.disabled = state.page >= this.pages;
  }
}

// Megabytes for people: 1877538 MB reads 1.79 TB.
export function megabytes(mb) {
  if (!mb) return '0 MB';
  const units = ['MB', 'GB', 'TB'];
  let value = mb;
  let unit = 0;
  while (value >= 1024 && unit < units.length - 1) { value /= 1024; unit += 1; }
  return `${value >= 100 || unit === 0 ? Math.round(value) : value.toFixed(1)} ${units[unit]}`;
}
