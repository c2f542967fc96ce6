// Groups: the list with members, add, members, rename, quotas and delete.
// The program has no grid of groups: the names come from the user info answer and
// the members from the user grid, and this page pages and searches them itself.
import { send, field, accounts, usersWithGroups, volumes as loadVolumes } from './api.js';
import { el, input, checklist, messageLine, formDialog, confirmDialog, button, panel, Grid, Refusal, busy } from './ui.js';
import { checkName, megabyteValue } from './rules.js';

const state = {};

export const title = 'Groups';

async function groupRows() {
  const [{ groups }, users] = await Promise.all([accounts(), usersWithGroups()]);
  return groups.map((g) => ({ name: g, members: users.filter((u) => u.groups.includes(g)).map((u) => u.name) }));
}

export function render(view) {
  const message = messageLine();
  let all = [];
  const table = new Grid({
    caption: 'Groups', columns: ['Group', 'Members'], state, message,
    fetchPage: async ({ page, rp, query }) => {
      all = await groupRows();
      const found = all.filter((g) => !query || g.name.includes(query));
      const rows = found.slice((page - 1) * rp, page * rp)
        .map((g) => ({ key: g.name, members: g.members, cells: [g.name, g.members.join(', ') || '—'] }));
      return { rows, total: found.length };
    },
    actions: (row) => [
      button('Edit', () => editGroup(row.key, row.members, table, message)),
      button('Delete', (e) => removeGroups([row.key], e.currentTarget, table, message), 'danger'),
    ],
  });
  const tools = el('div.toolbar', {},
    button('Add group', () => addGroup(all.map((g) => g.name), table, message), 'primary'),
    button('Delete selected', (e) => {
      const names = table.selection();
      if (!names.length) message.error('Select the groups to delete first.');
      else removeGroups(names, e.currentTarget, table, message);
    }, 'danger'));
  view.append(panel('Groups', tools, message.node, table.node));
  table.load();
}

function quotaRows(volumes) {
  return volumes.map((v) => ({ volume: v, ...input(`Limit on ${v.name} (MB)`, `quota-${v.index}`, {
    kind: 'number', min: 0, step: 1, value: v.quota ?? 0, inputmode: 'numeric',
    hint: v.min ? `0 for no limit; at least ${v.min} MB, the largest limit of its members.` : '0 for no limit.',
  }) }));
}

// Limits in megabytes, refused below the bound the device reports for the group.
export function readGroupQuotas(rows, name) {
  return rows.map(({ volume, input: box }) => {
    const value = megabyteValue(`Limit on ${volume.name}`, box.value);
    if (volume.min && value !== 0 && value < volume.min) {
      throw new Refusal(`The limit of ${name} on ${volume.name} must be at least ${volume.min} MB: a member already has that much.`);
    }
    return value;
  });
}

async function addGroup(existing, table, message) {
  const [{ users }, volumes] = await Promise.all([accounts(), loadVolumes()]);
  const name = input('Name', 'group', { maxlength: 32, autocomplete: 'off', hint: 'Letters, digits, ".", "_" and "-"; at most 32.' });
  const members = checklist('Members', users, [], 'member');
  const quotas = quotaRows(volumes);
  formDialog({
    title: 'Add a group', submit: 'Create',
    body: [name.row, members.set, el('fieldset', {}, el('legend', { text: 'Quota' }), quotas.map((q) => q.row))],
    onSubmit: async () => {
      const n = name.input.value.trim();
      checkName('group', n);
      if (existing.includes(n) || (await accounts()).groups.includes(n)) throw new Refusal(`A group named "${n}" already exists.`);
      const list = members.selected().join(',');
      // The smallest limit a new group with these members may get, per volume.
      const { xml } = await send('cgi_addgroup_get_group_quota_minsize', { name: list });
      const mins = field(xml, 'min_size').split(':').map((kb) => Math.ceil((Number(kb) || 0) / 1024));
      for (const q of quotas) q.volume.min = mins[q.volume.index - 1] || 0;
      const limits = readGroupQuotas(quotas, n);
      await send('cgi_group_add', { group: n, member: list });
      if (!(await accounts()).groups.includes(n)) throw new Refusal(`The device did not create the group "${n}".`);
      if (limits.some(Boolean)) {
        await send('cgi_group_set_quota', { name: n, ...Object.fromEntries(limits.map((v, i) => [`available${i + 1}`, v])) });
      }
      message.ok(`Group ${n} created.`);
      table.load();
      return true;
    },
  });
}

async function editGroup(name, current, table, message) {
  const [{ users }, info] = await Promise.all([accounts(), send('cgi_get_modify_group_info', { group: name })]);
  const volumes = Array.from(info.xml ? info.xml.getElementsByTagName('quota') : [], (q, i) => ({
    index: i + 1, name: field(q, 'v_name'), quota: Number(field(q, 'size')) || 0,
  }));
  await Promise.all(volumes.map(async (v) => {
    const { xml } = await send('cgi_get_group_quota_minsize', { name, hdd: v.index });
    v.min = Math.ceil((Number(field(xml, 'max_size')) || 0) / 1024);
  }));
  const rename = input('Name', 'group', { value: name, maxlength: 32 });
  const members = checklist('Members', users, current, 'member');
  const quotas = quotaRows(volumes);
  formDialog({
    title: `Edit group ${name}`,
    body: [rename.row, members.set, quotas.length ? el('fieldset', {}, el('legend', { text: 'Quota' }), quotas.map((q) => q.row)) : null],
    onSubmit: async () => {
      const newName = rename.input.value.trim();
      checkName('group', newName);
      const limits = readGroupQuotas(quotas, name);
      const chosen = members.selected();
      if (limits.some((v, i) => v !== volumes[i].quota)) {
        await send('cgi_modify_group', { mtype: 1, group: name, ...Object.fromEntries(limits.map((v, i) => [`available${i + 1}`, v])) });
      }
      if (chosen.join(',') !== current.join(',')) await send('cgi_modify_group', { mtype: 2, group: name, member: chosen.join(',') });
      if (newName !== name) {
        if ((await accounts()).groups.includes(newName)) throw new Refusal(`A group named "${newName}" already exists.`);
        await send('cgi_modify_group', { mtype: 3, oldGroup: name, group: newName });
        if (!(await accounts()).groups.includes(newName)) throw new Refusal(`The device did not rename ${name} to "${newName}".`);
      }
      message.ok(`Group ${newName} saved.`);
      table.load();
      return true;
    },
  });
}

async function removeGroups(names, trigger, table, message) {
  const list = names.join(', ');
  if (!(await confirmDialog('Delete groups', `Delete the group${names.length > 1 ? 's' : ''} ${list}? Its members stay.`))) return;
  await busy(trigger, message, async () => {
    await send('cgi_group_del', { group: names.join(',') });
    message.ok(`Deleted ${list}.`);
    await table.load();
  });
}
