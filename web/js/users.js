// Users: the paged grid with search, add, edit, password, delete, the admin password.
import { send, field, grid, base64, accounts, commaList } from './api.js';
import { el, input, checklist, messageLine, formDialog, confirmDialog, button, panel, Grid, Refusal, busy } from './ui.js';
import { checkName, checkText, checkPassword, megabyteValue } from './rules.js';

const state = {};

export const title = 'Users';

export function render(view) {
  const message = messageLine();
  const table = new Grid({
    caption: 'Users', columns: ['Name', 'Groups'], state, message,
    fetchPage: async ({ page, rp, query }) => {
      const { xml } = await send('cgi_get_user_list', { page, rp, query, qtype: 'name' });
      const g = grid(xml);
      return { total: g.total, rows: g.rows.map((r) => ({ key: r.cells[0], cells: [r.cells[0], r.cells[1] || '—'], groups: commaList(r.cells[1]) })) };
    },
    actions: (row) => {
      if (row.key.includes('\\')) return el('span.muted', { text: 'domain user' });
      return [
        button('Edit', () => editUser(row.key, row.groups, table, message)),
        button('Password', () => setPassword(row.key, message)),
        button('Delete', (e) => removeUsers([row.key], e.currentTarget, table, message), 'danger'),
      ];
    },
  });
  const tools = el('div.toolbar', {},
    button('Add user', () => addUser(table, message), 'primary'),
    button('Delete selected', (e) => {
      const names = table.selection();
      if (!names.length) message.error('Select the users to delete first.');
      else removeUsers(names, e.currentTarget, table, message);
    }, 'danger'),
    button('Administrator password', () => adminPassword(message)));
  view.append(panel('Users', tools, message.node, table.node));
  table.load();
}

function quotaInputs(volumes) {
  return volumes.map((v) => ({ volume: v, ...input(`Limit on ${v.name} (MB)`, `quota-${v.index}`, {
    kind: 'number', min: 0, step: 1, value: v.quota ?? 0, inputmode: 'numeric',
    hint: v.max ? `0 for no limit; at most ${v.max} MB, its groups' limit.` : '0 for no limit.',
  }) }));
}

// Limits in megabytes, refused above the bound the device reports for the user.
function readQuotas(rows, name) {
  return rows.map(({ volume, input: box }) => {
    const value = megabyteValue(`Limit on ${volume.name}`, box.value);
    if (volume.max && (value === 0 || value > volume.max)) {
      throw new Refusal(`The limit of ${name} on ${volume.name} can be at most ${volume.max} MB: its groups allow no more.`);
    }
    return value;
  });
}

async function addUser(table, message) {
  const { users, groups } = await accounts();
  const name = input('Name', 'name', { maxlength: 32, autocomplete: 'off', required: true, hint: 'Letters, digits, ".", "_" and "-"; at most 32.' });
  const description = input('Description (full name)', 'description', { maxlength: 255 });
  const mail = input('E-mail', 'mail', { kind: 'email', maxlength: 127 });
  const pw = input('Password', 'pw', { kind: 'password', autocomplete: 'new-password', maxlength: 127, hint: 'Leave empty for an account without a password.' });
  const again = input('Password again', 'pw2', { kind: 'password', autocomplete: 'new-password', maxlength: 127 });
  const hint = input('Password hint', 'pw_hit', { maxlength: 127 });
  const member = checklist('Groups', groups, [], 'group');
  formDialog({
    title: 'Add a user', submit: 'Create',
    body: [name.row, description.row, mail.row, pw.row, again.row, hint.row, member.set],
    onSubmit: async () => {
      const n = name.input.value.trim();
      checkName('user', n);
      if (users.includes(n)) throw new Refusal(`A user named "${n}" already exists.`);
      checkText('The description', description.input.value, 255);
      checkText('The e-mail address', mail.input.value, 127);
      checkPassword(pw.input.value, again.input.value);
      const answer = await send('cgi_user_add', {
        name: n, pw: base64(pw.input.value), pw_onoff: pw.input.value ? 1 : 0,
        group: member.selected().join(','), description: description.input.value,
        mail: mail.input.value, pw_hit: hint.input.value,
      });
      if (field(answer.xml, 'status') !== 'ok') throw new Refusal(`The device refused the user "${n}".`);
      if (!(await accounts()).users.includes(n)) throw new Refusal(`The device did not create "${n}": the name is taken or not allowed.`);
      message.ok(`User ${n} created.`);
      table.load();
      return true;
    },
  });
}

async function editUser(name, current, table, message) {
  const [{ groups }, info] = await Promise.all([accounts(), send('cgi_get_modify_user_info', { name })]);
  const volumes = Array.from(info.xml ? info.xml.getElementsByTagName('quota_info') : [], (q, i) => ({
    index: i + 1, name: field(q, 'v_name'), quota: Number(field(q, 'quota')) || 0, max: Number(field(q, 'max_quota')) || 0,
  }));
  const rename = input('Name', 'username', { value: name, maxlength: 32 });
  const description = input('New description', 'description', { maxlength: 255, hint: 'Leave empty to keep the present one.' });
  const mail = input('New e-mail', 'mail', { kind: 'email', maxlength: 127, hint: 'Leave empty to keep the present one.' });
  const noMail = input('Remove the e-mail address', 'remove_mail', { kind: 'checkbox' });
  const expires = input('Account expires on', 'expires_time', { kind: 'date', hint: 'Leave empty to keep it as it is.' });
  const member = checklist('Groups', groups, current, 'group');
  const quotas = quotaInputs(volumes);
  const mainGroup = field(info.xml, 'main_group');
  formDialog({
    title: `Edit ${name}`,
    body: [rename.row, description.row, mail.row, noMail.row, member.set,
      mainGroup ? el('p.muted', { text: `Primary group: ${mainGroup}` }) : null,
      quotas.length ? el('fieldset', {}, el('legend', { text: 'Quota' }), quotas.map((q) => q.row)) : null, expires.row],
    onSubmit: async () => {
      const newName = rename.input.value.trim();
      checkName('user', newName);
      checkText('The description', description.input.value, 255);
      checkText('The e-mail address', mail.input.value, 127);
      const limits = readQuotas(quotas, name);
      const chosen = member.selected();
      const modify = (mtype, extra) => send('cgi_modify_account', { mtype, username: name, ...extra });
      if (chosen.join(',') !== current.join(',')) await modify(4, { group: chosen.join(',') });
      if (description.input.value) await modify(1, { description: description.input.value });
      if (noMail.input.checked) await send('cgi_remove_email', { username: name });
      else if (mail.input.value) await modify(2, { mail: mail.input.value });
      if (limits.some((v, i) => v !== volumes[i].quota)) {
        await modify(5, Object.fromEntries(limits.map((v, i) => [`available${i + 1}`, v])));
      }
      if (expires.input.value) await modify(8, { expires_time: expires.input.value });
      if (newName !== name) {
        await send('cgi_modify_account', { mtype: 7, oldName: name, username: newName });
        if (!(await accounts()).users.includes(newName)) {
          throw new Refusal(`The device did not rename ${name} to "${newName}": the name is taken or not allowed.`);
        }
      }
      message.ok(`User ${newName} saved.`);
      table.load();
      return true;
    },
  });
}

function setPassword(name, message) {
  const pw = input('New password', 'pw', { kind: 'password', autocomplete: 'new-password', maxlength: 127 });
  const again = input('New password again', 'pw2', { kind: 'password', autocomplete: 'new-password', maxlength: 127 });
  const hint = input('Password hint', 'pw_hit', { maxlength: 63 });
  formDialog({
    title: `Password of ${name}`, body: [pw.row, again.row, hint.row],
    onSubmit: async () => {
      checkPassword(pw.input.value, again.input.value);
      const { xml } = await send('cgi_modify_account', { mtype: 3, username: name, pw: base64(pw.input.value), pw_hit: hint.input.value });
      if (field(xml, 'status') !== '0') throw new Refusal('The device did not change the password.');
      message.ok(`Password of ${name} changed.`);
      return true;
    },
  });
}

function adminPassword(message) {
  const old = input('Present password', 'old_pw', { kind: 'password', autocomplete: 'current-password', maxlength: 127 });
  const pw = input('New password', 'pw', { kind: 'password', autocomplete: 'new-password', maxlength: 127 });
  const again = input('New password again', 'pw2', { kind: 'password', autocomplete: 'new-password', maxlength: 127 });
  formDialog({
    title: 'Administrator password', body: [old.row, pw.row, again.row],
    onSubmit: async () => {
      checkPassword(pw.input.value, again.input.value);
      const { xml } = await send('cgi_modify_account', { mtype: 3, username: 'admin', old_pw: base64(old.input.value), pw: base64(pw.input.value) });
      if (field(xml, 'status') !== '0') throw new Refusal('The present password is wrong; nothing was changed.');
      message.ok('Administrator password changed.');
      return true;
    },
  });
}

async function removeUsers(names, trigger, table, message) {
  const list = names.join(', ');
  if (!(await confirmDialog('Delete users', `Delete ${list}? Their home folders stay on the volume.`))) return;
  await busy(trigger, message, async () => {
    // The program reads at most 511 characters of names a request.
    const batches = [];
    for (const n of names) {
      const last = batches[batches.length - 1];
      if (last && `${last},${n}`.length <= 511) batches[batches.length - 1] = `${last},${n}`;
      else batches.push(n);
    }
    for (const batch of batches) await send('cgi_user_del', { name: batch });
    message.ok(`Deleted ${list}.`);
    await table.load();
  });
}

