// Services: FTP, AFP (with Time Machine) and the report of the file services.
import { send, field } from './api.js';
import { el, messageLine, panel, button, busy, confirmDialog } from './ui.js';

export const title = 'Services';

const badge = (on) => el(`span.badge.${on ? 'on' : 'off'}`, { text: on ? 'on' : 'off' });

export function render(view) {
  const message = messageLine();
  const report = el('div');
  const afp = el('div');
  const load = async () => {
    const [info, afpInfo] = await Promise.all([send('cgi_get_service_info'), send('cgi_get_afp_info')]);
    report.replaceChildren(el('dl.facts', {},
      el('dt', { text: 'FTP' }), el('dd', {}, badge(field(info.xml, 'ftp') === '1')),
      el('dt', { text: 'NFS' }), el('dd', {}, badge(field(info.xml, 'nfs_server') === '1')),
      el('dt', { text: 'WebDAV' }), el('dd', {}, badge(field(info.xml, 'webdav_server') === '1')),
      el('dt', { text: 'Cloud access' }), el('dd', {}, badge(field(info.xml, 'cloud_access') === '1')),
      el('dt', { text: 'AFP' }), el('dd', {}, badge(field(afpInfo.xml, 'enable') === '1'))));
    const on = field(afpInfo.xml, 'enable') === '1';
    afp.replaceChildren(
      el('p', {}, 'AFP serves the shares to Macs, and Time Machine backs them up over it. ', badge(on)),
      el('p.muted', { text: 'Switching AFP off also switches Time Machine off; switching it on leaves Time Machine as it was.' }),
      el('div.toolbar', {}, button(on ? 'Switch AFP off' : 'Switch AFP on', async (e) => {
        const trigger = e.currentTarget;
        if (on && !(await confirmDialog('Switch AFP off', 'Switch AFP off? Time Machine backups stop too.', 'Switch off'))) return;
        await busy(trigger, message, async () => {
          await send('cgi_set_afp', { afp: on ? 0 : 1 });
          message.ok(`AFP switched ${on ? 'off' : 'on'}.`);
          await load();
        });
      }, on ? 'danger' : 'primary')));
  };
  const act = (text, cmd, fields, done) => button(text, (e) => busy(e.currentTarget, message, async () => {
    await send(cmd, fields);
    message.ok(done);
    await load();
  }));
  view.append(
    panel('Service report', message.node, report,
      el('div.toolbar', {}, act('Re-run the share services', 'cgi_restart_service', {}, 'The share services re-read their settings.'))),
    panel('FTP', el('p.muted', { text: 'Rebuilding makes the FTP service serve the shares as they are now.' }),
      el('div.toolbar', {},
        act('Rebuild and restart FTP', 'cgi_ftp_service', { type: 1 }, 'FTP rebuilt and restarted.'),
        act('Stop FTP', 'cgi_ftp_service', { type: 0 }, 'FTP stopped until it is restarted.'))),
    panel('AFP and Time Machine', afp));
  load().catch(() => message.error('The device cannot be reached.'));
}
