#!/usr/bin/python3
"""The administration console in headless Chromium (Selenium), in front of a fresh
simulated device per scenario: what the page shows and what the device did (files,
journal, system log). Any message on the browser's console fails a scenario; a failing
one leaves a screenshot in $NAS_BUILD/browser-failures.

    /usr/bin/python3 tests/browser/console_test.py [ConsoleTest.test_...]
"""
import os
import shutil
import socket
import subprocess
import tempfile
import time
import unittest
import urllib.request

from selenium import webdriver
from selenium.common.exceptions import StaleElementReferenceException, TimeoutException
from selenium.webdriver.chrome.service import Service
from selenium.webdriver.common.by import By
from selenium.webdriver.common.keys import Keys
from selenium.webdriver.support.ui import WebDriverWait

REPO = os.path.dirname(os.path.dirname(os.path.dirname(os.path.abspath(__file__))))
BUILD = os.environ.get('NAS_BUILD', os.path.join(REPO, 'build'))
DEVROOT = os.path.join(REPO, 'scripts', 'devroot')


class Device:
    """A fresh simulated device with its web server on a free loopback port."""

    def __init__(self, workdir):
        self.root = os.path.join(workdir, 'device')
        env = dict(os.environ, NAS_BUILD=BUILD)
        subprocess.run([DEVROOT, 'create', self.root], check=True, env=env, stdout=subprocess.DEVNULL)
        with socket.socket() as s:
            s.bind(('127.0.0.1', 0))
            port = s.getsockname()[1]
        self.server = subprocess.Popen([DEVROOT, 'serve', self.root, '--port', str(port)], env=env,
                                       stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL)
        self.url = f'http://127.0.0.1:{port}/'
        for _ in range(200):   # a bound on the wait for the server, at most 10 s or so
            try:
                with urllib.request.urlopen(self.url, timeout=1):
                    return
            except OSError:
                time.sleep(0.05)
        raise RuntimeError('the device\'s web server did not start')

    def stop(self):
        self.server.terminate()
        self.server.wait(timeout=10)

    def read(self, name):
        with open(os.path.join(self.root, name.lstrip('/')), encoding='utf-8', errors='replace', newline='') as f:
            return f.read()

    def write(self, name, text):
        with open(os.path.join(self.root, name.lstrip('/')), 'w', encoding='utf-8') as f:
            f.write(text)

    def calls(self, name):
        """The journal's events of that name, each a list of its arguments."""
        def unescape(field):
            return field.replace('\\t', '\t').replace('\\n', '\n').replace('\\\\', '\\')
        events = [[unescape(f) for f in line.split('\t')] for line in self.read('/var/log/platform.log').splitlines()]
        return [e[1:] for e in events if e[0] == name]

    def ran(self, prefix):
        """The shell command lines that begin with prefix."""
        return [c[1] for c in self.calls('sh') if c[0] == '-c' and c[1].startswith(prefix)]


class ConsoleTest(unittest.TestCase):
    width = 1280

    def setUp(self):
        self.workdir = tempfile.mkdtemp(prefix='nas-console-')
        self.addCleanup(shutil.rmtree, self.workdir, ignore_errors=True)
        self.device = Device(self.workdir)
        self.addCleanup(self.device.stop)
        options = webdriver.ChromeOptions()
        options.binary_location = '/usr/bin/chromium'
        for arg in ('--headless', '--no-sandbox', '--disable-gpu', '--disable-quic', '--no-first-run',
                    '--disable-background-networking', '--disable-component-update', '--disable-sync',
                    '--disable-dev-shm-usage', f'--user-data-dir={os.path.join(self.workdir, "chromium")}',
                    f'--window-size={self.width},900'):
            options.add_argument(arg)
        options.set_capability('goog:loggingPrefs', {'browser': 'ALL'})
        self.browser = webdriver.Chrome(service=Service('/usr/bin/chromedriver'), options=options)
        self.addCleanup(self.browser.quit)
        # A bound on every wait for the page, not a speed requirement. The page redraws
        # its tables after each change: a row found just before is read again.
        self.wait = WebDriverWait(self.browser, 30, poll_frequency=0.05,
                                  ignored_exceptions=(StaleElementReferenceException,))
        if self.width < 500:   # a window is never narrower than 500 pixels: a phone is emulated
            self.browser.execute_cdp_cmd('Emulation.setDeviceMetricsOverride',
                                         {'width': self.width, 'height': 780, 'deviceScaleFactor': 1, 'mobile': True})

    def tearDown(self):
        result = self._outcome.result
        if not self._outcome.success or any(test is self for test, _ in result.errors + result.failures):
            os.makedirs(os.path.join(BUILD, 'browser-failures'), exist_ok=True)
            self.browser.save_screenshot(os.path.join(BUILD, 'browser-failures', f'{self._testMethodName}.png'))
        self.assertEqual([e for e in self.browser.get_log('browser') if e['level'] in ('SEVERE', 'WARNING')], [],
                         'the browser console shows messages')

    # Page helpers.
    def open(self, section):
        self.browser.get(f'{self.device.url}#{section}')
        self.find('main .panel')

    def find(self, css, root=None):
        return self.wait.until(lambda d: (root or d).find_element(By.CSS_SELECTOR, css))

    def button(self, text, root=None):
        xpath = f'.//button[normalize-space()="{text}"]'
        return self.wait.until(lambda d: next((b for b in (root or d).find_elements(By.XPATH, xpath)
                                               if b.is_displayed() and b.is_enabled()), None))

    def dialog(self, button, row=None):
        """Clicks the button (of the row with that key) and returns the dialog that opens."""
        self.button(button, row and self.row(row)).click()
        return self.find('dialog[open]')

    def submit(self, root, fields, press, kind, text):
        """Fills the form in, presses the button and waits for the message (an error in the form)."""
        self.fill(root, fields)
        self.button(press, root).click()
        self.message(kind, text, root if kind == 'error' else None)

    def fill(self, root, fields):
        """Types into (or ticks) the inputs that the labels name (every input has one)."""
        for label, text in fields.items():
            node = self.wait.until(lambda d: root.find_element(By.XPATH, f'.//label[normalize-space()="{label}"]'))
            box = self.browser.find_element(By.ID, node.get_attribute('for'))
            if box.get_attribute('type') == 'checkbox':
                if box.is_selected() != bool(text):
                    node.click()
            else:
                box.clear()
                box.send_keys(text)

    def close(self, dialog):
        dialog.send_keys(Keys.ESCAPE)
        self.wait.until(lambda d: not d.find_elements(By.CSS_SELECTOR, 'dialog[open]'))

    def row(self, key):
        return self.find(f'tr[data-key="{key}"]')

    def keys(self):
        return self.browser.execute_script(
            'return Array.from(document.querySelectorAll("main table tbody tr[data-key]"), (r) => r.dataset.key)')

    def message(self, kind, text, root=None):
        """Waits for the message line to say text."""
        try:
            self.wait.until(lambda d: any(m.is_displayed() and text in m.text
                                          for m in (root or d).find_elements(By.CSS_SELECTOR, f'.msg.{kind}')))
        except TimeoutException:
            shown = [m.text for m in self.browser.find_elements(By.CSS_SELECTOR, '.msg') if m.is_displayed()]
            self.fail(f'no {kind} message "{text}"; the page shows {shown}')

    def idle(self):
        self.wait.until(lambda d: not d.find_elements(By.CSS_SELECTOR, '[aria-busy="true"]'))

    # Scenarios.
    def test_create_find_change_and_delete_a_user(self):
        self.open('users')
        self.submit(self.dialog('Add user'), {'Name': 'dave', 'Description (full name)': 'Dave Doe',
                                              'E-mail': 'dave@example.com', 'Password': 's3cret pass',
                                              'Password again': 's3cret pass', 'family': True, 'office': True},
                    'Create', 'ok', 'User dave created.')
        self.assertIn('family,office', self.row('dave').text.replace(' ', ''))
        self.assertEqual(self.device.ran("account -a"), ["account -a -u 'dave' -p 's3cret pass' -l 'family,office' "
                                                          "-f 'Dave Doe' -h '' -e 'dave@example.com'"])

        # The search finds it, and the search stays while the user is changed.
        self.fill(self.browser, {'Search by name': 'dav'})
        self.button('Search').click()
        self.wait.until(lambda d: self.keys() == ['dave'])
        self.submit(self.dialog('Edit', 'dave'), {'office': False, 'New description': 'David Doe'}, 'Save', 'ok',
                    'User dave saved.')
        self.wait.until(lambda d: self.keys() == ['dave'] and 'office' not in self.row('dave').text)
        self.assertEqual(self.find('input[type=search]').get_attribute('value'), 'dav')
        self.assertEqual(self.device.ran("account -m -u 'dave' -l"), ["account -m -u 'dave' -l 'family'"])

        # A name the device does not take is refused with its reason, and nothing runs.
        dialog = self.dialog('Add user')
        self.submit(dialog, {'Name': 'bad name'}, 'Create', 'error', '"bad name" is not a valid user name')
        self.close(dialog)
        self.assertEqual(len(self.device.ran('account -a')), 1)

        # Deleting asks first: cancelled, nothing happens; confirmed, the user goes.
        self.fill(self.browser, {'Search by name': ''})
        self.button('Search').click()
        dialog = self.dialog('Delete', 'bob')
        self.assertIn('Delete bob?', dialog.text)
        self.button('Cancel', dialog).click()
        self.idle()
        self.assertEqual(self.device.ran('account -d'), [])
        self.submit(self.dialog('Delete', 'bob'), {}, 'Delete', 'ok', 'Deleted bob.')
        self.wait.until(lambda d: 'bob' not in self.keys())
        self.assertEqual(self.keys(), ['alice', 'carol', 'dave'])
        self.assertEqual(self.device.ran('account -d'), ["account -d -u 'bob'"])

    def test_quota_and_its_bound_and_an_nfs_export(self):
        self.open('quotas')
        limit = 'Limit on Volume_1 (MB)'
        self.submit(self.dialog('Set limits', 'alice'), {limit: '100'}, 'Save', 'ok', 'Limits of alice saved.')
        self.wait.until(lambda d: '100 MB' in self.row('alice').text)
        # family gets 500 MB (at least alice's 100); bob, in family, may not get more.
        self.button('Groups').click()
        dialog = self.dialog('Set limits', 'family')
        self.assertIn('at least 100 MB', dialog.text)
        self.submit(dialog, {limit: '500'}, 'Save', 'ok', 'Limits of group family saved.')
        self.button('Users').click()
        dialog = self.dialog('Set limits', 'bob')
        self.submit(dialog, {limit: '600'}, 'Save', 'error', 'The limit of bob on Volume_1 can be at most 500 MB')
        self.close(dialog)
        self.assertEqual(self.device.calls('LIB_Set_User_Quota'), [['HD_a2', 'alice', '102400']])

        self.open('nfs')
        dialog = self.dialog('Export', 'Public')
        self.submit(dialog, {'Host or network': '192.168.1.0/24 x'}, 'Export', 'error', 'is not a host, a network')
        self.submit(dialog, {'Host or network': '192.168.1.0/24'}, 'Export', 'ok', 'Public exported to 192.168.1.0/24.')
        self.wait.until(lambda d: '192.168.1.0/24, read-write' in self.row('Public').text)
        self.assertEqual(self.device.read('/etc/exports'),
                         '"/nfs/Public" 192.168.1.0/24(rw,all_squash,sync,no_wdelay,insecure_locks,insecure,'
                         'no_subtree_check,anonuid=501,anongid=1000)\n')
        self.assertEqual(self.device.ran('exportfs'), ['exportfs -r > /dev/null 2>&1'])
        self.assertIn('1', self.find('dl.facts').text)

    def test_numbered_users_with_progress_and_an_import(self):
        # The device's account_mgr waits for a gate file, so the run can be watched.
        self.device.write('/sim/account_mgr.conf', 'delay_ms=20\ngate=/tmp/go\n')
        self.open('bulk')
        self.fill(self.browser, {'Name prefix': 'u', 'First number': '01', 'How many': '20',
                                 'Password for all': 'batchpw', 'Password again': 'batchpw', 'family': True})
        create = self.button('Create users')
        create.click()
        bar = self.find('progress')
        self.wait.until(lambda d: os.path.exists(os.path.join(self.device.root, 'tmp/start_create_users')))
        self.wait.until(lambda d: bar.is_displayed() and '0 of 20 created' in self.find('.progress p').text)
        self.assertEqual(bar.get_attribute('value'), '0')
        self.assertFalse(create.is_enabled())
        self.device.write('/tmp/go', '')
        self.message('ok', '20 users created.')
        self.assertEqual((bar.get_attribute('value'), bar.get_attribute('max')), ('20', '20'))
        self.assertIn('Done: all 20 created.', self.find('.progress').text)
        self.assertTrue(create.is_enabled())
        self.assertEqual([li.text for li in self.browser.find_elements(By.CSS_SELECTOR, 'ul.results li')],
                         [f'u{n:02d}: created' for n in range(1, 21)])
        self.assertIn('u20\tbatchpw\tfamily\t', self.device.read('/tmp/account_batch_info'))

        content = '# two people\r\nerin\terin-pass\toffice\t\t\t\t\r\nfrank\tfrank-pass\t\t\t\t\t\r\n'
        upload = os.path.join(self.workdir, 'people.txt')
        with open(upload, 'w', encoding='utf-8', newline='') as f:
            f.write(content)
        self.browser.refresh()
        self.submit(self.browser, {'File of users': upload}, 'Upload', 'info', '2 users in the file.')
        self.assertEqual(self.device.read('/tmp/import_users'), content)
        self.assertEqual([r.text.split()[0] for r in self.browser.find_elements(By.CSS_SELECTOR, 'form table tbody tr')],
                         ['erin', 'frank'])
        self.button('Create these users').click()
        self.message('ok', '2 users created.')
        self.assertIn('Done: all 2 created.', self.find('.progress:not([hidden])').text)
        self.assertEqual(self.device.read('/tmp/account_status'), 'erin:0\nfrank:0\n')


class NarrowConsoleTest(ConsoleTest):
    """The same page on a 360-pixel-wide phone: nothing wider than the screen."""
    width = 360

    def test_every_section_fits(self):
        for section in ('users', 'groups', 'quotas', 'nfs', 'dfs', 'bulk', 'domain', 'services'):
            self.open(section)
            self.idle()
            self.assertEqual(self.browser.execute_script(
                'return [document.documentElement.scrollWidth <= innerWidth, innerWidth]'), [True, self.width], section)


# The narrow class runs only its own scenario.
for name in [n for n in vars(ConsoleTest) if n.startswith('test_')]:
    setattr(NarrowConsoleTest, name, None)

if __name__ == '__main__':
    unittest.main()
