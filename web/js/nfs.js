// NFS: the service switch and the shares with their export rules.
//
// The device reports a share's rule only when the rule names the share's folder by
// its own path; rules that the device writes name the share link (/nfs/NAME), and it
// reports those shares as not exported. So this page also remembers, in this
// browser, the rules it has sent, and says so where it shows one.
import { send, field } from './api.js';
import { el, input, messageLine, formDialog, confirmDialog, button, panel, busy } from './ui.js';
import { checkHost } from './rules.js';

export const title = 'NFS';

const KEY = 'nas-console-nfs-rules';
const sent = () => { try { return JSON.parse(localStorage.getItem(KEY)) || {}; } catch { return {}; } };
const remember = (path, rule) => {
  const rules = sent();
  if (rule) rules[path] = rule; else delete rules[path];
  localStorage.setItem(KEY, JSON.stringify(rules));
};

export function render(view) {
  const message = messageLine();
  const service = el('div');
  const body = el('tbody');
  const table = el('div.table-wrap', {}, el('table', {}, el('caption.sr', { text: 'Shares and their NFS rules' }),
    el('thead', {}, el('tr', {}, ['Share', 'Folder', 'NFS rule'].map((t) => el('th', { scope: 'col', text: t })), el('th', { scope: 'col' }, el('span.sr', { text: 'Actions' })))),
    body));
  const servicePanel = panel('NFS service', service);
  view.append(servicePanel, panel('Shares', message.node, table));

  const load = async () => {
    const [session, info] = await Promise.all([send('cgi_get_all_session'), send('cgi_get_nfs_info')]);
    const on = field(info.xml, 'enable') === '1';
    const toggle = button(on ? 'Switch NFS off' : 'Switch NFS on', (e) => busy(e.currentTarget, message, async () => {
      await send('cgi_nfs_enable', { nfs_status: on ? 0 : 1 });
      message.ok(`NFS switched ${on ? 'off' : 'on'}.`);
      await load();
    }), on ? 'danger' : 'primary');
    service.replaceChildren(el('dl.facts', {},
      el('dt', { text: 'NFS server' }), el('dd', {}, el(`span.badge.${on ? 'on' : 'off'}`, { text: on ? 'on' : 'off' })),
      el('dt', { text: 'Rules in the exports file' }), el('dd', { text: field(info.xml, 'total') || '0' })),
    el('div.toolbar', {}, toggle));
    const remembered = sent();
    const shares = Array.from(session.xml ? session.xml.getElementsByTagName('share') : []);
    body.replaceChildren();
    if (!shares.length) body.append(el('tr', {}, el('td.empty', { colspan: 4, text: 'The device has no shares.' })));
    for (const share of shares) {
      const name = field(share, 'name');
      const path = field(share, 'path');
      const nfs = share.getElementsByTagName('nfs')[0];
      let rule = null;
      let ruleText;
      if (nfs && field(nfs, 'status') === '1') {
        rule = { host: field(nfs, 'host'), rw: field(nfs, 'write') === 'Yes' ? 1 : 0, rootsquash: field(nfs, 'root_squash') === 'Yes' ? 1 : 0 };
        ruleText = ruleLabel(rule);
      } else if (remembered[path]) {
        rule = remembered[path];
        ruleText = `${ruleLabel(rule)} (as sent from this browser)`;
      } else {
        ruleText = 'not exported';
      }
      body.append(el('tr', { 'data-key': name },
        el('td', { 'data-label': 'Share', text: name }), el('td', { 'data-label': 'Folder', text: path }),
        el('td', { 'data-label': 'NFS rule', text: ruleText }),
        el('td.actions', {},
          button(rule ? 'Change rule' : 'Export', () => exportShare(name, path, rule, message, load)),
          button('Remove share', (e) => removeShare(name, path, rule, e.currentTarget, message, load), 'danger'))));
    }
  };
  load().catch(() => message.error('The device cannot be reached.'));
}

function ruleLabel(rule) {
  return `${rule.host || '*'}, ${rule.rw ? 'read-write' : 'read-only'}`;
}

function exportShare(name, path, rule, message, reload) {
  const host = input('Host or network', 'host', { value: rule ? rule.host : '', maxlength: 31, hint: 'An address, a network such as 192.168.1.0/24, a host name, or * for everyone. A new host replaces the present one.' });
  const access = input('Access', 'rw', { kind: 'select', value: rule ? rule.rw : 1, options: [[1, 'Read and write'], [0, 'Read only']] });
  const squash = input('Map root to the anonymous user (root squash)', 'rootsquash', { kind: 'checkbox', value: rule ? rule.rootsquash : 1, hint: 'The device maps every client user to the anonymous user in any case.' });
  formDialog({
    title: `Export ${name} over NFS`, submit: 'Export', body: [el('p.muted', { text: path }), host.row, access.row, squash.row],
    onSubmit: async () => {
      const h = host.input.value.trim();
      checkHost(h);
      const sentRule = { host: h, rw: Number(access.input.value), rootsquash: squash.input.checked ? 1 : 0 };
      await send('cgi_set_nfs_share', { host: h, path, rw: sentRule.rw, rootsquash: sentRule.rootsquash });
      remember(path, sentRule);
      message.ok(`${name} exported to ${h}.`);
      await reload();
      return true;
    },
  });
}

async function removeShare(name, path, rule, trigger, message, reload) {
  const text = `Remove the share ${name} from every service (SMB, FTP, NFS and AFP)? Its folder ${path} and the files in it stay.`;
  if (!(await confirmDialog('Remove share', text, 'Remove'))) return;
  await busy(trigger, message, async () => {
    await send('cgi_del_session', { name, path, host: rule ? rule.host : '', smb_path: '' });
    remember(path, null);
    message.ok(`Share ${name} removed.`);
    await reload();
  });
}
