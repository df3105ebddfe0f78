mkdir -p "$KORVEX_HOME/etc" "$KORVEX_HOME/log" "$KORVEX_DB/hashDb"
cat > "$KORVEX_HOME/etc/log-cmdline.cfg" << 'END'
log4cpp.rootCategory=INFO, MAIN
log4cpp.appender.MAIN.fileName=${KORVEX_HOME}/log/hello.log
END
cat > daily.conf << END
$KORVEX_HOME/log/*.log {
    daily
    dateext
    rotate 30
    missingok
    notifempty
    nocreate
    compress
    delaycompress
}
END
hello
PATH=$PATH:/usr/sbin logrotate --force --state state daily.conf  # its timer does this, without --force
hello
cd "$KORVEX_HOME/log"
grep . hello.log* | sed 's/-20[0-9]*:/-YYYYMMDD:/'
