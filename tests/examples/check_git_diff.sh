#!/bin/sh
# Compares versions of a document by git with tools/git/diff_documents.
#
#     check_git_diff.sh SOURCE_DIR DOCUMENT_ROAD
set -eu

root=$1
export DOCUMENT_ROAD=$2
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
cd "$work"
export HOME="$work" GIT_CONFIG_NOSYSTEM=1
git init --quiet .
git config user.name tester
git config user.email tester@localhost
git config diff.patches.command "$root/tools/git/diff_documents"
echo '*.json diff=patches' > .git/info/attributes
echo '{"root": {"id": 1, "name": "first"}}' > a.json
echo '{"root": {"id": 1}}' > gone.json
echo '{"other": 1}' > other.json
git add .
git commit --quiet --message "Add documents"
echo '{"root": {"id": 1, "name": "second"}}' > a.json
echo '{"root": {"id": 1}}' > new.json
git rm --quiet gone.json
echo '{"other": 2}' > other.json
git add new.json
cat > expected <<'END'
a.json:
changed patch 1 "first": name "first" -> "second"
gone.json:
removed
new.json:
added
other.json:
END
git diff --no-renames HEAD > actual
grep -v '^[-+@]' actual | diff expected -
grep -q '^+{"other": 2}' actual

# During a merge.
git commit --quiet --all --message "Change documents"
git checkout --quiet -b branch
echo '{"root": {"id": 1, "name": "theirs"}}' > a.json
git commit --quiet --all --message "Change it there"
git checkout --quiet -
echo '{"root": {"id": 1, "name": "ours"}}' > a.json
git commit --quiet --all --message "Change it here"
if git merge --quiet branch > /dev/null; then exit 1; fi
git diff --cached > actual
grep -q '^not merged$' actual
