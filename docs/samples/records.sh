mkdir -p "$KORVEX_HOME/etc" "$KORVEX_DB/hashDb"
echo 'log4cpp.category.recordFileManager=DEBUG' > "$KORVEX_HOME/etc/log-cmdline.cfg"
records
od -A d -t x1z "$KORVEX_DB/hashDb/data"
ls -l "$KORVEX_DB/hashDb/data" | cut -c 1-10
