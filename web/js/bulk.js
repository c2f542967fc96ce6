// Bulk: numbered users, and users or groups imported from a file. The device
// creates them in the background; this page polls the creation status and counts
// the new accounts as they appear, to draw the progress bar and the result list.
import { send, upload, field, fields, accounts, CGI } from './api.js';
import { el, input, checklist, messageLine, button, panel, busy, Refusal } from './ui.js';
import { checkName, checkPassword } from './rules.js';

export const title = 'Bulk';

const sleep = (ms) => new Promise((resolve) => { setTimeout(resolve, ms); });

// Numbered names as the device forms them: the width is the first number's text length.
export function numberedNames(prefix, startText, count) {
  const start = Number(startText);
  return Array.from({ length: count }, (_, i) => `${prefix}${String(start + i).padStart(startText.length, '0')}`);
}

// A progress bar with its label and the result list under it.
function progressView(label) {
  const bar = el('progress', { max: 1, value: 0, 'aria-label': label });
  const text = el('p', { 'aria-live': 'polite' });
  const results = el('div');
  return { node: el('div.progress', {}, bar, text, results), bar, text, results };
}

// Polls until the run is over; resolves to the names created and not created.
async function follow({ ftype, names, kind, before, view }) {
  view.bar.max = names.length || 1;
  view.bar.value = 0;
  view.results.replaceChildren();
  const started = Date.now();
  let seenRunning = false;
  for (;;) {
    const { xml } = await send('cgi_get_create_status', { ftype });
    const status = field(xml, 'status');
    const now = new Set((await accounts())[kind]);
    const created = names.filter((n) => now.has(n) && !before.has(n));
    view.bar.value = created.length;
    view.text.textContent = `${created.length} of ${names.length} created…`;
    if (status === '-1') seenRunning = true;
    // The run starts in the background: until it has been seen running, an old
    // status is not its result.
    const over = status !== '-1' && (seenRunning || created.length === names.length || Date.now() - started > 8000);
    if (over) {
      view.bar.value = view.bar.max;
      const failed = names.filter((n) => !created.includes(n));
      view.text.textContent = failed.length
        ? `Done: ${created.length} of ${names.length} created; ${failed.length} could not be created.`
        : `Done: all ${names.length} created.`;
      view.results.replaceChildren(el('ul.results', { 'aria-label': 'Results' },
        names.map((n) => el(`li.${created.includes(n) ? 'created' : 'failed'}`, { text: `${n}: ${created.includes(n) ? 'created' : (before.has(n) ? 'already exists' : 'not created')}` }))));
      return { created, failed };
    }
    await sleep(500);
  }
}

export function render(view) {
  view.append(batchPanel(), importPanel(), groupImportPanel());
}

function batchPanel() {
  const message = messageLine();
  const prefix = input('Name prefix', 'f_prefix', { maxlength: 15, hint: 'At most 15 characters, e.g. "student".' });
  const start = input('First number', 'f_start', { value: '1', maxlength: 15, inputmode: 'numeric', hint: 'Its width pads the numbers: 01 gives 01, 02, … 10.' });
  const count = input('How many', 'f_number', { kind: 'number', value: '10', min: 1, max: 999 });
  const pw = input('Password for all', 'f_batch_pw', { kind: 'password', autocomplete: 'new-password', maxlength: 127 });
  const again = input('Password again', 'f_batch_pw2', { kind: 'password', autocomplete: 'new-password', maxlength: 127 });
  const overwrite = input('Overwrite accounts that exist', 'f_overwrite', { kind: 'checkbox' });
  const groupsHolder = el('div');
  let groupBoxes = checklist('Groups', []);
  accounts().then(({ groups }) => {
    groupBoxes = checklist('Groups', groups, [], 'batch-group');
    groupsHolder.replaceChildren(groupBoxes.set);
  }).catch(() => message.error('The device cannot be reached.'));
  const progress = progressView('Creation of the numbered users');
  progress.node.hidden = true;
  const submit = el('button.primary', { type: 'submit', text: 'Create users' });
  const form = el('form', { novalidate: true }, prefix.row, start.row, count.row, pw.row, again.row, groupsHolder, overwrite.row,
    el('div.buttons', {}, submit), message.node, progress.node);
  form.addEventListener('submit', (event) => {
    event.preventDefault();
    busy(submit, message, async () => {
      const p = prefix.input.value.trim();
      const s = start.input.value.trim();
      const n = Number(count.input.value);
      if (!p) throw new Refusal('Enter a name prefix.');
      if (!/^\d{1,15}$/.test(s)) throw new Refusal('The first number is made of digits only.');
      if (!Number.isInteger(n) || n < 1 || n > 999) throw new Refusal('Create from 1 to 999 users at a time.');
      const names = numberedNames(p, s, n);
      for (const name of [names[0], names[names.length - 1]]) checkName('user', name);
      checkPassword(pw.input.value, again.input.value);
      if (/[\t\n\r]/.test(pw.input.value)) throw new Refusal('The password may not contain a tab or a line break.');
      const before = new Set((await accounts()).users);
      await send('cgi_user_batch_create', {
        f_prefix: p, f_start: s, f_number: n, f_batch_pw: pw.input.value, group_list: groupBoxes.selected().join(','),
        f_overwrite: overwrite.input.checked ? 1 : 0, app: 'web',
      });
      progress.node.hidden = false;
      const { failed } = await follow({ ftype: 'bUser', names, kind: 'users', before, view: progress });
      if (failed.length) message.error(`${failed.length} of ${names.length} users could not be created.`);
      else message.ok(`${names.length} users created.`);
    });
  });
  return panel('Numbered users', form);
}

function importList(title) {
  const list = el('div');
  return {
    node: list,
    show(items, columns) {
      list.replaceChildren(el('div.table-wrap', {}, el('table', {}, el('caption', { text: title }),
        el('thead', {}, el('tr', {}, columns.map((c) => el('th', { scope: 'col', text: c })))),
        el('tbody', {}, items.map((item) => el('tr', {}, columns.map((c, i) => el('td', { text: item.split('\t')[i] || '' }))))))));
    },
  };
}

function importPanel() {
  const message = messageLine();
  const file = input('File of users', 'fileToUpload', { kind: 'file', accept: '.txt,text/plain', hint: 'One user a line, the columns separated by tabs; see the sample.' });
  const overwrite = input('Overwrite accounts that exist', 'overwrite', { kind: 'checkbox' });
  const list = importList('Users in the uploaded file');
  const progress = progressView('Creation of the imported users');
  progress.node.hidden = true;
  const uploadButton = el('button.primary', { type: 'submit', text: 'Upload' });
  const createButton = el('button.primary', { type: 'button', text: 'Create these users', disabled: true });
  let names = [];
  const form = el('form', { novalidate: true },
    el('p', {}, el('a', { href: `${CGI}?cmd=cgi_download_import_sample`, download: 'import_file.txt', text: 'Download the sample file' })),
    file.row, el('div.buttons', {}, uploadButton), list.node, overwrite.row, el('div.buttons', {}, createButton), message.node, progress.node);
  form.addEventListener('submit', (event) => {
    event.preventDefault();
    busy(uploadButton, message, async () => {
      const chosen = file.input.files[0];
      if (!chosen) throw new Refusal('Choose a file first.');
      const data = new FormData();
      data.append('fileToUpload', chosen, chosen.name);
      await upload('cgi_import_uesrs', data);
      const { xml } = await send('cgi_get_import_uesrs');
      if (field(xml, 'status') === 'ng') throw new Refusal('The device did not keep the file.');
      const items = fields(xml, 'item');
      names = items.map((i) => i.split('\t')[0]).filter(Boolean);
      list.show(items, ['Name', 'Password', 'Groups']);
      createButton.disabled = !names.length;
      if (names.length) message.info(`${names.length} user${names.length > 1 ? 's' : ''} in the file.`);
      else throw new Refusal('The file holds no users.');
    });
  });
  createButton.addEventListener('click', () => busy(createButton, message, async () => {
    const before = new Set((await accounts()).users);
    await send('cgi_create_import_users', { overwrite: overwrite.input.checked ? 1 : 0, app: 'web' });
    progress.node.hidden = false;
    const { failed } = await follow({ ftype: 'iUser', names, kind: 'users', before, view: progress });
    if (failed.length) message.error(`${failed.length} of ${names.length} users could not be created.`);
    else message.ok(`${names.length} users created.`);
  }));
  return panel('Import users from a file', form);
}

// Group files reach the device by other means (there is no upload for them); this
// panel lists the one there and creates its groups.
function groupImportPanel() {
  const message = messageLine();
  const list = importList('Groups in the device\'s group file');
  const progress = progressView('Creation of the imported groups');
  progress.node.hidden = true;
  const overwrite = input('Overwrite groups that exist', 'overwrite-groups', { kind: 'checkbox' });
  let names = [];
  const createButton = el('button.primary', { type: 'button', text: 'Create these groups', disabled: true });
  const showButton = button('Show the group file', (e) => busy(e.currentTarget, message, async () => {
    const { xml } = await send('cgi_get_import_groups');
    if (field(xml, 'status') === 'ng') throw new Refusal('The device holds no group file.');
    const items = fields(xml, 'item');
    names = items.map((i) => i.split('\t')[0]).filter(Boolean);
    list.show(items, ['Group', 'Members']);
    createButton.disabled = !names.length;
  }));
  createButton.addEventListener('click', () => busy(createButton, message, async () => {
    const before = new Set((await accounts()).groups);
    await send('cgi_create_import_groups', { overwrite: overwrite.input.checked ? 1 : 0, app: 'web' });
    progress.node.hidden = false;
    const { failed } = await follow({ ftype: 'group', names, kind: 'groups', before, view: progress });
    if (failed.length) message.error(`${failed.length} of ${names.length} groups could not be created.`);
    else message.ok(`${names.length} groups created.`);
  }));
  return panel('Import groups', el('p', {},
    el('a', { href: `${CGI}?cmd=cgi_download_import_group_sample`, download: 'import_group.txt', text: 'Download the sample group file' })),
  el('div.toolbar', {}, showButton), list.node, overwrite.row, el('div.buttons', {}, createButton), message.node, progress.node);
}
