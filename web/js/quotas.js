// Quotas: the volumes, and the limits of every user and group on each of them,
// within the bounds the device reports.
import { send, field, fields, accounts } from './api.js';
import { el, input, messageLine, formDialog, button, panel, Grid, Refusal, megabytes } from './ui.js';
import { megabyteValue } from './rules.js';
import { readGroupQuotas } from './groups.js';

const state = { kind: 'users', users: {}, groups: {} };

export const title = 'Quotas';

const limitText = (mb) => (mb ? megabytes(mb) : 'no limit');

async function userLimits(name) {
  const { xml } = await send('cgi_get_modify_user_info', { name });
  return Array.from(xml ? xml.getElementsByTagName('quota_info') : [], (q) => ({
    name: field(q, 'v_name'), quota: Number(field(q, 'quota')) || 0,
  }));
}

async function groupLimits(group) {
  const { xml } = await send('cgi_get_modify_group_info', { group });
  return Array.from(xml ? xml.getElementsByTagName('quota') : [], (q) => ({
    name: field(q, 'v_name'), quota: Number(field(q, 'size')) || 0,
  }));
}

export function render(view) {
  const message = messageLine();
  const overview = el('div');
  const holder = el('div');
  const usersTab = el('button', { type: 'button', text: 'Users', 'aria-pressed': 'true' });
  const groupsTab = el('button', { type: 'button', text: 'Groups', 'aria-pressed': 'false' });
  view.append(panel('Quotas', overview, el('div.toolbar', { role: 'group', 'aria-label': 'Show the limits of' }, usersTab, groupsTab), message.node, holder));

  let volumeNames = [];
  const show = () => {
    usersTab.setAttribute('aria-pressed', String(state.kind === 'users'));
    groupsTab.setAttribute('aria-pressed', String(state.kind === 'groups'));
    const users = state.kind === 'users';
    const table = new Grid({
      caption: users ? 'User limits' : 'Group limits', columns: [users ? 'User' : 'Group', ...volumeNames],
      state: state[state.kind], message, selectable: false,
      fetchPage: async ({ page, rp, query }) => {
        const all = users ? (await accounts()).users : (await accounts()).groups;
        const found = all.filter((n) => !query || n.includes(query));
        const names = found.slice((page - 1) * rp, page * rp);
        const limits = await Promise.all(names.map((n) => (users ? userLimits(n) : groupLimits(n))));
        return { total: found.length, rows: names.map((n, i) => ({ key: n, cells: [n, ...limits[i].map((l) => limitText(l.quota))], limits: limits[i] })) };
      },
      actions: (row) => button('Set limits', () => (users ? setUser : setGroup)(row.key, row.limits, table, message)),
    });
    holder.replaceChildren(table.node);
    table.load();
  };
  usersTab.addEventListener('click', () => { state.kind = 'users'; show(); });
  groupsTab.addEventListener('click', () => { state.kind = 'groups'; show(); });

  send('cgi_get_quota_info').then(({ xml }) => {
    const names = field(xml, 'v_name').split(':').filter(Boolean);
    const sizes = field(xml, 'hddsize').split(',');
    volumeNames = names;
    const on = field(xml, 'enable') === '1';
    overview.replaceChildren(el('dl.facts', {},
      el('dt', { text: 'Quota service' }), el('dd', {}, el(`span.badge.${on ? 'on' : 'off'}`, { text: on ? 'on' : 'off' })),
      names.map((n, i) => [el('dt', { text: n }), el('dd', { text: `${megabytes(Number(sizes[i]) || 0)}` })]),
      el('dt', { text: 'Users' }), el('dd', { text: field(xml, 'usernum') }),
      el('dt', { text: 'Groups' }), el('dd', { text: field(xml, 'groupnum') })));
    show();
  }).catch(() => message.error('The device cannot be reached.'));
}

function limitInputs(limits, bounds, boundHint) {
  return limits.map((l, i) => ({
    volume: { index: i + 1, name: l.name, quota: l.quota, ...bounds[i] },
    ...input(`Limit on ${l.name} (MB)`, `available${i + 1}`, { kind: 'number', min: 0, step: 1, value: l.quota, inputmode: 'numeric', hint: boundHint(bounds[i]) }),
  }));
}

async function setUser(name, limits, table, message) {
  const bounds = await Promise.all(limits.map(async (l, i) => {
    const { xml } = await send('cgi_get_user_quota_maxsize', { name, hdd: i + 1 });
    return { max: Math.floor((Number(field(xml, 'max_size')) || 0) / 1024) };
  }));
  const rows = limitInputs(limits, bounds, (b) => (b.max ? `0 for no limit; at most ${b.max} MB, its groups' limit.` : '0 for no limit.'));
  formDialog({
    title: `Limits of ${name}`, body: rows.map((r) => r.row),
    onSubmit: async () => {
      const values = rows.map(({ volume, input: box }) => {
        const value = megabyteValue(`Limit on ${volume.name}`, box.value);
        if (volume.max && (value === 0 || value > volume.max)) {
          throw new Refusal(`The limit of ${name} on ${volume.name} can be at most ${volume.max} MB: its groups allow no more.`);
        }
        return value;
      });
      // "null" leaves a volume as it is.
      const form = { name };
      values.forEach((v, i) => { form[`available${i + 1}`] = v === limits[i].quota ? 'null' : v; });
      await send('cgi_user_set_quota', form);
      message.ok(`Limits of ${name} saved.`);
      table.load();
      return true;
    },
  });
}

async function setGroup(name, limits, table, message) {
  const bounds = await Promise.all(limits.map(async (l, i) => {
    const { xml } = await send('cgi_get_group_quota_minsize', { name, hdd: i + 1 });
    return { min: Math.ceil((Number(fields(xml, 'max_size')[0]) || 0) / 1024) };
  }));
  const rows = limitInputs(limits, bounds, (b) => (b.min ? `0 for no limit; at least ${b.min} MB, the largest limit of its members.` : '0 for no limit.'));
  formDialog({
    title: `Limits of group ${name}`, body: rows.map((r) => r.row),
    onSubmit: async () => {
      const values = readGroupQuotas(rows, name);
      const form = { name };
      values.forEach((v, i) => { form[`available${i + 1}`] = v === limits[i].quota ? 'null' : v; });
      await send('cgi_group_set_quota', form);
      message.ok(`Limits of group ${name} saved.`);
      table.load();
      return true;
    },
  });
}
