mkdir -p "$KORVEX_HOME/etc" "$KORVEX_DB/hashDb"
echo 'log4cpp.rootCategory=INFO' > "$KORVEX_HOME/etc/log-cmdline.cfg"
hello
hello
od -A d -t x1z "$KORVEX_DB/hashDb/data"
