# Run as root by with-user-session before the session's manager starts: jobs that are installed and enabled for
# every user of the machine, as a package does it.

for job in com.brixo.Everyone com.brixo.Everyones.Control; do
  printf '[Service]\nType=oneshot\nExecStart=/bin/true\n' >"/usr/lib/systemd/user/$job.service"
  printf '[Timer]\nOnActiveSec=1h\nUnit=%s.service\n[Install]\nWantedBy=timers.target\n' "$job" \
    >"/usr/lib/systemd/user/$job.run4.timer"
  systemctl --quiet --global enable "$job.run4.timer" || exit 1
done
