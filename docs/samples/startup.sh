mkdir -p "$KORVEX_HOME/etc/myinstall" "$KORVEX_HOME/etc/second"
startup
startup -n mailer -i second -p 9000 --nodaemon --debug --mode check
startup -p 0                                     # 0 is "not given"
startup -p many                                  # other errors of popt are ignored
startup -c conf || echo "status $?"              # conf must exist below the home
startup --xyz || echo "status $?"
KORVEX_HOME=home startup || echo "status $?"
KORVEX_HOME="$KORVEX_HOME//" startup             # repeated and trailing / are removed
startup --help
