mkdir -p "$KORVEX_HOME/etc" "$KORVEX_DB"
touch "$KORVEX_HOME/etc/log-cmdline.cfg"
echo "- without the directory hashDb"
store
echo "- with it"
mkdir "$KORVEX_DB/hashDb"
store
od -A d -t x1z "$KORVEX_DB/hashDb/data"
ls -l "$KORVEX_DB/hashDb/data" | cut -c 1-10
