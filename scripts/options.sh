# Sourced by the scripts: handles the options that all of them have. --help prints the first comment of the script and
# exits. --no-install makes the script fail, with the names of missing packages, instead of installing them; it is
# removed from the arguments.
for argument in "$@"; do
    shift
    case $argument in
    --help)
        sed -n '2,/^[^#]/{ /^#/s/^# \{0,1\}//p; }' "$0"
        exit 0
        ;;
    --no-install)
        export TARN_NO_INSTALL=1
        ;;
    *)
        set -- "$@" "$argument"
        ;;
    esac
done
