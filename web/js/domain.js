// Domain: join an Active Directory domain, leave it, and its status.
import { send, field, base64, unbase64 } from './api.js';
import { el, input, messageLine, confirmDialog, panel, busy, Refusal } from './ui.js';

export const title = 'Domain';

// What a join answers: 1, 50 and 100 are success.
export function joinResult(status) {
  if (['1', '50', '100'].includes(status)) return null;
  if (status === '54') return 'The domain cannot be found: check the DNS server, the realm, the user name and the password.';
  return `The device could not join the domain (code ${status || 'none'}).`;
}

export function render(view) {
  const message = messageLine();
  const facts = el('div');
  const name = input('Domain administrator', 'f_name', { maxlength: 63, autocomplete: 'username' });
  const pw = input('Password', 'f_pw', { kind: 'password', maxlength: 45, autocomplete: 'current-password' });
  const realm = input('Realm (the domain\'s DNS name)', 'f_realm_name', { maxlength: 127, hint: 'For example EXAMPLE.COM.' });
  const dns = input('DNS server', 'f_dns1', { maxlength: 255, hint: 'A server that resolves the domain; it becomes the device\'s first DNS server.' });
  const join = el('button.primary', { type: 'submit', text: 'Join' });
  const leave = el('button.danger', { type: 'button', text: 'Leave the domain' });
  const form = el('form', { novalidate: true }, name.row, pw.row, realm.row, dns.row, el('div.buttons', {}, join, leave));

  const load = async () => {
    const { xml } = await send('cgi_get_ads_info', { get_domain_status: 1 });
    const joined = field(xml, 'enable') === '1';
    const trust = field(xml, 'status');
    facts.replaceChildren(el('dl.facts', {},
      el('dt', { text: 'Membership' }), el('dd', {}, el(`span.badge.${joined ? 'on' : 'off'}`, { text: joined ? 'joined' : 'not joined' })),
      joined ? [el('dt', { text: 'Trust' }), el('dd', { text: trust === '0' ? 'failed' : 'good' })] : null,
      el('dt', { text: 'Workgroup' }), el('dd', { text: field(xml, 'workgroup') || '—' }),
      el('dt', { text: 'Realm' }), el('dd', { text: field(xml, 'realm') || '—' }),
      el('dt', { text: 'Domain controller' }), el('dd', { text: field(xml, 's_pwd') || '—' }),
      el('dt', { text: 'DNS servers' }), el('dd', { text: [field(xml, 'dns1'), field(xml, 'dns2')].filter(Boolean).join(', ') || '—' })));
    name.input.value = field(xml, 'u_name');
    realm.input.value = field(xml, 'realm');
    dns.input.value = field(xml, 'dns1');
    const stored = field(xml, 'u_pwd');
    pw.input.value = field(xml, 'b64Flag') === '1' ? unbase64(stored) : stored;
    leave.disabled = !joined;
  };

  form.addEventListener('submit', (event) => {
    event.preventDefault();
    busy(join, message, async () => {
      const f = { f_enable: 1, f_name: name.input.value.trim(), f_pw: base64(pw.input.value), f_realm_name: realm.input.value.trim(), f_dns1: dns.input.value.trim() };
      if (!f.f_name || !pw.input.value || !f.f_realm_name || !f.f_dns1) throw new Refusal('Fill in every field to join.');
      if (f.f_pw.length > 63) throw new Refusal('The password is too long for the device (at most 45 bytes).');
      message.info('Joining; this can take a while…');
      const { xml } = await send('cgi_set_ads', f);
      const problem = joinResult(field(xml, 'status'));
      await load();
      if (problem) throw new Refusal(problem);
      message.ok(`Joined ${f.f_realm_name}.`);
    });
  });
  leave.addEventListener('click', async () => {
    if (!(await confirmDialog('Leave the domain', 'Leave the domain? Domain users lose their access to the device.', 'Leave'))) return;
    await busy(leave, message, async () => {
      await send('cgi_set_ads', { f_enable: 0 });
      await load();
      message.ok('Left the domain.');
    });
  });
  view.append(panel('Domain', facts, message.node), panel('Join a domain', form));
  load().catch(() => message.error('The device cannot be reached.'));
}
