// Keeping the file services in step with account and share changes.
#pragma once

// Re-runs the SMB and AFP configuration in the foreground, and rsync in the
// background when the rsync server is on.
void reload_share_services();
