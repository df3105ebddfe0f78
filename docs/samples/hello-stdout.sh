mkdir -p "$KORVEX_HOME/etc" "$KORVEX_DB/hashDb"
echo "- standard error goes where standard output goes"
echo 'log4cpp.rootCategory=INFO' > "$KORVEX_HOME/etc/log-cmdline.cfg"
hello 2>&1 | sed 's/^/standard output: /'
echo "- the configuration names standard output"
cat > "$KORVEX_HOME/etc/log-cmdline.cfg" << 'END'
log4cpp.rootCategory=INFO, OUT
log4cpp.appender.OUT.fileName=/dev/stdout
END
hello | sed 's/^/standard output: /'
