// DFS: the switch, the DFS groups and the links of each group.
import { send, field, fields, grid } from './api.js';
import { el, input, messageLine, formDialog, confirmDialog, button, panel, Grid, Refusal, busy } from './ui.js';

export const title = 'DFS';

const state = { groups: {}, links: {}, group: '' };

// Link and group names go into the Samba configuration: no tabs, slashes or line breaks.
function checkDfsName(kind, name) {
  if (!name) throw new Refusal(`Enter a ${kind} name.`);
  if (name.length > 127) throw new Refusal(`A ${kind} name has at most 127 characters.`);
  if (/[\t\r\n/\\]/.test(name)) throw new Refusal(`A ${kind} name may not contain a slash, a tab or a line break.`);
}

export function render(view) {
  const message = messageLine();
  const service = el('div');
  const linksHolder = el('div');
  const groups = new Grid({
    caption: 'DFS groups', columns: ['Group'], state: state.groups, message, selectable: false, search: false,
    fetchPage: async ({ page, rp }) => {
      const g = grid((await send('cgi_get_dfs_gorup_list', { page, rp })).xml);
      return { total: g.total, rows: g.rows.map((r) => ({ key: r.cells[0], cells: r.cells })) };
    },
    actions: (row) => [
      button('Links', () => { state.group = row.key; state.links = {}; showLinks(); }),
      button('Rename', () => groupDialog(row.key)),
    ],
  });

  const loadSwitch = async () => {
    const { xml } = await send('cgi_get_dfs_info');
    const on = field(xml, 'enable') === '1';
    service.replaceChildren(el('dl.facts', {},
      el('dt', { text: 'DFS' }), el('dd', {}, el(`span.badge.${on ? 'on' : 'off'}`, { text: on ? 'on' : 'off' })),
      el('dt', { text: 'Groups' }), el('dd', { text: fields(xml, 'groupname').join(', ') || 'none' })),
    el('div.toolbar', {}, button(on ? 'Switch DFS off' : 'Switch DFS on', (e) => busy(e.currentTarget, message, async () => {
      await send('cgi_set_dfs_enable', { dfs: on ? 0 : 1 });
      message.ok(`DFS switched ${on ? 'off' : 'on'}.`);
      await loadSwitch();
    }), on ? 'danger' : 'primary')));
  };

  const groupDialog = (old) => {
    const name = input('Group name', 'group', { value: old || '', maxlength: 127 });
    formDialog({
      title: old ? `Rename DFS group ${old}` : 'Add a DFS group', submit: old ? 'Rename' : 'Create', body: [name.row],
      onSubmit: async () => {
        const n = name.input.value.trim();
        checkDfsName('group', n);
        const { xml } = await send('cgi_chk_dfs_group', { group: n });
        if (field(xml, 'status') === '1') throw new Refusal(`A DFS group named "${n}" already exists.`);
        await send('cgi_set_dfs_group', old ? { group: n, old_group: old, flag: 0 } : { group: n, flag: 1 });
        if (old && state.group === old) state.group = n;
        message.ok(old ? `DFS group ${old} renamed to ${n}.` : `DFS group ${n} created.`);
        await Promise.all([groups.load(), loadSwitch()]);
        showLinks();
        return true;
      },
    });
  };

  const showLinks = () => {
    if (!state.group) {
      linksHolder.replaceChildren(el('p.muted', { text: 'Choose a group\'s links above.' }));
      return;
    }
    const group = state.group;
    const links = new Grid({
      caption: `Links of ${group}`, columns: ['Link', 'Host', 'Folder'], state: state.links, message, selectable: false, search: false,
      fetchPage: async ({ page, rp }) => {
        const g = grid((await send('cgi_get_dfs_list', { page, rp, f_field: group })).xml);
        return { total: g.total, rows: g.rows.map((r) => ({ key: r.cells[0], cells: r.cells })) };
      },
      actions: (row) => [
        button('Change', () => linkDialog(group, row.cells, links)),
        button('Delete', async (e) => {
          if (!(await confirmDialog('Delete link', `Delete the link ${row.key} of ${group}?`))) return;
          await busy(e.target, message, async () => {
            await send('cgi_del_dfs', { group, local: row.key });
            message.ok(`Link ${row.key} deleted.`);
            await links.load();
          });
        }, 'danger'),
      ],
    });
    linksHolder.replaceChildren(el('h3', { text: `Links of ${group}` }),
      el('div.toolbar', {}, button('Add link', () => linkDialog(group, null, links), 'primary')), links.node);
    links.load();
  };

  const linkDialog = (group, cells, links) => {
    const [oldLink, oldHost, oldPath] = cells || ['', '', ''];
    const host = input('Host', 'host', { value: oldHost, maxlength: 127, hint: 'The computer that shares the folder.' });
    const folder = input('Folder', 'path', { kind: 'select', value: oldPath, options: oldPath ? [[oldPath, oldPath]] : [['', 'Find the host\'s folders first']] });
    const link = input('Link name', 'sharename', { value: oldLink, maxlength: 127 });
    const findButton = el('button', { type: 'button', text: 'Find folders' });
    const { message: dialogMessage } = formDialog({
      title: cells ? `Change link ${oldLink}` : `Add a link to ${group}`, submit: cells ? 'Save' : 'Create',
      body: [host.row, el('div.toolbar', {}, findButton), folder.row, link.row],
      onSubmit: async () => {
        const h = host.input.value.trim();
        const path = folder.input.value;
        const name = link.input.value.trim();
        if (!h) throw new Refusal('Enter the host.');
        if (!path) throw new Refusal('Choose one of the host\'s folders.');
        checkDfsName('link', name);
        if (name !== oldLink) {
          const { xml } = await send('cgi_chk_dfs', { host: h, remote_share: path, sharename: name, group });
          if (field(xml, 'status') === '1') throw new Refusal(`${group} already has a link named "${name}".`);
        }
        if (cells) await send('cgi_modify_dfs', { host: h, sharename: name, path, group, old_share: oldLink, old_group: group });
        else await send('cgi_set_dfs', { host: h, sharename: name, path, group });
        message.ok(cells ? `Link ${name} saved.` : `Link ${name} created.`);
        await links.load();
        return true;
      },
    });
    // Fills the folder choice from what the host shares.
    async function find() {
      const { xml } = await send('cgi_get_host_folder', { host: host.input.value.trim() });
      const found = fields(xml, 'folder');
      if (field(xml, 'status') !== '1') throw new Refusal(`The host "${host.input.value.trim()}" cannot be reached.`);
      folder.input.replaceChildren(...found.map((f) => el('option', { value: f, text: f, selected: f === oldPath })));
      if (!found.length) throw new Refusal('The host shares no folders.');
      dialogMessage.ok(`${found.length} folder${found.length > 1 ? 's' : ''} found.`);
    }
    findButton.onclick = (e) => busy(e.currentTarget, dialogMessage, find);
  };
  view.append(panel('DFS', message.node, service),
    panel('DFS groups', el('div.toolbar', {}, button('Add group', () => groupDialog(null), 'primary')), groups.node, linksHolder));
  loadSwitch().catch(() => message.error('The device cannot be reached.'));
  groups.load();
  showLinks();
}
